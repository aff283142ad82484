#include "file/Insertion.h"

#include "CXmlNode.h"
#include "file/Nodes.h"
#include "file/StoredText.h"

#include "engine/Node.h"

#include <cstring>
#include <new>

namespace
{

bool IsBlankLine(const xmlNode* node)
{
    return node != nullptr && node->type == XML_TEXT_NODE && IsBlankText(node) &&
           std::strchr(kx::ContentOf(node), '\n') != nullptr;
}

/** @return the element among the children of @p parent that only blank text follows, or null. */
xmlNode* LastElement(const xmlNode* parent)
{
    xmlNode* child = parent->last;
    while (child != nullptr && IsBlankLine(child))
    {
        child = child->prev;
    }
    return child != nullptr && child->type == XML_ELEMENT_NODE ? child : nullptr;
}

void CopyBefore(const xmlNode* text, xmlNode* node)
{
    xmlNode* const copy = xmlNewDocText(node->doc, text->content);
    if (copy == nullptr)
    {
        throw std::bad_alloc();
    }
    xmlAddPrevSibling(node, copy);
}

/** @return the blank text that puts @p node on a line of its own, or null. */
const xmlNode* IndentationOf(const xmlNode* node)
{
    return IsBlankLine(node->prev) ? node->prev : nullptr;
}

} // namespace

xmlNode* LineBefore(const xmlNode* node)
{
    return IsBlankLine(node->prev) && IsBlankLine(node->next) ? node->prev : nullptr;
}

xmlNode* AddElement(xmlNode* parent, xmlNode* after, const std::string& name,
                    const std::string& content)
{
    xmlNode* const before = after == nullptr ? LastElement(parent) : after;
    if (CXmlNode(parent).AddChildNode(name, content).IsNull())
    {
        return nullptr;
    }
    xmlNode* const added = parent->last;
    RequireStored(added, content);
    if (before != nullptr)
    {
        xmlAddNextSibling(before, added); // the library adds at the end only
    }
    if (before != nullptr && IndentationOf(before) != nullptr)
    {
        CopyBefore(IndentationOf(before), added);
    }
    return added;
}
