#include "Attribute.h"

namespace kx
{

namespace
{

bool HasDtd(const xmlDoc* document)
{
    return document != 0 && (document->intSubset != 0 || document->extSubset != 0);
}

bool HoldsNul(TextView text)
{
    return text.Find('\0') != text.size;
}

// Both are rarely called, and out of line so that they cost the others neither time nor stack.

/** Compares the value with a copy that the engine makes. */
__attribute__((noinline)) bool EngineFinds(const xmlNode* element, const xmlChar* name,
                                           const TextView& value)
{
    // Old engines take the element as if they changed it.
    xmlChar* const text = xmlGetProp(const_cast<xmlNode*>(element), name);
    if (text == 0)
    {
        return false;
    }
    const bool same = SameText(text, value);
    xmlFree(text);
    return same;
}

__attribute__((noinline)) bool HasDefault(const xmlNode* element, const AttributeView& attribute)
{
    if (!HasDtd(element->doc) || HoldsNul(attribute.name))
    {
        return false;
    }
    const TextView name = attribute.name;
    // The engine takes a zero-terminated name. Few are so long that they are copied to the heap.
    xmlChar shortCopy[64];
    const bool isShort = name.size < sizeof shortCopy;
    xmlChar* const copy = isShort ? shortCopy : static_cast<xmlChar*>(xmlMalloc(name.size + 1));
    if (copy == 0)
    {
        return false;
    }
    memcpy(copy, name.data, name.size);
    copy[name.size] = 0;
    const bool found = EngineFinds(element, copy, attribute.value);
    if (!isShort)
    {
        xmlFree(copy);
    }
    return found;
}

} // namespace

bool HasAttribute(const xmlNode* element, const AttributeView& attribute)
{
    if (attribute.name.IsEmpty())
    {
        return false;
    }
    const xmlAttr* found = element->properties;
    while (found != 0 && !SameText(found->name, attribute.name))
    {
        found = found->next;
    }
    if (found == 0)
    {
        return HasDefault(element, attribute);
    }
    const xmlNode* const text = OnlyText(found->children);
    return text != 0 && text->content != 0 ? SameText(text->content, attribute.value)
                                           : EngineFinds(element, found->name, attribute.value);
}

} // namespace kx
