#include "LogMask.h"

#include <errno.h>
#include <stdlib.h>
#include <string.h>

namespace
{

struct NamedMask
{
    const char* name;
    int level; // -1: not a level of its own
    unsigned int mask;
};

const NamedMask kNamedMasks[] = {
    {"warning", 8, 1u << 8}, {"error", 9, 1u << 9},   {"trace", 11, 1u << 11},
    {"value", 29, 1u << 29}, {"xpath", 31, 1u << 31}, {"all", -1, 0xFFFFFFFFu},
    {"none", -1, 0u},
};
const size_t kNamedMaskCount = sizeof kNamedMasks / sizeof kNamedMasks[0];

bool ParseNumber(const char* text, unsigned int& mask)
{
    const bool hexadecimal = text[0] == '0' && (text[1] == 'x' || text[1] == 'X');
    const char* const digits = hexadecimal ? text + 2 : text;
    const char* const allowed = hexadecimal ? "0123456789abcdefABCDEF" : "0123456789";
    const size_t length = strlen(digits);
    if (length == 0 || strspn(digits, allowed) != length)
    {
        return false;
    }
    errno = 0;
    const unsigned long number = strtoul(digits, 0, hexadecimal ? 16 : 10);
    if (errno != 0 || (number & 0xFFFFFFFFul) != number)
    {
        return false;
    }
    mask = static_cast<unsigned int>(number);
    return true;
}

const NamedMask* FindName(const char* name, size_t length)
{
    for (size_t i = 0; i != kNamedMaskCount; ++i)
    {
        if (strlen(kNamedMasks[i].name) == length && memcmp(kNamedMasks[i].name, name, length) == 0)
        {
            return &kNamedMasks[i];
        }
    }
    return 0;
}

bool ParseNames(const char* text, unsigned int& mask)
{
    unsigned int collected = 0;
    for (const char* name = text;; ++name)
    {
        const size_t length = strcspn(name, ",");
        const NamedMask* const found = FindName(name, length);
        if (found == 0)
        {
            return false;
        }
        collected |= found->mask;
        name += length;
        if (*name == '\0')
        {
            break;
        }
    }
    mask = collected;
    return true;
}

} // namespace

const char* const g_LogMaskHelp =
    "a 32-bit number (decimal, or hexadecimal after 0x), or names joined by commas: "
    "warning, error, trace, value, xpath, all, none";

const char* LogLevelName(int level)
{
    for (size_t i = 0; i != kNamedMaskCount; ++i)
    {
        if (kNamedMasks[i].level == level)
        {
            return kNamedMasks[i].name;
        }
    }
    return 0;
}

bool ParseLogMask(const char* text, unsigned int& mask)
{
    const bool startsWithDigit = text[0] >= '0' && text[0] <= '9';
    return startsWithDigit ? ParseNumber(text, mask) : ParseNames(text, mask);
}
