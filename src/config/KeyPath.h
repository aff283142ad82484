#ifndef KX_CONFIG_KEYPATH_H
#define KX_CONFIG_KEYPATH_H

/**
 * @file KeyPath.h
 * The grammar of key paths: how reader and writer take one apart.
 *
 * Everything works on views of the caller's bytes; nothing is copied.
 */

#include "Condition.h"

namespace kx
{

/** A key split at its first "." into this level's segment and the key of the levels below. */
class KeySplit
{
public:
    explicit KeySplit(TextView key) : m_key(key), m_dot(key.Find('.')) {}

    TextView First() const { return m_key.Before(m_dot); }

    /** @return whether there is a "."; a key that ends in it has an empty rest. */
    bool HasRest() const { return m_dot != m_key.size; }

    /** @return the bytes after the "."; zero-terminated if the key is, as they reach to its end. */
    TextView Rest() const { return m_key.After(m_dot); }

private:
    TextView m_key;
    size_t m_dot;
};

/** A segment split at its first "@" into an element name and a condition. */
struct Segment
{
    Segment() {}

    explicit Segment(TextView text)
        : name(text.Before(text.Find('@'))), condition(text.After(name.size))
    {
    }

    /** @return whether @p element bears the segment's name. */
    bool Names(const xmlNode* element) const { return SameText(element->name, name); }

    TextView name;
    Condition condition;
};

} // namespace kx

#endif
