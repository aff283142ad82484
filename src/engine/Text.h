#ifndef KX_ENGINE_TEXT_H
#define KX_ENGINE_TEXT_H

/**
 * @file Text.h
 * Text as the engine has it, zero-terminated, and as the library does, with a length.
 */

#include <libxml/xmlstring.h>

#include <stddef.h>
#include <string.h>

#include <string>

namespace kx
{

/** A run of bytes in a string that outlives the view. Any byte may occur, NUL included. */
struct TextView
{
    TextView() : data(0), size(0) {}
    TextView(const char* bytes, size_t count) : data(bytes), size(count) {}
    explicit TextView(const std::string& text) : data(text.c_str()), size(text.size()) {}

    bool IsEmpty() const { return size == 0; }

    /** @return the position of the first @p separator, or the view's size if there is none. */
    size_t Find(char separator) const
    {
        const void* const found = memchr(data, separator, size);
        return found == 0 ? size : static_cast<size_t>(static_cast<const char*>(found) - data);
    }

    /** @return the bytes before @p position. */
    TextView Before(size_t position) const { return TextView(data, position); }

    /** @return the bytes behind @p position, without the byte at it; empty if there are none. */
    TextView After(size_t position) const
    {
        const size_t begin = position + (position < size);
        return TextView(data + begin, size - begin);
    }

    const char* data;
    size_t size;
};

inline const xmlChar* ToEngine(const std::string& text)
{
    return reinterpret_cast<const xmlChar*>(text.c_str());
}

/** @return @p text, which may be null: then it reads as empty. */
inline const char* FromEngine(const xmlChar* text)
{
    return text != 0 ? reinterpret_cast<const char*>(text) : "";
}

// Called from so many places that it is inline only where speed counts more than size.
#ifdef __OPTIMIZE_SIZE__
#define KX_INLINE_FOR_SPEED __attribute__((noinline)) inline
#else
#define KX_INLINE_FOR_SPEED inline
#endif

/**
 * @return whether the engine's @p text consists of exactly the bytes of @p view.
 *
 * A null @p text equals nothing: short of memory the engine makes elements without a name.
 */
KX_INLINE_FOR_SPEED bool SameText(const xmlChar* text, TextView view)
{
    if (text == 0)
    {
        return false;
    }
    const xmlChar* const bytes = reinterpret_cast<const xmlChar*>(view.data);
    for (size_t i = 0; i != view.size; ++i)
    {
        // A NUL in the view is no byte of the text: it must not lead past the terminator.
        if (text[i] != bytes[i] || text[i] == 0)
        {
            return false;
        }
    }
    return text[view.size] == 0;
}

/** The same of a zero-terminated name, which the system's calls compare faster. */
inline bool SameText(const xmlChar* text, const std::string& name)
{
    const char* const bytes = FromEngine(text);
    const char* const wanted = name.c_str();
    // Most names differ at once. A NUL among the wanted bytes ends strcmp, but not the name.
    return text != 0 && bytes[0] == wanted[0] && strcmp(bytes, wanted) == 0 &&
           strlen(bytes) == name.size();
}

} // namespace kx

#endif
