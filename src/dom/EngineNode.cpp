#include "EngineNode.h"

#include <libxml/hash.h>
#include <libxml/valid.h>

namespace kx
{

namespace
{

/** Whether @p node is of a kind whose content the engine replaces, with all that lies below. */
bool HasContent(const xmlNode* node)
{
    switch (node->type)
    {
    case XML_ELEMENT_NODE:
    case XML_ATTRIBUTE_NODE:
    case XML_TEXT_NODE:
    case XML_CDATA_SECTION_NODE:
    case XML_PI_NODE:
    case XML_COMMENT_NODE:
    case XML_DOCUMENT_FRAG_NODE:
        return true;
    default:
        return false;
    }
}

/** Whether @p node is freed with what lies below, and nothing else points to either. */
bool OwnsWhatItHolds(const xmlNode* node)
{
    return HasContent(node) || node->type == XML_XINCLUDE_START || node->type == XML_XINCLUDE_END;
}

bool IsDocument(const xmlNode* node)
{
    return node->type == XML_DOCUMENT_NODE || node->type == XML_HTML_DOCUMENT_NODE;
}

bool IsAttribute(const xmlNode* node)
{
    return node->type == XML_ATTRIBUTE_NODE;
}

/** Whether @p node is a reference whose child is the declaration of its entity. */
bool RefersToDeclaration(const xmlNode* node)
{
    return node->type == XML_ENTITY_REF_NODE && node->children != 0;
}

/** Whether @p node is in the tables of its DTD, too. */
bool IsDeclaration(const xmlNode* node)
{
    return node->type == XML_ELEMENT_DECL || node->type == XML_ATTRIBUTE_DECL ||
           node->type == XML_ENTITY_DECL;
}

/** Whether @p node declares an entity that references in the document may point to. */
bool IsGeneralEntity(const xmlNode* node)
{
    if (node->type != XML_ENTITY_DECL)
    {
        return false;
    }
    const xmlEntityType type = reinterpret_cast<const xmlEntity*>(node)->etype;
    return type != XML_INTERNAL_PARAMETER_ENTITY && type != XML_EXTERNAL_PARAMETER_ENTITY;
}

bool HasChild(const xmlNode* node, bool (*isWanted)(const xmlNode*))
{
    const xmlNode* child = node->children;
    while (child != 0 && !isWanted(child))
    {
        child = child->next;
    }
    return child != 0;
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
 * Takes @p attribute out of the table of IDs if it is there.
 *
 * Up to 2.13 the engine finds it by a copy of the value that it makes out of the attribute. It
 * finds none that has changed, nor one with blanks to strip or with a reference to an entity, nor
 * any when memory is short; it would then look at the attribute again after that is freed.
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

/** @return what follows @p node among all that is freed with @p top, or null. */
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

/** Takes every attribute that is freed with @p top out of the table of IDs. */
void ForgetIdsWithin(xmlNode* top)
{
    xmlNode* node = top->doc != 0 && top->doc->ids != 0 ? top : 0;
    while (node != 0)
    {
        if (IsAttribute(node))
        {
            ForgetId(reinterpret_cast<xmlAttr*>(node));
        }
        node = NextWithin(top, node);
    }
}

/** Empties the table of IDs, before a DTD is freed to whose entities their values may refer. */
void ForgetAllIds(xmlDoc* document)
{
    if (document != 0 && document->ids != 0)
    {
        xmlFreeIDTable(static_cast<xmlIDTable*>(document->ids));
        document->ids = 0;
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
    return node != 0 && (OwnsWhatItHolds(node) || IsDocument(node) || node->type == XML_DTD_NODE);
}

bool CanHaveSiblings(const xmlNode* node)
{
    // The siblings of an attribute are attributes: an element must not enter their chain.
    return node != 0 && !IsAttribute(node);
}

bool CanTakeContent(const xmlNode* node)
{
    return node != 0 && !RefersToDeclaration(node);
}

bool CanBeCleared(const xmlNode* node)
{
    if (node == 0)
    {
        return false;
    }
    switch (node->type)
    {
    case XML_DOCUMENT_NODE:
    case XML_HTML_DOCUMENT_NODE:
    case XML_ELEMENT_DECL:
    case XML_ATTRIBUTE_DECL:
        return true;
    case XML_ENTITY_REF_NODE:
        return !RefersToDeclaration(node);
    case XML_DTD_NODE:
        return !HasChild(node, IsDeclaration);
    default:
        return OwnsWhatItHolds(node);
    }
}

bool CanBeRemoved(const xmlNode* node)
{
    if (node == 0)
    {
        return false;
    }
    switch (node->type)
    {
    case XML_ENTITY_REF_NODE: // nothing points to it, whatever its child
        return true;
    case XML_DTD_NODE:
        return !HasChild(node, IsGeneralEntity);
    default:
        return OwnsWhatItHolds(node);
    }
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
        xmlNodeSetContent(node, ToEngine(text));
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
