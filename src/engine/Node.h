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

/** @return @p node, which may be null, if it is a text node and the last of its siblings; or null.
 */
inline xmlNode* OnlyText(xmlNode* node)
{
    const bool isOnlyText = node != 0 && node->type == XML_TEXT_NODE && node->next == 0;
    return isOnlyText ? node : 0;
}

/** @return the text node that is the only child of @p element, or null. */
inline xmlNode* OnlyTextChild(const xmlNode* element)
{
    return OnlyText(element->children);
}

/** @return the content of the text node @p text; never null. */
inline const char* ContentOf(const xmlNode* text)
{
    return FromEngine(text->content);
}

} // namespace kx

#endif
