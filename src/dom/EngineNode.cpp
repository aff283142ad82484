#include "EngineNode.h"

#include <libxml/hash.h>
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

#if LIBXML_VERSION < 21400

/** An attribute, and the value under which the engine's table of IDs has it. */
struct TableEntry
{
    const xmlAttr* attribute;
    const xmlChar* value;
};

// Called by the engine, whose older headers have the values writable.

template <class Char>
void FindEntry(void* id, void* wanted, Char* value)
{
    TableEntry* const entry = static_cast<TableEntry*>(wanted);
    if (static_cast<const xmlID*>(id)->attr == entry->attribute)
    {
        entry->value = value;
    }
}

template <class Char>
void FreeId(void* id, Char* /*value*/)
{
    xmlFree(const_cast<xmlChar*>(static_cast<xmlID*>(id)->value));
    xmlFree(id);
}

/** Takes the ID @p attribute out of the table, wherever it is. */
void RemoveFromTable(xmlAttr* attribute)
{
    xmlHashTable* const ids = static_cast<xmlHashTable*>(attribute->doc->ids);
    TableEntry entry = {attribute, 0};
    xmlHashScan(ids, FindEntry, &entry);
    xmlHashRemoveEntry(ids, entry.value, FreeId); // does nothing without a value
    attribute->atype = XML_ATTRIBUTE_CDATA;
}

#endif

/**
 * Makes @p attribute an ordinary one if it is an ID.
 *
 * The engine would leave an attribute in its table of IDs, to look at it again after it is freed,
 * if it does not find it there. Up to 2.13 it looks for a copy of the value that it makes out of
 * the attribute: it finds none that has changed, nor one with blanks to strip or with a reference
 * to an entity, nor any when memory is short.
 */
void ForgetId(xmlAttr* attribute)
{
    if (attribute->atype != XML_ATTRIBUTE_ID)
    {
        return;
    }
    xmlRemoveID(attribute->doc, attribute);
#if LIBXML_VERSION < 21400
    if (attribute->atype == XML_ATTRIBUTE_ID)
    {
        RemoveFromTable(attribute);
    }
#endif
}

/** The same of the attribute that @p node is, or is a piece of; there may be none. */
void ForgetIdOf(xmlNode* node)
{
    xmlNode* const owner = IsAttribute(node) ? node : LinkOf(node, &xmlNode::parent);
    if (IsAttribute(owner))
    {
        ForgetId(reinterpret_cast<xmlAttr*>(owner));
    }
}

/** @return what follows @p node in document order among what @p top holds, or null. */
xmlNode* NextWithin(const xmlNode* top, xmlNode* node)
{
    // A reference's children are those of the entity's declaration.
    if (node->children != 0 && node->type != XML_ENTITY_REF_NODE)
    {
        return node->children;
    }
    while (node != top && node->next == 0)
    {
        node = node->parent;
    }
    return node != top ? node->next : 0;
}

/** The same of every attribute that is freed with @p top. */
void ForgetIdsWithin(xmlNode* top)
{
    ForgetIdOf(top);
    xmlNode* node = top->doc != 0 && top->doc->ids != 0 ? top : 0;
    while (node != 0)
    {
        for (xmlAttr* attribute = AttributesOf(node); attribute != 0; attribute = attribute->next)
        {
            ForgetId(attribute);
        }
        node = NextWithin(top, node);
    }
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
        ForgetId(attribute);
        xmlRemoveProp(attribute);
        return false;
    }
    return attribute != 0;
}

void ReplaceContent(xmlNode* node, const std::string& text)
{
    ForgetIdOf(node);
    for (xmlNode* child = node->children; child != 0; child = child->next)
    {
        ForgetIdsWithin(child);
    }
    xmlNodeSetContent(node, ToEngine(text));
}

void RemoveChildren(xmlNode* node)
{
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
        ForgetId(AttributesOf(node));
        removed = xmlRemoveProp(AttributesOf(node)) == 0;
    }
}

void FreeFromTree(xmlNode* node)
{
    ForgetIdsWithin(node);
    xmlUnlinkNode(node);
    xmlFreeNode(node);
}

} // namespace kx
