#include "diag/Log.h"
#include "diag/Status.h"

#include "support/Log.h"

#include <gtest/gtest.h>

#include <cstddef>
#include <cstring>

using namespace kxtest;

namespace
{

struct Operation
{
    Operation() { KX_ENTER(); }
    ~Operation() { KX_LOG(kx::LogLevelTrace, __FUNCTION__, "Destructor"); }

    void Run() { KX_LEAVE(); }
};

const char* g_argument = "argument";

const char* CountedArgument(int& evaluations)
{
    ++evaluations;
    return g_argument;
}

} // namespace

TEST(Gate, PassesTheRecordOfALevelWhoseBitIsSet)
{
    for (const kx::LogLevel level : {kx::LogLevelWarning, kx::LogLevelError, kx::LogLevelTrace,
                                     kx::LogLevelValue, kx::LogLevelXPath})
    {
        LogRecorder log(1u << level);
        KX_LOG(level, "Tag", "text");
        EXPECT_EQ(Records({{level, "Tag", "text"}}), log.Take());
        LogRecorder::SetMask(~(1u << level));
        KX_LOG(level, "Tag", "text");
        EXPECT_EQ(Records(), log.Take());
    }
}

TEST(Gate, LevelsHaveTheNumbersOfTheirBits)
{
    EXPECT_EQ(8, kx::LogLevelWarning);
    EXPECT_EQ(9, kx::LogLevelError);
    EXPECT_EQ(11, kx::LogLevelTrace);
    EXPECT_EQ(29, kx::LogLevelValue);
    EXPECT_EQ(31, kx::LogLevelXPath);
}

TEST(Gate, TopBitOfTheWordEnablesLevel31Alone)
{
    LogRecorder log(0x80000000u);
    EXPECT_TRUE(kx::LogEnabled(kx::LogLevelXPath));
    for (const kx::LogLevel level :
         {kx::LogLevelWarning, kx::LogLevelError, kx::LogLevelTrace, kx::LogLevelValue})
    {
        EXPECT_FALSE(kx::LogEnabled(level));
    }
}

TEST(Gate, EvaluatesNoArgumentWhenTheBitIsClear)
{
    int evaluations = 0;
    LogRecorder log(kMaskNone);
    const unsigned long calls = LogRecorder::Calls();
    KX_LOG_OF(kx::LogLevelTrace, __FUNCTION__, "%s", CountedArgument(evaluations));
    KX_VALUE("%s", CountedArgument(evaluations));
    EXPECT_EQ(0, evaluations);
    EXPECT_EQ(calls, LogRecorder::Calls());
    LogRecorder::SetMask(kMaskTrace);
    KX_LOG_OF(kx::LogLevelTrace, __FUNCTION__, "%s", CountedArgument(evaluations));
    KX_VALUE("%s", CountedArgument(evaluations));
    EXPECT_EQ(1, evaluations);
}

TEST(Gate, OfTwoLevelsIsPassedIfEitherBitIsSet)
{
    LogRecorder log(kMaskNone);
    for (const unsigned mask : {kMaskTrace, kMaskValue, kMaskTrace | kMaskValue, ~0u})
    {
        LogRecorder::SetMask(mask);
        bool passed = false;
        KX_LOG_EITHER(kx::LogLevelTrace, kx::LogLevelValue)
        {
            passed = true;
        }
        EXPECT_TRUE(passed) << mask;
    }
    LogRecorder::SetMask(~(kMaskTrace | kMaskValue));
    KX_LOG_EITHER(kx::LogLevelTrace, kx::LogLevelValue)
    {
        ADD_FAILURE() << "both bits are clear";
    }
}

TEST(Gate, ReadsTheMaskAnewEachTime)
{
    LogRecorder log(kMaskNone);
    KX_LOG(kx::LogLevelTrace, "Tag", "first");
    LogRecorder::SetMask(kMaskTrace);
    KX_LOG(kx::LogLevelTrace, "Tag", "second");
    LogRecorder::SetMask(kMaskNone);
    KX_LOG(kx::LogLevelTrace, "Tag", "third");
    EXPECT_EQ(Records({Trace("Tag", "second")}), log.Take());
}

TEST(Gate, FindsTheMaskAtItsPublishedOffset)
{
    EXPECT_EQ(12052u, kx::kLogMaskOffset);
    LogRecorder log(kMaskNone);
    const unsigned mask = 0x12345678u;
    std::memcpy(reinterpret_cast<char*>(&g_LumLogParams) + 0x2F14, &mask, sizeof mask);
    EXPECT_EQ(mask, kx::LogMask());
    EXPECT_EQ(mask, g_LumLogParams.xmlConfigParserMask);
}

TEST(Gate, TagIsTheBareNameOfTheOperation)
{
    LogRecorder log;
    {
        Operation operation;
        operation.Run();
    }
    EXPECT_EQ(
        Records({Trace("Operation", "+"), Trace("Run", "-"), Trace("~Operation", "Destructor")}),
        log.Take());
}

void BothRecords()
{
    KX_ENTER_AND_LEAVE();
}

TEST(Gate, OfBothRecordsLogsThemUnderTheOperation)
{
    LogRecorder log(~kMaskTrace);
    BothRecords();
    EXPECT_EQ(Records(), log.Take());
    LogRecorder::SetMask(kMaskTrace);
    BothRecords();
    EXPECT_EQ(Records({Trace("BothRecords", "+"), Trace("BothRecords", "-")}), log.Take());
}

TEST(Gate, OfBothRecordsReadsTheMaskAnewForTheSecond)
{
    LogRecorder log(kMaskTrace);
    LogRecorder::OnNextCall([] { LogRecorder::SetMask(kMaskNone); });
    BothRecords();
    EXPECT_EQ(Records({Trace("BothRecords", "+")}), log.Take());
}

TEST(Gate, HandsOverTheLineOfItsSite)
{
    LogRecorder log;
    KX_ENTER();
    EXPECT_EQ(__LINE__ - 1, LogRecorder::LastLine());
}

TEST(Gate, OutsideTextIsAnArgumentAndNeverTheFormat)
{
    LogRecorder log;
    g_argument = "%n%s";
    int evaluations = 0;
    KX_LOG_OF(kx::LogLevelValue, "Tag", "Key :: %s", CountedArgument(evaluations));
    EXPECT_EQ("Key :: %s", LogRecorder::LastFormat());
    EXPECT_EQ(Records({Value("Tag", "Key :: %n%s")}), log.Take());
}

TEST(Gate, IsOneStatement)
{
    LogRecorder log(kMaskNone);
    bool otherwise = false;
    if (log.Take().size() == 1)
        KX_ENTER();
    else
        otherwise = true;
    EXPECT_TRUE(otherwise);
}

TEST(StatusCodes, AreTheNumbersThatClientsCompareWith)
{
    EXPECT_EQ(0, kx::StatusOk);
    EXPECT_EQ(7, kx::StatusBadArgument);
    EXPECT_EQ(22, kx::StatusMissing);
    EXPECT_EQ(-2, kx::StatusNotFound);
}
