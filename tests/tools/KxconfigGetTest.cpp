#include "ToolTest.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>

using namespace kxtest;
using testing::AllOf;
using testing::EndsWith;
using testing::HasSubstr;
using testing::StartsWith;

namespace
{

class KxconfigGet : public ToolTest
{
protected:
    static void ExpectValue(const std::string& key, const std::string& value)
    {
        const Outcome outcome = Tool({"get", kGateway, key});
        EXPECT_EQ(0, outcome.status) << key;
        EXPECT_EQ(value + "\n", outcome.out) << key;
        EXPECT_EQ("", outcome.err) << key;
    }
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
        ExpectComplaint(
            Tool({"get", kGateway, key}), 2,
            "malformed key \"" + key +
                "\": a key names the root element and at least one more, as in root.name");
    }
}

TEST_F(KxconfigGet, RefusesBadUsage)
{
    ExpectComplaint(
        Tool({}), 2,
        "a command is required: get, set, add, remove, explain, check, keys, find or diff" +
            kUsage);
    ExpectComplaint(Tool({"frobnicate"}), 2, "unknown command \"frobnicate\"" + kUsage);
    ExpectComplaint(Tool({"frobnicate", kGateway, "a.b"}), 2,
                    "unknown command \"frobnicate\"" + kUsage);
    ExpectComplaint(Tool({"explain", kGateway, "a.b", "frobnicate"}), 2,
                    "VALUE requires --set" + kUsage);
    ExpectComplaint(Tool({"--frobnicate"}), 2,
                    "The following argument was not expected: --frobnicate" + kUsage);
    ExpectComplaint(Tool({"get"}), 2, "FILE is required" + kUsage);
    ExpectComplaint(Tool({"get", kGateway}), 2, "KEY is required" + kUsage);
    ExpectComplaint(Tool({"remove", "-", "/a/b"}), 2, "FILE: \"-\" is not a file name" + kUsage);
    EXPECT_EQ(2, Tool({"get", kGateway, "a.b", "c"}).status);
}

TEST_F(KxconfigGet, PrintsEachOfSeveralKeysWithItsValues)
{
    const Outcome outcome = Tool({"get", kGateway, "gateway.network.dns.server", "gateway.name"});
    EXPECT_EQ(0, outcome.status);
    EXPECT_EQ("gateway.network.dns.server\t\"10.20.0.53\"\n"
              "gateway.network.dns.server\t\"10.20.0.54\"\n"
              "gateway.name\t\"line-3-gateway\"\n",
              outcome.out);
    EXPECT_EQ("", outcome.err);
}

TEST_F(KxconfigGet, PrintsTheKeysThatHaveValuesAndComplainsAboutTheOthers)
{
    const Outcome outcome = Tool({"get", kGateway, "gateway.missing", "gate.name", "gateway.name"});
    EXPECT_EQ(1, outcome.status);
    EXPECT_EQ("gateway.name\t\"line-3-gateway\"\n", outcome.out);
    EXPECT_EQ(
        "kxconfig: nothing found: no element of " + kGateway +
            " has a value under \"gateway.missing\"\n"
            "kxconfig: nothing found: the key starts with \"gate\", but the root element of " +
            kGateway + " is \"gateway\"\n",
        outcome.err);
    const Outcome malformed = Tool({"get", kGateway, "gateway.name", "gateway"});
    EXPECT_EQ(2, malformed.status);
    EXPECT_EQ("", malformed.out);
}

TEST_F(KxconfigGet, PrintsTheDefaultForAKeyThatHasNoValue)
{
    for (const std::string key : {"gateway.missing", "gate.name"})
    {
        const Outcome outcome = Tool({"get", "--default", "a b", kGateway, key});
        EXPECT_EQ(0, outcome.status);
        EXPECT_EQ("a b\n", outcome.out);
        EXPECT_EQ("", outcome.err);
    }
    EXPECT_EQ("line-3-gateway\n", Tool({"get", "--default=x", kGateway, "gateway.name"}).out);
    EXPECT_EQ("\n", Tool({"get", "--default", "", kGateway, "gateway.missing"}).out);
    EXPECT_EQ("gateway.name\t\"line-3-gateway\"\ngateway.x\t\"d\"\n",
              Tool({"get", "--default", "d", kGateway, "gateway.name", "gateway.x"}).out);
    EXPECT_EQ(2, Tool({"get", "--default", "x", kGateway, "gateway"}).status);
    EXPECT_EQ(3, Tool({"get", "--default", "x", m_folder.Path("missing"), "a.b"}).status);
}

TEST_F(KxconfigGet, EndsValuesWithNul)
{
    const std::string file = m_folder.Write("cfg.xml", "<cfg><a>1\n2</a><a>\"3\"</a></cfg>");
    const std::string nul(1, '\0');
    EXPECT_EQ("1\n2" + nul + "\"3\"" + nul, Tool({"get", "-z", file, "cfg.a"}).out);
    EXPECT_EQ("cfg.a\t1\n2" + nul + "cfg.a\t\"3\"" + nul + "cfg.b\tx" + nul,
              Tool({"get", "--null", "--default", "x", file, "cfg.a", "cfg.b"}).out);
    EXPECT_EQ(Tool({"--json", "get", file, "cfg.a"}).out,
              Tool({"--json", "get", "-z", file, "cfg.a"}).out);
}

TEST_F(KxconfigGet, ReadsStandardInput)
{
    EXPECT_EQ("1\n", ToolWithInput({"get", "-", "cfg.a"}, "<cfg><a>1</a></cfg>").out);
    const std::string large = "<cfg><a>" + std::string(200000, 'x') + "</a></cfg>";
    EXPECT_EQ(200001u, ToolWithInput({"get", "-", "cfg.a"}, large).out.size());
    EXPECT_EQ("cfg.a\t\"1\"\n", ToolWithInput({"keys", "-"}, "<cfg><a>1</a></cfg>").out);
    EXPECT_EQ("/cfg/a element \"1\"\n",
              ToolWithInput({"find", "-", "//a"}, "<cfg><a>1</a></cfg>").out);
    EXPECT_EQ(0, ToolWithInput({"explain", "-", "cfg.a"}, "<cfg><a>1</a></cfg>").status);
    const Outcome bad = ToolWithInput({"get", "-", "cfg.a"}, "<cfg>\n<a></cfg>");
    EXPECT_EQ(3, bad.status);
    EXPECT_THAT(bad.err, StartsWith("kxconfig: -:2: "));
    EXPECT_EQ(3, ToolWithInput({"get", "-", "cfg.a"}, "").status);
    const Outcome piped =
        RunShell("echo '<cfg><a>1</a></cfg>' | " + InShell(KX_CONFIG_TOOL) + " get - cfg.a");
    EXPECT_EQ("1\n", piped.out);
}

TEST_F(KxconfigGet, SaysWhyAFileCannotBeRead)
{
    const std::string missing = m_folder.Path("missing.xml");
    ExpectComplaint(Tool({"get", missing, "a.b"}), 3,
                    "cannot read " + missing + ": No such file or directory");
    const std::string folder = m_folder.Path(".");
    ExpectComplaint(Tool({"get", folder, "a.b"}), 3, "cannot read " + folder + ": Is a directory");
    ExpectComplaint(Tool({"get", "", "a.b"}), 3, "cannot read \"\": No such file or directory");
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

TEST_F(KxconfigGet, ComplainsInOneLineWhateverIsWrong)
{
    const std::string files[] = {m_folder.Write("empty.xml", ""),
                                 m_folder.Write("latin.xml", "<cfg>\n\xFF</cfg>"),
                                 m_folder.Write("new\nline.xml", "<cfg>")};
    for (const std::string& file : files)
    {
        const Outcome outcome = Tool({"get", file, "cfg.a\nb\x1B[m"});
        EXPECT_EQ(3, outcome.status);
        EXPECT_EQ("", outcome.out);
        EXPECT_EQ(1, std::count(outcome.err.begin(), outcome.err.end(), '\n')) << outcome.err;
    }
    ExpectComplaint(Tool({"get", kGateway, "gateway.a\nb\x1B"}), 1,
                    "nothing found: no element of " + kGateway +
                        " has a value under \"gateway.a\\nb\\x1b\"");
}

TEST_F(KxconfigGet, SaysThatAFileMustNotBeRead)
{
    if (geteuid() != 0)
    {
        GTEST_SKIP() << "needs to run as the superuser, to become another user";
    }
    const std::string secret = m_folder.Write("secret.xml", "<cfg/>");
    ASSERT_EQ(0, chmod(secret.c_str(), 0600));
    ASSERT_EQ(0, chmod(m_folder.Path("").c_str(), 0755));
    // Under an emulator or not: the program itself drops its rights.
    const Outcome outcome = RunProgram({KX_CONFIG_TOOL, "get", secret, "cfg.a"}, {}, 65534);
    EXPECT_EQ(3, outcome.status);
    EXPECT_EQ("kxconfig: cannot read " + secret + ": Permission denied\n", outcome.err);
}

TEST_F(KxconfigGet, BadMaskOfTheEnvironmentAsksForNothing)
{
    const std::string bad = m_folder.Write("bad.xml", "<cfg>");
    const Outcome outcome = ToolProcess({"get", bad, "a.b"}, {"KX_LOG_MASK=loud"});
    EXPECT_EQ(2, std::count(outcome.err.begin(), outcome.err.end(), '\n')) << outcome.err;
}

TEST_F(KxconfigGet, AsksForNoRecordsUnlessTheUserDoes)
{
    const std::string bad = m_folder.Write("bad.xml", "<cfg>");
    const auto lines = [](const Outcome& outcome)
    { return std::count(outcome.err.begin(), outcome.err.end(), '\n'); };
    EXPECT_EQ(1, lines(ToolProcess({"get", bad, "a.b"})));
    EXPECT_EQ(2, lines(ToolProcess({"get", bad, "a.b", "--log-mask", "error"})));
    EXPECT_EQ(2, lines(ToolProcess({"--log-mask=0x200", "get", bad, "a.b"})));
    EXPECT_EQ(2, lines(ToolProcess({"get", bad, "a.b"}, {"KX_LOG_MASK=512"})));
    EXPECT_EQ(1, lines(ToolProcess({"get", bad, "a.b", "--log-mask", "0"}, {"KX_LOG_MASK=512"})));
}

TEST_F(KxconfigGet, ShowsTheLibrarysRecords)
{
    const Outcome outcome = ToolProcess({"--log-mask", "value", "get", kGateway, "gateway.name"});
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
                StartsWith("kxconfig: --log-mask: \"loud\" is not a log mask; expected "));
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
        RunShell(InShell(KX_CONFIG_TOOL) + " get " + kGateway + " gateway.name >/dev/full");
    EXPECT_EQ(4, outcome.status);
    EXPECT_EQ("kxconfig: cannot write to standard output\n", outcome.err);
}
