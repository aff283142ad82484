#ifndef KX_ENGINE_NODE_H
#define KX_ENGINE_NODE_H

/**
 * @file Node.h
 * Reading the engine's node records by kind.
 */

#include "Text.h"

#include <libxml/tree.h>

namespace kx
{

/** @return the first element among @p node, which may be null, and its next siblings; or null. */
inline xmlNode* ElementFrom(xmlNode* node)
{
    while (node != 0 && node->type != XML_ELEMENT_NODE)
    {
        node = node->next;
    }
    return node;
}

/** @return the namespace of @p node, or null; only elements and attributes have one. */
inline const xmlNs* SpaceOf(const xmlNode* node)
{
    // They have it at different places of the record.
    switch (node->type)
    {
    case XML_ELEMENT_NODE:
        return node->ns;
    case XML_ATTRIBUTE_NODE:
        return reinterpret_cast<const xmlAttr*>(node)->ns;
    default:
        return 0;
    }
}

/** @return the text node that is the only child of @p element, or null. */
inline xmlNode* OnlyTextChild(const xmlNode* element)
{
    xmlNode* const child = element->children;
    const bool isOnlyText = child != 0 && child->type == XML_TEXT_NODE && child->next == 0;
    return isOnlyText ? child : 0;
}

/** @return the content of the text node @p text; never null. */
inline const char* ContentOf(const xmlNode* text)
{
    return FromEngine(text->content);
}

} // namespace kx

#endif
