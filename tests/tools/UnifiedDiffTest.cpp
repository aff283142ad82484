#include "output/UnifiedDiff.h"

#include <gtest/gtest.h>

#include <random>
#include <sstream>
#include <vector>

namespace
{

std::string Diff(const std::string& before, const std::string& after)
{
    const std::string name = "a.xml";
    return UnifiedDiff({name, before}, {name, after});
}

const std::string kHeader = "--- a.xml\n+++ a.xml\n";

/** Does with @p diff what patch(1) does; its context and what it removes must be in @p before. */
std::string Patched(const std::string& before, const std::string& diff)
{
    std::istringstream old(before);
    std::istringstream lines(diff);
    std::string result;
    std::string line;
    size_t position = 1;
    const auto copyUntil = [&](size_t end)
    {
        for (std::string text; position != end && std::getline(old, text); ++position)
        {
            result += text + "\n";
        }
    };
    while (std::getline(lines, line))
    {
        const std::string text = line.substr(1);
        std::string inFile;
        if (line.compare(0, 4, "@@ -") == 0)
        {
            const size_t first = std::stoul(line.substr(4));
            const bool isNone = line.find(",0 +") != std::string::npos;
            copyUntil(first + (isNone ? 1 : 0));
        }
        else if ((line[0] == ' ' || line[0] == '-') && line.compare(0, 4, "--- ") != 0)
        {
            std::getline(old, inFile);
            ++position;
            EXPECT_EQ(text, inFile);
        }
        if ((line[0] == ' ' || line[0] == '+') && line.compare(0, 4, "+++ ") != 0)
        {
            result += text + "\n";
        }
    }
    copyUntil(0);
    return result;
}

size_t CountLines(const std::string& diff, char mark)
{
    std::istringstream lines(diff.substr(kHeader.size()));
    size_t count = 0;
    for (std::string line; std::getline(lines, line);)
    {
        count += line[0] == mark ? 1 : 0;
    }
    return count;
}

} // namespace

TEST(UnifiedDiff, EqualTextsHaveNone)
{
    EXPECT_EQ("", Diff("", ""));
    EXPECT_EQ("", Diff("a\nb", "a\nb"));
}

TEST(UnifiedDiff, ShowsThreeLinesAroundAChange)
{
    EXPECT_EQ(kHeader + "@@ -2,7 +2,7 @@\n 2\n 3\n 4\n-5\n+x\n 6\n 7\n 8\n",
              Diff("1\n2\n3\n4\n5\n6\n7\n8\n9\n", "1\n2\n3\n4\nx\n6\n7\n8\n9\n"));
}

TEST(UnifiedDiff, JoinsChangesWhoseContextsMeet)
{
    EXPECT_EQ(kHeader + "@@ -1,8 +1,8 @@\n-1\n+x\n 2\n 3\n 4\n 5\n 6\n 7\n-8\n+y\n",
              Diff("1\n2\n3\n4\n5\n6\n7\n8\n", "x\n2\n3\n4\n5\n6\n7\ny\n"));
    EXPECT_EQ(kHeader + "@@ -1,4 +1,4 @@\n-1\n+x\n 2\n 3\n 4\n"
                        "@@ -6,4 +6,4 @@\n 6\n 7\n 8\n-9\n+y\n",
              Diff("1\n2\n3\n4\n5\n6\n7\n8\n9\n", "x\n2\n3\n4\n5\n6\n7\n8\ny\n"));
}

TEST(UnifiedDiff, NamesTheLineBeforeWhatIsAddedOrRemoved)
{
    EXPECT_EQ(kHeader + "@@ -0,0 +1,2 @@\n+1\n+2\n", Diff("", "1\n2\n"));
    EXPECT_EQ(kHeader + "@@ -1 +0,0 @@\n-1\n", Diff("1\n", ""));
    EXPECT_EQ(kHeader + "@@ -1,2 +1,3 @@\n 1\n+x\n 2\n", Diff("1\n2\n", "1\nx\n2\n"));
}

TEST(UnifiedDiff, MarksAMissingLineEnd)
{
    EXPECT_EQ(kHeader + "@@ -1 +1 @@\n-1\n\\ No newline at end of file\n+1\n", Diff("1", "1\n"));
}

TEST(UnifiedDiff, IsMinimalForFewChanges)
{
    EXPECT_EQ(kHeader + "@@ -1,5 +1,5 @@\n-a\n b\n c\n a\n+b\n b\n",
              Diff("a\nb\nc\na\nb\n", "b\nc\na\nb\nb\n"));
}

TEST(UnifiedDiff, TurnsOneTextIntoTheOther)
{
    std::mt19937 random(1);
    for (int round = 0; round != 300; ++round)
    {
        const auto variety = 1 + random() % 40;
        std::string before;
        std::string after;
        for (auto line = random() % 60; line != 0; --line)
        {
            const std::string text = std::to_string(random() % variety) + "\n";
            before += random() % 5 == 0 ? "" : text;
            after += random() % 5 == 0 ? "" : text;
        }
        EXPECT_EQ(after, Patched(before, Diff(before, after))) << before << "->\n" << after;
    }
}

TEST(UnifiedDiff, IsLinearInLargeTextsThatDifferEverywhere)
{
    std::string before;
    std::string after;
    for (int i = 0; i != 100000; ++i)
    {
        before += "<a>" + std::to_string(i % 7) + "</a>\n";
        after += "<b>" + std::to_string(i % 7) + "</b>\n";
    }
    const std::string diff = Diff(before, after);
    EXPECT_EQ(100000u, CountLines(diff, '-'));
    EXPECT_EQ(100000u, CountLines(diff, '+'));
}

TEST(UnifiedDiff, FindsManyChangesThatLeaveTheNumberOfLines)
{
    std::string before;
    std::string after;
    for (int i = 0; i != 10000; ++i)
    {
        before += i % 10 == 0 ? "<a>1</a>\n" : "<c/>\n";
        after += i % 10 == 0 ? "<a>2</a>\n" : "<c/>\n";
    }
    EXPECT_EQ(1000u, CountLines(Diff(before, after), '-'));
}

TEST(UnifiedDiff, FindsManyChangesBetweenLinesThatOccurOnce)
{
    std::string before;
    std::string after;
    for (int i = 0; i != 1000; ++i)
    {
        before += "<net id='" + std::to_string(i) + "'>\n<ip/>\n";
        after += "<net id='" + std::to_string(i) + "'>\n<ip/>\n<mask/>\n";
    }
    const std::string diff = Diff(before, after);
    EXPECT_EQ(0u, CountLines(diff, '-'));
    EXPECT_EQ(1000u, CountLines(diff, '+'));
    EXPECT_EQ(after, Patched(before, diff));
}
