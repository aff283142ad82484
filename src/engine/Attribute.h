#ifndef KX_ENGINE_ATTRIBUTE_H
#define KX_ENGINE_ATTRIBUTE_H

#include "Node.h"

namespace kx
{

struct AttributeView
{
    TextView name;
    TextView value;
};

/**
 * @return whether @p element has @p attribute, as xmlGetProp() answers: the first attribute of the
 *         name counts, regardless of its prefix, or else the default that a DTD declares; and its
 * value is exactly this one.
 *
 * A value that is one text, as that of nearly every attribute, is compared in place: nothing is
 * copied. A name that is empty or holds a NUL names no attribute.
 */
bool HasAttribute(const xmlNode* element, const AttributeView& attribute);

} // namespace kx

#endif
