#ifndef KX_TOOLS_BYTESET_H
#define KX_TOOLS_BYTESET_H

#include <algorithm>
#include <string_view>

/** A few bytes that texts are searched for. */
class ByteSet
{
public:
    explicit constexpr ByteSet(std::string_view bytes)
    {
        for (const char c : bytes)
        {
            m_contains[static_cast<unsigned char>(c)] = true;
        }
    }

    /** @return whether one of the bytes is in @p text. */
    bool IsIn(std::string_view text) const
    {
        return std::any_of(text.begin(), text.end(),
                           [this](unsigned char c) { return m_contains[c]; });
    }

private:
    bool m_contains[256] = {};
};

#endif
