#include "Ids.h"

#include "Kind.h"

#include <libxml/hash.h>
#include <libxml/valid.h>

namespace kx
{

namespace
{

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

} // namespace

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

void ForgetAllIds(xmlDoc* document)
{
    if (document != 0 && document->ids != 0)
    {
        xmlFreeIDTable(static_cast<xmlIDTable*>(document->ids));
        document->ids = 0;
    }
}

} // namespace kx
