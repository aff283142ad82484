#include "Edit.h"

#include "Ids.h"
#include "Kind.h"
#include "OldEngine.h"
#include "Text.h"

namespace kx
{

namespace
{

/** Whether @p attribute has a name and, unless @p value is empty, a text. */
bool IsWhole(const xmlAttr* attribute, const std::string& value)
{
    const xmlNode* const text = attribute->children;
    return attribute->name != 0 && (value.empty() || (text != 0 && text->content != 0));
}

} // namespace

xmlNode* WholeElement(xmlNode* element)
{
    if (element != 0 && element->name == 0)
    {
        xmlFreeNode(element);
        return 0;
    }
    return element;
}

bool AddAttribute(xmlNode* node, const std::string& name, const std::string& value)
{
    xmlAttr* const attribute = xmlNewNsProp(node, 0, ToEngine(name), ToEngine(value));
    if (attribute != 0 && !IsWhole(attribute, value))
    {
        ForgetIdsWithin(reinterpret_cast<xmlNode*>(attribute));
        xmlRemoveProp(attribute);
        return false;
    }
    return attribute != 0;
}

void ReplaceContent(xmlNode* node, const std::string& text)
{
    if (HasContent(node))
    {
        for (xmlNode* child = node->children; child != 0; child = child->next)
        {
            ForgetIdsWithin(child);
        }
    }
    // Some engines take this kind, which no document has, for a text.
    if (node->type != XML_ENTITY_NODE)
    {
        SetContent(node, ToEngine(text));
    }
}

void RemoveChildren(xmlNode* node)
{
    if (IsDocument(node))
    {
        ForgetAllIds(node->doc);
    }
    while (node->children != 0)
    {
        FreeFromTree(node->children);
    }
}

void RemoveAttributes(xmlNode* node)
{
    // An attribute that the engine fails to remove would be met again and again.
    bool removed = true;
    while (removed && AttributesOf(node) != 0)
    {
        ForgetIdsWithin(reinterpret_cast<xmlNode*>(AttributesOf(node)));
        removed = xmlRemoveProp(AttributesOf(node)) == 0;
    }
}

void FreeFromTree(xmlNode* node)
{
    if (node->type == XML_DTD_NODE)
    {
        ForgetAllIds(node->doc);
    }
    ForgetIdsWithin(node);
    xmlUnlinkNode(node);
    xmlFreeNode(node);
}

} // namespace kx
