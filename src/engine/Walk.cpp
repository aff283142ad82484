#include "Walk.h"

#include "Kind.h"

namespace kx
{

namespace
{

/** @return the first node that is freed with @p node: an attribute, else a child; or null. */
xmlNode* FirstWithin(xmlNode* node)
{
    if (AttributesOf(node) != 0)
    {
        return reinterpret_cast<xmlNode*>(AttributesOf(node));
    }
    // A reference's child is the declaration of its entity.
    return node->type != XML_ENTITY_REF_NODE ? node->children : 0;
}

} // namespace

xmlNode* NextWithin(const xmlNode* top, xmlNode* node)
{
    xmlNode* next = FirstWithin(node);
    while (next == 0 && node != top)
    {
        next = node->next;
        if (next == 0)
        {
            // An element's children come after its attributes.
            next = IsAttribute(node) ? node->parent->children : 0;
            node = node->parent;
        }
    }
    return next;
}

} // namespace kx
