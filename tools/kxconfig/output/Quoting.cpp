#include "output/Quoting.h"

#include <algorithm>

namespace
{

/** This many bytes identify a text from a file. */
const size_t kShownBytes = 40;

/** @return the byte at @p position; 0 behind the end. */
unsigned char ByteAt(const std::string& text, size_t position)
{
    return position < text.size() ? static_cast<unsigned char>(text[position]) : 0;
}

bool ContinuesCharacter(unsigned char byte)
{
    return (byte & 0xC0) == 0x80;
}

/** @return whether the first two bytes of a character of three or four can stand together: others
 * say in more bytes than it takes what a terminal may obey, or name no character. */
bool CanStartCharacter(unsigned char first, unsigned char second)
{
    switch (first)
    {
    case 0xE0:
        return second >= 0xA0;
    case 0xED:
        return second < 0xA0;
    case 0xF0:
        return second >= 0x90;
    case 0xF4:
        return second < 0x90;
    default:
        return true;
    }
}

/** @return how many bytes the character at @p position has; 0 if it is no UTF-8. */
size_t LengthOfCharacter(const std::string& text, size_t position)
{
    const unsigned char first = ByteAt(text, position);
    if (first < 0x80)
    {
        return 1;
    }
    if (first < 0xC2 || first > 0xF4 || !CanStartCharacter(first, ByteAt(text, position + 1)))
    {
        return 0;
    }
    const size_t length = first < 0xE0 ? 2 : first < 0xF0 ? 3 : 4;
    for (size_t i = 1; i != length; ++i)
    {
        if (!ContinuesCharacter(ByteAt(text, position + i)))
        {
            return 0;
        }
    }
    return length;
}

/** @return whether the character is one that moves no cursor and changes no colour: U+0080 to
 * U+009F do so too. */
bool IsPlain(const std::string& text, size_t position, size_t length)
{
    const unsigned char first = ByteAt(text, position);
    return length == 1 ? first >= 0x20 && first != 0x7F
                       : first != 0xC2 || ByteAt(text, position + 1) >= 0xA0;
}

std::string Escaped(const std::string& bytes)
{
    if (bytes == "\n")
    {
        return "\\n";
    }
    const char* const digits = "0123456789abcdef";
    std::string escaped;
    for (const char c : bytes)
    {
        const auto byte = static_cast<unsigned char>(c);
        escaped += {'\\', 'x', digits[byte >> 4], digits[byte & 0xF]};
    }
    return escaped;
}

/** @return whether nothing in @p text needs an escape, which is fast to find out. */
bool IsPlainAscii(const std::string& text)
{
    return std::all_of(text.begin(), text.end(), [](char c) { return c >= 0x20 && c < 0x7F; });
}

/** @return @p text with what is neither plain nor one of the @p kept characters escaped. */
std::string EscapedBut(const std::string& kept, const std::string& text)
{
    if (IsPlainAscii(text))
    {
        return text;
    }
    std::string line;
    for (size_t i = 0; i != text.size();)
    {
        const size_t character = LengthOfCharacter(text, i);
        const size_t length = std::max<size_t>(character, 1);
        const bool isKept = kept.find(text[i]) != std::string::npos;
        if (isKept || (character != 0 && IsPlain(text, i, character)))
        {
            line.append(text, i, length);
        }
        else
        {
            line += Escaped(text.substr(i, length));
        }
        i += length;
    }
    return line;
}

} // namespace

std::string OnOneLine(const std::string& text)
{
    return EscapedBut("", text);
}

std::string OnItsLines(const std::string& text)
{
    return EscapedBut("\n\t", text);
}

std::string Quoted(const std::string& text)
{
    std::string quoted;
    quoted.reserve(text.size() + 2);
    quoted += '"';
    for (const char c : text)
    {
        quoted += c == '"' || c == '\\' ? "\\" : "";
        quoted += c;
    }
    quoted += '"';
    return IsPlainAscii(quoted) ? quoted : OnOneLine(quoted);
}

std::string QuotedStart(const std::string& text)
{
    return text.size() <= kShownBytes
               ? Quoted(text)
               : Quoted(text.substr(0, StartOfCharacter(text, kShownBytes))) + "...";
}

size_t StartOfCharacter(const std::string& text, size_t position)
{
    for (size_t start = position; position - start < 4; --start)
    {
        if (LengthOfCharacter(text, start) > position - start)
        {
            return start;
        }
        if (start == 0)
        {
            break;
        }
    }
    return position; // of a byte that belongs to no character
}
