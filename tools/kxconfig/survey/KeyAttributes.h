#ifndef KX_TOOLS_KEYATTRIBUTES_H
#define KX_TOOLS_KEYATTRIBUTES_H

#include "file/KeyTree.h"

#include <functional>

// The order of attributes.

/** @return a number below, above or equal to 0, as @p one is before, behind or like @p other. */
inline int CompareAttributes(const KeyAttribute& one, const KeyAttribute& other)
{
    const int byName = one.name.compare(other.name);
    return byName != 0 ? byName : one.value.compare(other.value);
}

/** @return a number that is faster to compare first. */
inline size_t HashOf(const KeyAttribute& attribute)
{
    const std::hash<std::string_view> hash;
    return hash(attribute.name) * 31 + hash(attribute.value);
}

#endif
