#ifndef KX_CONFIG_KEYPATH_H
#define KX_CONFIG_KEYPATH_H

/**
 * @file KeyPath.h
 * The grammar of key paths: how reader and writer take one apart.
 *
 * Everything works on views of the caller's bytes; nothing is copied. Any byte may occur, NUL
 * included.
 */

#include <libxml/tree.h>

#include <stddef.h>
#include <string.h>

#include <string>

namespace kx
{

/** A run of bytes in a string that somebody else keeps alive. */
struct TextView
{
    TextView() : data(""), size(0) {}
    TextView(const char* bytes, size_t count) : data(bytes), size(count) {}
    explicit TextView(const std::string& text) : data(text.c_str()), size(text.size()) {}

    bool IsEmpty() const { return size == 0; }

    /** @return the position of the first @p separator, or the view's size if there is none. */
    size_t Find(char separator) const
    {
        const void* const found = memchr(data, separator, size);
        return found == 0 ? size : static_cast<size_t>(static_cast<const char*>(found) - data);
    }

    /** @return what stands before @p position. */
    TextView Before(size_t position) const { return TextView(data, position); }

    /** @return what stands after @p position; empty if the view ends there or before. */
    TextView After(size_t position) const
    {
        const size_t begin = position + (position < size);
        return TextView(data + begin, size - begin);
    }

    const char* data;
    size_t size;
};

/**
 * @return whether the engine's zero-terminated @p text consists of exactly the bytes of @p view.
 *
 * A null @p text is no text at all: short of memory the engine makes elements without a name.
 */
inline bool SameText(const xmlChar* text, TextView view)
{
    if (text == 0)
    {
        return false;
    }
    const xmlChar* const bytes = reinterpret_cast<const xmlChar*>(view.data);
    size_t same = 0;
    // A NUL in the view is no byte of the text: it must not lead past the terminator.
    while (same != view.size && text[same] == bytes[same] && text[same] != 0)
    {
        ++same;
    }
    return same == view.size && text[same] == 0;
}

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

/**
 * @return the text node that is the one and only child of @p element, or null.
 *
 * Only such an element has a value that can be read or replaced.
 */
inline xmlNode* OnlyTextChild(const xmlNode* element)
{
    xmlNode* const child = element->children;
    const bool isOnlyText = child != 0 && child->type == XML_TEXT_NODE && child->next == 0;
    return isOnlyText ? child : 0;
}

} // namespace kx

#endif
