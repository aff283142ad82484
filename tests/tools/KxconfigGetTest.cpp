#include "support/Files.h"
#include "support/Program.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>

using namespace kxtest;
using testing::AllOf;
using testing::EndsWith;
using testing::HasSubstr;
using testing::StartsWith;

namespace
{

const std::string kGateway = KX_EXAMPLE_DATA "/gateway.xml";

class KxconfigGet : public testing::Test
{
protected:
    static Outcome Tool(const std::vector<std::string>& arguments,
                        const std::vector<std::string>& environment = {"KX_LOG_MASK="})
    {
        std::vector<std::string> command = {KX_CONFIG_TOOL};
        command.insert(command.end(), arguments.begin(), arguments.end());
        return RunProgram(command, environment);
    }

    static void ExpectValue(const std::string& key, const std::string& value)
    {
        const Outcome outcome = Tool({"get", kGateway, key});
        EXPECT_EQ(0, outcome.status) << key;
        EXPECT_EQ(value + "\n", outcome.out) << key;
        EXPECT_EQ("", outcome.err) << key;
    }

    /** Expects nothing on standard output and one line on standard error. */
    static void ExpectComplaint(const Outcome& outcome, int status, const std::string& message)
    {
        EXPECT_EQ(status, outcome.status);
        EXPECT_EQ("", outcome.out);
        EXPECT_EQ("kxconfig: " + message + "\n", outcome.err);
    }

    TemporaryFolder m_folder;
};

const std::string kUsage = " (kxconfig --help shows the usage)";

} // namespace

TEST_F(KxconfigGet, PrintsTheValue)
{
    ExpectValue("gateway.name", "line-3-gateway");
    ExpectValue("gateway.network.interface@name=eth1.address", "192.168.40.1");
    ExpectValue("gateway.channels.channel@id=3.label", "Feed line <B>");
}

TEST_F(KxconfigGet, PrintsSeveralValuesOneOnALine)
{
    ExpectValue("gateway.network.interface.address", "10.20.3.1\n192.168.40.1");
    ExpectValue("gateway.network.dns.server", "10.20.0.53\n10.20.0.54");
    ExpectValue("gateway.channels.channel@id=1|id=2.limit@level=alarm", "210\n190");
}

TEST_F(KxconfigGet, SaysThatNothingWasFound)
{
    for (const std::string key : {"gateway.missing", "gateway.log.target", "gateway."})
    {
        ExpectComplaint(Tool({"get", kGateway, key}), 1,
                        "nothing found: no element of " + kGateway + " has a value under \"" + key +
                            "\"");
    }
}

TEST_F(KxconfigGet, NamesTheRootWhenTheKeyStartsWithAnother)
{
    ExpectComplaint(Tool({"get", kGateway, "gate.name"}), 1,
                    "nothing found: the key starts with \"gate\", but the root element of " +
                        kGateway + " is \"gateway\"");
}

TEST_F(KxconfigGet, RefusesAMalformedKey)
{
    for (const std::string key : {"", "gateway", "other"})
    {
        ExpectComplaint(Tool({"get", kGateway, key}), 2,
                        "malformed key \"" + key +
                            "\": it names the root element and at least one "
                            "more, as in root.name");
    }
}

TEST_F(KxconfigGet, RefusesBadUsage)
{
    ExpectComplaint(Tool({}), 2, "A subcommand is required" + kUsage);
    ExpectComplaint(Tool({"get"}), 2, "FILE is required" + kUsage);
    ExpectComplaint(Tool({"get", kGateway}), 2, "KEY is required" + kUsage);
    ExpectComplaint(Tool({"get", "-", "a.b"}), 2,
                    "FILE: \"-\" would read standard input; name a file" + kUsage);
    EXPECT_EQ(2, Tool({"get", kGateway, "a.b", "c"}).status);
    EXPECT_EQ(2, Tool({"frobnicate"}).status);
    EXPECT_EQ(2, Tool({"--frobnicate"}).status);
}

TEST_F(KxconfigGet, SaysWhyAFileCannotBeRead)
{
    const std::string missing = m_folder.Path("missing.xml");
    ExpectComplaint(Tool({"get", missing, "a.b"}), 3,
                    "cannot read " + missing + ": No such file or directory");
    const std::string folder = m_folder.Path(".");
    ExpectComplaint(Tool({"get", folder, "a.b"}), 3, "cannot read " + folder + ": Is a directory");
    const std::string empty = m_folder.Write("empty.xml", "");
    ExpectComplaint(Tool({"get", empty, "a.b"}), 3, "cannot read " + empty + ": The file is empty");
}

TEST_F(KxconfigGet, SaysOnWhichLineAFileIsNotWellFormed)
{
    const std::string bad = m_folder.Write("bad.xml", "<cfg>\n<a>\n</b>\n</cfg>\n");
    const Outcome outcome = Tool({"get", bad, "cfg.a"});
    EXPECT_EQ(3, outcome.status);
    EXPECT_EQ("", outcome.out);
    // What follows the place is the engine's own text.
    EXPECT_THAT(outcome.err, AllOf(StartsWith("kxconfig: " + bad + ":3: "), EndsWith("\n")));
    EXPECT_EQ(1, std::count(outcome.err.begin(), outcome.err.end(), '\n'));
}

TEST_F(KxconfigGet, AsksForNoRecordsUnlessTheUserDoes)
{
    const std::string missing = m_folder.Path("missing.xml");
    const auto lines = [](const Outcome& outcome)
    { return std::count(outcome.err.begin(), outcome.err.end(), '\n'); };
    EXPECT_EQ(1, lines(Tool({"get", missing, "a.b"})));
    EXPECT_EQ(2, lines(Tool({"get", missing, "a.b", "--log-mask", "error"})));
    EXPECT_EQ(2, lines(Tool({"--log-mask=0x200", "get", missing, "a.b"})));
    EXPECT_EQ(2, lines(Tool({"get", missing, "a.b"}, {"KX_LOG_MASK=512"})));
    EXPECT_EQ(1, lines(Tool({"get", missing, "a.b", "--log-mask", "0"}, {"KX_LOG_MASK=512"})));
}

TEST_F(KxconfigGet, ShowsTheLibrarysRecords)
{
    const Outcome outcome = Tool({"--log-mask", "value", "get", kGateway, "gateway.name"});
    EXPECT_EQ("line-3-gateway\n", outcome.out);
    EXPECT_THAT(outcome.err,
                AllOf(HasSubstr(" value GetValue:"), HasSubstr(" Key is gateway.name\n"),
                      HasSubstr(" Parsed Value :: line-3-gateway\n")));
}

TEST_F(KxconfigGet, RefusesABadLogMask)
{
    const Outcome outcome = Tool({"--log-mask", "loud", "get", kGateway, "gateway.name"});
    EXPECT_EQ(2, outcome.status);
    EXPECT_EQ("", outcome.out);
    EXPECT_THAT(outcome.err,
                StartsWith("kxconfig: --log-mask: \"loud\" is not a log mask; it is "));
}

TEST_F(KxconfigGet, HelpShowsExamples)
{
    for (const char* const option : {"--help", "-h"})
    {
        const Outcome outcome = Tool({option});
        EXPECT_EQ(0, outcome.status);
        EXPECT_THAT(outcome.out, AllOf(HasSubstr("Examples:"), HasSubstr("kxconfig get device.xml"),
                                       HasSubstr("Exit status:")));
        EXPECT_EQ("", outcome.err);
    }
    EXPECT_EQ(0, Tool({"get", "--help"}).status);
    EXPECT_THAT(Tool({"--version"}).out, StartsWith("kxconfig "));
}

TEST_F(KxconfigGet, OutputThatCannotBeWrittenIsNoSuccess)
{
    const Outcome outcome =
        RunProgram({KX_CONFIG_TOOL, "get", kGateway, "gateway.name"}, {}, "/dev/full");
    EXPECT_NE(0, outcome.status);
    EXPECT_EQ("kxconfig: cannot write to standard output\n", outcome.err);
}
