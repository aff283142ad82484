#ifndef KX_CONFIG_KEYPATH_H
#define KX_CONFIG_KEYPATH_H

/**
 * @file KeyPath.h
 * The grammar of key paths: how reader and writer take one apart.
 *
 * Everything works on views of the caller's bytes; nothing is copied.
 */

#include "engine/Node.h"

namespace kx
{

/** A key split at its first "." into this level's segment and the key of the levels below. */
struct KeySplit
{
    explicit KeySplit(TextView key)
        : first(key.Before(key.Find('.'))),
          rest(key.After(first.size)),
          hasRest(first.size != key.size)
    {
    }

    TextView first;
    TextView rest; ///< reaches to the end of the key, so it is zero-terminated like the key
    bool hasRest;  ///< false only without a "."; a key that ends in "." has an empty rest
};

/** A segment split at its first "@" into an element name and a condition. */
struct Segment
{
    Segment() {}

    explicit Segment(TextView text)
        : name(text.Before(text.Find('@'))), condition(text.After(name.size))
    {
    }

    Segment(TextView elementName, TextView itsCondition)
        : name(elementName), condition(itsCondition)
    {
    }

    /** @return whether @p element bears the segment's name. */
    bool Names(const xmlNode* element) const { return SameText(element->name, name); }

    TextView name;
    TextView condition; ///< empty if the segment has none: every element of the name will do
};

} // namespace kx

#endif
