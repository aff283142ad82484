#ifndef KX_CONFIG_SIBLINGSCAN_H
#define KX_CONFIG_SIBLINGSCAN_H

#include "Condition.h"
#include "KeyPath.h"
#include "Observer.h"

namespace kx
{

/** Stands in for the condition of a segment that has none. */
struct NoCondition
{
    static void Suspend() {}

    template <class Observer>
    static bool Admits(xmlNode*)
    {
        Observer::Selected(true);
        return true;
    }
};

/** The condition of a segment, on its way along the siblings. */
class SuspendableCondition
{
public:
    explicit SuspendableCondition(TextView text) : m_condition(text), m_suspended(false) {}

    /** Leaves the condition out for the next element that asks. */
    void Suspend() { m_suspended = true; }

    template <class Observer>
    bool Admits(xmlNode* element)
    {
        const bool suspended = m_suspended;
        m_suspended = false;
        if (!suspended && !m_condition.Holds<Observer>(element))
        {
            Observer::Rejected();
            return false;
        }
        Observer::Selected(suspended);
        return true;
    }

private:
    const Condition m_condition;
    bool m_suspended;
};

/** The scan of ScanSiblings(), with the segment's condition made ready as @p condition. */
template <class Observer, class SegmentCondition, class Visitor>
inline void ScanSiblings(const xmlNode* node, const Segment& segment, SegmentCondition& condition,
                         Visitor& visitor)
{
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
            condition.Suspend();
        }
        else if (condition.template Admits<Observer>(child))
        {
            visitor.Accept(child);
        }
    }
}

/** Out of line, as its callers call themselves: only levels with a condition pay for its stack. */
template <class Observer, class Visitor>
__attribute__((noinline)) void ScanWithCondition(const xmlNode* node, TextView name,
                                                 TextView condition, Visitor& visitor)
{
    SuspendableCondition suspendable(condition);
    ScanSiblings<Observer>(node, Segment(name, condition), suspendable, visitor);
}

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
inline void ScanSiblings(const xmlNode* node, const Segment& segment, Visitor& visitor)
{
    if (segment.condition.IsEmpty())
    {
        NoCondition none;
        ScanSiblings<Observer>(node, segment, none, visitor);
    }
    else
    {
        ScanWithCondition<Observer>(node, segment.name, segment.condition, visitor);
    }
}

} // namespace kx

#endif
