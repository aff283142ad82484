#include "LogMask.h"

#include <gtest/gtest.h>

namespace
{

const unsigned kUntouched = 0xABCDu;

unsigned Parsed(const char* text)
{
    unsigned mask = kUntouched;
    EXPECT_TRUE(ParseLogMask(text, mask)) << text;
    return mask;
}

} // namespace

TEST(LogMask, IsADecimalNumber)
{
    EXPECT_EQ(0u, Parsed("0"));
    EXPECT_EQ(512u, Parsed("512"));
    EXPECT_EQ(10u, Parsed("010")); // no octal numbers
    EXPECT_EQ(0xFFFFFFFFu, Parsed("4294967295"));
}

TEST(LogMask, IsAHexadecimalNumber)
{
    EXPECT_EQ(0x80000000u, Parsed("0x80000000"));
    EXPECT_EQ(0xABCDEFu, Parsed("0XabCDef"));
}

TEST(LogMask, IsAListOfNames)
{
    EXPECT_EQ(0x100u, Parsed("warning"));
    EXPECT_EQ(0x200u, Parsed("error"));
    EXPECT_EQ(0x800u, Parsed("trace"));
    EXPECT_EQ(0x20000000u, Parsed("value"));
    EXPECT_EQ(0x80000000u, Parsed("xpath"));
    EXPECT_EQ(0xA00u, Parsed("error,trace"));
    EXPECT_EQ(0xFFFFFFFFu, Parsed("all"));
    EXPECT_EQ(0u, Parsed("none"));
}

TEST(LogMask, RefusesAnythingElseAndLeavesTheMaskAlone)
{
    for (const char* const text :
         {"", " ", "loud", "error,", ",error", "error,,trace", "error trace", "Error", "-1", "+1",
          "0x", "0xG", "12a", "4294967296", "0x100000000", "99999999999999999999999", "err"})
    {
        unsigned mask = kUntouched;
        EXPECT_FALSE(ParseLogMask(text, mask)) << text;
        EXPECT_EQ(kUntouched, mask) << text;
    }
}
