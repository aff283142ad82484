#include "EngineNode.h"

#include <libxml/valid.h>

namespace kx
{

namespace
{

/** Whether @p node is a full node record whose children are its own. */
bool IsPlainNode(const xmlNode* node)
{
    switch (node->type)
    {
    case XML_ELEMENT_NODE:
    case XML_TEXT_NODE:
    case XML_CDATA_SECTION_NODE:
    case XML_PI_NODE:
    case XML_COMMENT_NODE:
    case XML_DOCUMENT_FRAG_NODE:
    case XML_XINCLUDE_START:
    case XML_XINCLUDE_END:
        return true;
    default:
        return false;
    }
}

bool IsDocument(const xmlNode* node)
{
    return node->type == XML_DOCUMENT_NODE || node->type == XML_HTML_DOCUMENT_NODE;
}

bool IsAttribute(const xmlNode* node)
{
    return node != 0 && node->type == XML_ATTRIBUTE_NODE;
}

/**
 * Makes the attribute that @p node is, or is a piece of, an ordinary one if it is an ID.
 *
 * The engine's table of IDs finds an entry by the attribute's value: an attribute whose value was
 * changed would stay in the table after it is freed.
 *
 * @return false if the engine could not, for want of memory: then the value must stay as it is.
 */
bool ForgetId(xmlNode* node)
{
    xmlNode* const owner = IsAttribute(node) ? node : LinkOf(node, &xmlNode::parent);
    if (!IsAttribute(owner))
    {
        return true;
    }
    xmlAttr* const attribute = reinterpret_cast<xmlAttr*>(owner);
    if (attribute->atype == XML_ATTRIBUTE_ID)
    {
        xmlRemoveID(attribute->doc, attribute);
    }
    return attribute->atype != XML_ATTRIBUTE_ID;
}

/** Whether @p attribute has a name and, unless @p value is empty, a text. */
bool IsWhole(const xmlAttr* attribute, const std::string& value)
{
    const xmlNode* const text = attribute->children;
    return attribute->name != 0 && (value.empty() || (text != 0 && text->content != 0));
}

} // namespace

xmlNs* NamespaceOf(xmlNode* node)
{
    if (IsAttribute(node))
    {
        return reinterpret_cast<xmlAttr*>(node)->ns;
    }
    return IsElement(node) ? node->ns : 0;
}

xmlAttr* AttributesOf(const xmlNode* node)
{
    return IsElement(node) ? node->properties : 0;
}

bool CanHoldChildren(const xmlNode* node)
{
    return node != 0 && (IsPlainNode(node) || IsAttribute(node) || IsDocument(node) ||
                         node->type == XML_DTD_NODE);
}

bool CanHaveSiblings(const xmlNode* node)
{
    // The siblings of an attribute are attributes: an element must not enter their chain.
    return node != 0 && !IsAttribute(node);
}

bool OwnsItsContent(const xmlNode* node)
{
    return node != 0 && (IsPlainNode(node) || IsAttribute(node));
}

bool CanBeRemoved(const xmlNode* node)
{
    // A reference shares its child with the entity's declaration, but nothing points to it.
    return OwnsItsContent(node) || node->type == XML_ENTITY_REF_NODE;
}

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
        xmlRemoveProp(attribute);
        return false;
    }
    return attribute != 0;
}

bool ReplaceContent(xmlNode* node, const std::string& text)
{
    if (!ForgetId(node))
    {
        return false;
    }
    xmlNodeSetContent(node, ToEngine(text));
    return true;
}

bool RemoveChildren(xmlNode* node)
{
    if (IsAttribute(node) && !ForgetId(node))
    {
        return false;
    }
    while (node->children != 0)
    {
        FreeFromTree(node->children);
    }
    return true;
}

void RemoveAttributes(xmlNode* node)
{
    // An attribute that the engine fails to remove would be met again and again.
    bool removed = true;
    while (removed && AttributesOf(node) != 0)
    {
        removed = xmlRemoveProp(AttributesOf(node)) == 0;
    }
}

bool RemoveFromTree(xmlNode* node)
{
    // An attribute that goes as a whole is taken out of the table by the engine.
    if (!IsAttribute(node) && !ForgetId(node))
    {
        return false;
    }
    FreeFromTree(node);
    return true;
}

void FreeFromTree(xmlNode* node)
{
    xmlUnlinkNode(node);
    xmlFreeNode(node);
}

} // namespace kx
