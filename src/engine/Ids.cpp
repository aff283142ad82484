#include "Ids.h"

#include "Kind.h"
#include "Walk.h"

#include <libxml/hash.h>
#include <libxml/valid.h>

#include <stdlib.h>

namespace kx
{

namespace
{

bool IsId(const xmlNode* node)
{
    return IsAttribute(node) && reinterpret_cast<const xmlAttr*>(node)->atype == XML_ATTRIBUTE_ID;
}

/** Takes @p id out of the table as far as the engine can. @return the attribute. */
xmlAttr* Leave(xmlNode* id)
{
    xmlAttr* const attribute = reinterpret_cast<xmlAttr*>(id);
    xmlRemoveID(attribute->doc, attribute);
    attribute->atype = XML_ATTRIBUTE_CDATA;
    return attribute;
}

#if LIBXML_VERSION < 21400

// Up to 2.12 the engine finds an attribute in the table by its present value: not if that has
// changed, has blanks to strip, refers to an entity or cannot be copied for lack of memory. A
// change by the library and one by the engine's own call leave two entries.

/** Attributes to be taken out of the table, under whatever values it has them. */
struct Leaving
{
    xmlHashTable* table;
    const xmlAttr** attributes;
    size_t count;
};

int CompareAddresses(const void* left, const void* right)
{
    const xmlAttr* const first = *static_cast<const xmlAttr* const*>(left);
    const xmlAttr* const second = *static_cast<const xmlAttr* const*>(right);
    return first < second ? -1 : first > second;
}

// Called by the engine, whose older headers have the values writable.

template <class Char>
void FreeId(void* id, Char* /*value*/)
{
    xmlFree(const_cast<xmlChar*>(static_cast<xmlID*>(id)->value));
    xmlFree(id);
}

template <class Char>
void RemoveIfLeaving(void* id, void* data, Char* value)
{
    // The attribute is not read: where a client has freed it past the library, it is gone.
    const Leaving* const leaving = static_cast<const Leaving*>(data);
    const xmlAttr* const attribute = static_cast<const xmlID*>(id)->attr;
    if (bsearch(&attribute, leaving->attributes, leaving->count, sizeof(void*), CompareAddresses) !=
        0)
    {
        xmlHashRemoveEntry(leaving->table, value, FreeId);
    }
}

void RemoveFromTable(Leaving& leaving)
{
    qsort(leaving.attributes, leaving.count, sizeof(void*), CompareAddresses);
    // A scan permits the removal of the entry that it is at.
    xmlHashScan(leaving.table, RemoveIfLeaving, &leaving);
    leaving.count = 0;
}

size_t CountIds(xmlNode* first, const xmlNode* top)
{
    size_t count = 0;
    for (xmlNode* node = first; node != 0; node = NextWithin(top, node))
    {
        count += IsId(node);
    }
    return count;
}

/** Takes the attributes from @p first to the end of @p top out of the table, @p capacity at once.
 */
void ForgetInSteps(xmlNode* first, const xmlNode* top, const xmlAttr** space, size_t capacity)
{
    Leaving leaving = {static_cast<xmlHashTable*>(top->doc->ids), space, 0};
    for (xmlNode* node = first; node != 0; node = NextWithin(top, node))
    {
        if (IsId(node))
        {
            leaving.attributes[leaving.count++] = Leave(node);
        }
        if (leaving.count == capacity)
        {
            RemoveFromTable(leaving);
        }
    }
}

void ForgetIdsFrom(xmlNode* first, const xmlNode* top)
{
    const size_t count = CountIds(first, top);
    const xmlAttr* one = 0;
    void* const all = count > 1 ? xmlMalloc(count * sizeof(void*)) : 0;
    if (all != 0)
    {
        ForgetInSteps(first, top, static_cast<const xmlAttr**>(all), count);
        xmlFree(all);
    }
    else if (count != 0)
    {
        ForgetInSteps(first, top, &one, 1);
    }
}

#else

void ForgetIdsFrom(xmlNode* first, const xmlNode* top)
{
    for (xmlNode* node = first; node != 0; node = NextWithin(top, node))
    {
        if (IsId(node))
        {
            Leave(node);
        }
    }
}

#endif

bool HasIds(const xmlNode* node)
{
    return node->doc != 0 && node->doc->ids != 0;
}

} // namespace

void ForgetIdsWithin(xmlNode* top)
{
    if (HasIds(top))
    {
        ForgetIdsFrom(top, top);
    }
}

void ForgetIdsBelow(const xmlNode* top)
{
    if (HasIds(top))
    {
        ForgetIdsFrom(top->children, top);
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
