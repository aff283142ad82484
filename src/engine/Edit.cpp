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

void UnlinkAndFree(xmlNode* node)
{
    xmlUnlinkNode(node);
    xmlFreeNode(node);
}

/** Forgets the IDs of all that is freed when @p node is cleared. */
void ForgetIdsOfContents(xmlNode* node)
{
    if (IsDocument(node))
    {
        ForgetAllIds(node->doc);
    }
    else if (IsAttribute(node))
    {
        ForgetIdsBelow(node); // it stays, and its ID too
    }
    else
    {
        ForgetIdsWithin(node);
    }
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
        ForgetIdsBelow(node);
    }
    // Some engines take this kind, which no document has, for a text.
    if (node->type != XML_ENTITY_NODE)
    {
        SetContent(node, ToEngine(text));
    }
}

void Clear(xmlNode* node)
{
    ForgetIdsOfContents(node);
    while (node->children != 0)
    {
        UnlinkAndFree(node->children);
    }
    // An attribute that the engine fails to remove would be met again and again.
    bool removed = true;
    while (removed && AttributesOf(node) != 0)
    {
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
    UnlinkAndFree(node);
}

} // namespace kx
