#ifndef KX_ENGINE_NODE_H
#define KX_ENGINE_NODE_H

/**
 * @file Node.h
 * Reading the engine's node records by kind.
 */

#include "Kind.h"
#include "Text.h"

#include <libxml/tree.h>

namespace kx
{

/** @return the first element among @p node, which may be null, and those @p link leads to; or null.
 */
inline xmlNode* ElementFrom(xmlNode* node, NodeLink link = &xmlNode::next)
{
    while (node != 0 && node->type != XML_ELEMENT_NODE)
    {
        node = node->*link;
    }
    return node;
}

/** @return the text node that is the only child of @p node, which may be null; or null. */
inline xmlNode* OnlyTextChild(const xmlNode* node)
{
    xmlNode* const child = LinkOf(node, &xmlNode::children);
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
