#ifndef KX_CONFIG_SIBLINGSCAN_H
#define KX_CONFIG_SIBLINGSCAN_H

#include "Condition.h"
#include "KeyPath.h"
#include "Observer.h"

namespace kx
{

/**
 * Visits the element children of @p node that @p segment selects, in document order.
 *
 * This is one level of every lookup; what becomes of an element that was selected is the visitor's
 * affair: it is called as visitor.Accept(child).
 *
 * An element of another name suspends the condition: the next element that matches by name is
 * taken as it is, and only then is the condition in force again. Clients rely on it.
 */
template <class Observer, class Visitor>
void ScanSiblings(const xmlNode* node, const Segment& segment, Visitor& visitor)
{
    bool suspended = segment.condition.IsEmpty();
    for (xmlNode* child = node->children; child != 0; child = child->next)
    {
        if (child->type != XML_ELEMENT_NODE)
        {
            continue;
        }
        Observer::Compare(child, segment);
        if (!segment.Names(child))
        {
            Observer::OtherName();
            suspended = true;
            continue;
        }
        if (suspended || ConditionHolds<Observer>(segment.condition, child))
        {
            Observer::Selected(suspended);
            visitor.Accept(child);
        }
        else
        {
            Observer::Rejected();
        }
        suspended = segment.condition.IsEmpty();
    }
}

} // namespace kx

#endif
