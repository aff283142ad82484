#include "support/Program.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

using namespace kxtest;
using testing::MatchesRegex;

namespace
{

const char* const kProbe = KX_PLATFORM_PROBE;

std::string MaskWith(const std::string& setting)
{
    return RunProgram({kProbe, "mask"}, {setting}).out;
}

// POSIX regular expressions, as GoogleTest uses them.
const std::string kTime = "[0-9]{4}-[0-9]{2}-[0-9]{2}T[0-9]{2}:[0-9]{2}:[0-9]{2}[.][0-9]{3} ";

} // namespace

TEST(KxLog, WritesOneLineOfTimeLevelTagLineAndText)
{
    const Outcome outcome = RunProgram({kProbe, "log", "9", "box"});
    EXPECT_EQ(0, outcome.status);
    EXPECT_EQ("", outcome.out);
    EXPECT_THAT(outcome.err, MatchesRegex(kTime + "error ParseFile:42 text: box\n"));
}

TEST(KxLog, NamesTheLevels)
{
    const std::pair<const char*, const char*> names[] = {{"8", "warning"}, {"9", "error"},
                                                         {"11", "trace"},  {"29", "value"},
                                                         {"31", "xpath"},  {"5", "level5"}};
    for (const auto& [level, name] : names)
    {
        EXPECT_THAT(RunProgram({kProbe, "log", level, "x"}).err,
                    MatchesRegex(kTime + name + " ParseFile:42 text: x\n"));
    }
}

TEST(KxLog, KeepsARecordOnItsLine)
{
    EXPECT_THAT(
        RunProgram({kProbe, "log", "9", "a\nb\tc\x7F\x1B[m"}).err,
        MatchesRegex(kTime + "error ParseFile:42 text: a\\\\nb\\\\x09c\\\\x7F\\\\x1B\\[m\n"));
}

TEST(KxLog, KeepsBytesBeyondAscii)
{
    EXPECT_THAT(RunProgram({kProbe, "log", "9", "\xC3\xBC"}).err,
                testing::EndsWith(" text: \xC3\xBC\n"));
}

TEST(KxLog, WritesLongRecordsWhole)
{
    for (const std::size_t length : {255u, 256u, 257u, 100000u})
    {
        EXPECT_THAT(RunProgram({kProbe, "long", std::to_string(length)}).err,
                    testing::EndsWith(" error Tag:1 " + std::string(length, 'x') + "\n"));
    }
}

TEST(KxLog, NeverFailsTheCallerWhenTheRecordCannotBeWritten)
{
    for (const char* const how : {"closed", "full", "pipe"})
    {
        const Outcome outcome = RunProgram({kProbe, "void", how});
        EXPECT_EQ(0, outcome.status) << how;
        EXPECT_EQ("alive\n", outcome.out) << how;
    }
}

TEST(KxLog, NeverFailsTheCallerWhenMemoryIsShort)
{
    const Outcome outcome = RunProgram({kProbe, "memory"});
    EXPECT_EQ(0, outcome.status);
    EXPECT_EQ("alive\n", outcome.out);
}

TEST(KxLog, TakesBackOnlyTheSignalThatItRaised)
{
    EXPECT_EQ(0, RunProgram({kProbe, "pending"}).status);
}

TEST(KxLog, LetsACancelledThreadEnd)
{
    EXPECT_EQ(0, RunProgram({kProbe, "cancel"}).status);
}

TEST(KxLog, WritesOnAfterPartialAndInterruptedWrites)
{
    const Outcome outcome = RunProgram({kProbe, "piecemeal"});
    EXPECT_EQ(0, outcome.status);
    EXPECT_THAT(outcome.out, testing::EndsWith(" error Tag:1 " + std::string(300000, 'x') + "\n"));
}

TEST(LogMaskOfTheEnvironment, BadValueNeverFailsTheProcess)
{
    const Outcome outcome =
        RunShell("set -o pipefail; exec 3>&1; " + InShell(kProbe) + " mask 2>&1 1>&3 3>&- | true",
                 {"KX_LOG_MASK=a\nb"});
    EXPECT_EQ(0, outcome.status);
    EXPECT_EQ("0x00000300\n", outcome.out);
    EXPECT_EQ(
        0u,
        RunProgram({kProbe, "mask"}, {"KX_LOG_MASK=a\nb"}).err.find("KX_LOG_MASK: \"a\\nb\" is"));
}

TEST(LogMaskOfTheEnvironment, StartsAtWarningsAndErrors)
{
    EXPECT_EQ("0x00000300\n", MaskWith("KX_LOG_MASK="));
}

TEST(LogMaskOfTheEnvironment, OverridesTheMaskAtLoad)
{
    EXPECT_EQ("0x00000800\n", MaskWith("KX_LOG_MASK=2048"));
    EXPECT_EQ("0x00000800\n", MaskWith("KX_LOG_MASK=0x800"));
    EXPECT_EQ("0x00000A00\n", MaskWith("KX_LOG_MASK=error,trace"));
    EXPECT_EQ("0x00000000\n", MaskWith("KX_LOG_MASK=0"));
}

TEST(LogMaskOfTheEnvironment, BadValueGetsOneLineAndChangesNothing)
{
    const Outcome outcome = RunProgram({kProbe, "mask"}, {"KX_LOG_MASK=loud"});
    EXPECT_EQ(0, outcome.status);
    EXPECT_EQ("0x00000300\n", outcome.out);
    EXPECT_EQ("KX_LOG_MASK: \"loud\" is not a log mask; expected a 32-bit number (decimal, or "
              "hexadecimal after 0x), or names joined by commas: warning, error, trace, value, "
              "xpath, all, none\n",
              outcome.err);
}
