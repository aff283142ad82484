#include "ToolTest.h"

#include <libxml/parser.h>

#include <algorithm>
#include <sstream>

using namespace kxtest;
using testing::AnyOf;
using testing::HasSubstr;
using testing::Not;

namespace
{

class KxconfigUsage : public ToolTest
{
protected:
    const std::string m_plain = m_folder.Write(
        "plain.xml", "<cfg><net id='1'><ip>a</ip></net><net id='2'><ip>b</ip></net></cfg>");

    /** Runs a command with a terminal for its output. */
    static std::string OnTerminal(const std::string& arguments,
                                  const std::vector<std::string>& environment)
    {
        return ScriptOnTerminal(InShell(KX_CONFIG_TOOL) + " " + arguments, environment);
    }

    static std::string ScriptOnTerminal(const std::string& script,
                                        const std::vector<std::string>& environment)
    {
        return RunProgram({"/usr/bin/script", "-qec", script, "/dev/null"}, environment).out;
    }
};

} // namespace

TEST_F(KxconfigUsage, ManPageContainsAllThatHelpLists)
{
    const Outcome page =
        RunShell(InShell(KX_CONFIG_TOOL) + " --man | LC_ALL=C groff -man -Tascii -ww -P -cbou");
    EXPECT_EQ("", page.err);
    for (const std::string& verb : m_verbs)
    {
        EXPECT_THAT(page.out, HasSubstr("\n   " + verb + " FILE")) << verb;
        for (const std::string& option : OptionsOf(Tool({verb, "--help"}).out))
        {
            EXPECT_THAT(page.out, HasSubstr(option));
        }
    }
    for (const std::string& option : OptionsOf(Tool({"--help"}).out))
    {
        EXPECT_THAT(page.out, HasSubstr(option));
    }
    EXPECT_THAT(page.out, HasSubstr("EXIT STATUS"));
    EXPECT_THAT(page.out, HasSubstr("kxconfig get device.xml 'cfg.net@id=2.ip'"));
}

TEST_F(KxconfigUsage, ExitStatusesAreTheSameInHelpManPageAndDocumentation)
{
    const std::string help = Tool({"--help"}, {"COLUMNS=1000"}).out;
    const std::string page = Tool({"--man"}).out;
    const std::string documentation = ReadFile(KX_TOOL_DOCUMENTATION);
    std::istringstream lines(help.substr(help.find("Exit status:\n") + 13));
    int count = 0;
    for (std::string line; std::getline(lines, line) && !line.empty(); ++count)
    {
        const std::string status = line.substr(2, 1);
        const std::string meaning = line.substr(5);
        EXPECT_THAT(page, HasSubstr("\\fB" + status + "\\fR\n" + meaning.substr(0, 10)));
        EXPECT_THAT(documentation, HasSubstr("| " + status + "      | " + meaning));
    }
    EXPECT_EQ(6, count);
}

TEST_F(KxconfigUsage, ADiffShowsNoControlCharactersToATerminal)
{
    if (!HasTerminals())
    {
        GTEST_SKIP() << "no terminals here";
    }
    const std::string file = m_folder.Write("c1.xml", "<cfg>\n\t<a>\xC2\x9B"
                                                      "1m</a></cfg>");
    const Outcome piped =
        ToolProcess({"set", "--dry-run", "--quiet", "--diff", file, "cfg.a", "x"});
    EXPECT_THAT(piped.out, HasSubstr("\n-\t<a>\xC2\x9B"
                                     "1m</a></cfg>\n"));
    const std::string arguments = "set --dry-run --quiet --diff " + InShell(file) + " cfg.a x";
    EXPECT_THAT(OnTerminal(arguments, {"TERM=dumb"}), HasSubstr("\n-\t<a>\\xc2\\x9b1m</a></cfg>"));
}

TEST_F(KxconfigUsage, ColoursAreForTerminals)
{
    if (!HasTerminals())
    {
        GTEST_SKIP() << "needs a terminal, and this machine gives out none";
    }
    const std::string arguments = "explain " + m_plain + " cfg.net.ip";
    const std::string green = "\x1B[32maccepted\x1B[0m";
    EXPECT_THAT(OnTerminal(arguments, {"TERM=xterm", "NO_COLOR="}), HasSubstr(green));
    EXPECT_THAT(OnTerminal(arguments, {"TERM=xterm", "NO_COLOR=1"}), Not(HasSubstr("\x1B")));
    EXPECT_THAT(OnTerminal(arguments, {"TERM=dumb"}), Not(HasSubstr("\x1B")));
    EXPECT_THAT(OnTerminal("--json " + arguments, {"TERM=xterm"}), Not(HasSubstr("\x1B")));
    EXPECT_THAT(ToolProcess({"explain", m_plain, "cfg.net.ip"}, {"TERM=xterm"}).out,
                Not(HasSubstr("\x1B")));
}

TEST_F(KxconfigUsage, ProgressIsShownOnATerminalUntilThereIsAResult)
{
    if (!HasTerminals())
    {
        GTEST_SKIP() << "needs a terminal, and this machine gives out none";
    }
    // The signal of the clock comes from here: as soon as the pipe has a reader, kxconfig works.
    const std::string pipe = InShell(m_folder.Path("pipe"));
    const std::string script = "mkfifo " + pipe + "; " + InShell(KX_CONFIG_TOOL) + " get " + pipe +
                               " a.b & exec 3>" + pipe +
                               "; kill -ALRM $!; echo '<a><b>1</b></a>' >&3; exec 3>&-; wait $!";
    const std::string shown = ScriptOnTerminal(script, {"TERM=xterm"});
    const size_t progress = shown.find("\r\x1B[Kkxconfig: working... ");
    const size_t cleared = shown.find("s\r\x1B[K1\r\n");
    EXPECT_NE(std::string::npos, progress) << shown;
    EXPECT_NE(std::string::npos, cleared) << shown;
    EXPECT_LT(progress, cleared);
    const std::string get = "get " + m_plain + " cfg.net.ip";
    EXPECT_THAT(OnTerminal(get, {"TERM=xterm"}), Not(HasSubstr("working")));
}

TEST_F(KxconfigUsage, TraceShowsTheLibrarysRecordsBesideTheResult)
{
    const Outcome outcome = ToolProcess({"--trace", "get", kGateway, "gateway.name"});
    EXPECT_EQ("line-3-gateway\n", outcome.out);
    EXPECT_THAT(outcome.err, HasSubstr(" trace GetValue:"));
    EXPECT_THAT(outcome.err, HasSubstr(" Key is gateway.name\n"));
    EXPECT_EQ(2, Tool({"--trace", "--log-mask", "error", "get", kGateway, "a.b"}).status);
}

TEST_F(KxconfigUsage, TraceShowsTheLibrarysLoadOfCommandsThatListKeys)
{
    for (const std::vector<std::string>& command :
         std::vector<std::vector<std::string>>{{"keys", kGateway}, {"diff", kGateway, kGateway}})
    {
        const Outcome silent = ToolProcess(command);
        std::vector<std::string> arguments = {"--trace"};
        arguments.insert(arguments.end(), command.begin(), command.end());
        const Outcome outcome = ToolProcess(arguments);
        EXPECT_EQ("", silent.err);
        EXPECT_EQ(silent.out, outcome.out);
        EXPECT_THAT(outcome.err, HasSubstr(" trace CXMLReader:"));
        EXPECT_THAT(outcome.err, HasSubstr(" trace ~CXMLReader:"));
    }
}

TEST_F(KxconfigUsage, FlagsTakeNoValue)
{
    for (const std::string flag :
         {"--json=true", "--json=no", "--json=", "--trace=false", "--help=no", "--version=1"})
    {
        const std::string name = flag.substr(0, flag.find('='));
        ExpectComplaint(Tool({flag, "get", m_plain, "cfg.net.ip"}), 2,
                        name + " takes no value (kxconfig --help shows the usage)");
    }
    const std::string before = ReadFile(m_plain);
    EXPECT_EQ(2, Tool({"set", "--dry-run=no", m_plain, "cfg.net.ip", "x"}).status);
    EXPECT_EQ(2, Tool({"explain", "--set=no", m_plain, "cfg.net.ip"}).status);
    EXPECT_EQ(before, ReadFile(m_plain));
}

TEST_F(KxconfigUsage, ValueMayLookLikeAFlagWithOne)
{
    EXPECT_EQ(0, Tool({"set", "--dry-run", m_plain, "cfg.ip", "--", "--json=true"}).status);
}

TEST_F(KxconfigUsage, OnlyCommandsThatReadTakeStandardInput)
{
    const std::string message = "FILE: \"-\" is not a file name (kxconfig --help shows the usage)";
    ExpectComplaint(Tool({"set", "-", "a.b", "c"}), 2, message);
    ExpectComplaint(Tool({"add", "-", "/a", "b"}), 2, message);
    ExpectComplaint(Tool({"remove", "-", "/a/b"}), 2, message);
    const std::string xml = "<a><b>1</b><b><![CDATA[2]]></b></a>";
    for (const std::vector<std::string>& command : {std::vector<std::string>{"get", "-", "a.b"},
                                                    {"keys", "-"},
                                                    {"explain", "-", "a.b"},
                                                    {"find", "-", "//b"},
                                                    {"check", "--notes", "-"},
                                                    {"check", "-", "a.b"}})
    {
        std::vector<std::string> named = command;
        *std::find(named.begin(), named.end(), "-") = m_folder.Write("in.xml", xml);
        const Outcome expected = Tool(named);
        const Outcome outcome = ToolWithInput(command, xml);
        EXPECT_EQ(expected.status, outcome.status) << command[0];
        EXPECT_THAT(outcome.out, testing::Not(testing::IsEmpty())) << command[0];
    }
}

TEST_F(KxconfigUsage, CheckOfStandardInputReportsWhatIsInIt)
{
    const std::string xml = "<a>\n<b><![CDATA[2]]></b></a>";
    EXPECT_THAT(ToolWithInput({"check", "-"}, xml).out, testing::StartsWith("-:2: warning: "));
}

TEST_F(KxconfigUsage, ColorsAreChosen)
{
    const std::vector<std::string> explain = {"explain", m_plain, "cfg.net.ip"};
    const auto colored = [&](const std::string& when, const std::string& variable)
    {
        std::vector<std::string> arguments = {"--color=" + when};
        arguments.insert(arguments.end(), explain.begin(), explain.end());
        const Outcome outcome = Tool(arguments, {"TERM=xterm", variable});
        EXPECT_EQ(0, outcome.status);
        return outcome.out.find("\x1B[32maccepted\x1B[0m") != std::string::npos;
    };
    EXPECT_TRUE(colored("always", "NO_COLOR="));
    EXPECT_TRUE(colored("always", "NO_COLOR=1"));
    EXPECT_FALSE(colored("never", "NO_COLOR="));
    EXPECT_FALSE(colored("auto", "NO_COLOR=")); // no terminal
    ExpectComplaint(
        Tool({"--color", "red", "keys", m_plain}), 2,
        "--color: \"red\" is not auto, always or never (kxconfig --help shows the usage)");
}

TEST_F(KxconfigUsage, VersionNamesTheRunningEngine)
{
    const long number = std::stol(xmlParserVersion);
    const std::string engine = std::to_string(number / 10000) + "." +
                               std::to_string(number / 100 % 100) + "." +
                               std::to_string(number % 100);
    EXPECT_EQ("kxconfig " KX_VERSION "\nlibxml2 " + engine + "\n", Tool({"--version"}).out);
}

TEST_F(KxconfigUsage, HelpOfACommandShowsItsOwnOptionsAndExamples)
{
    const std::string help = Tool({"find", "--help"}).out;
    EXPECT_THAT(help, testing::StartsWith("usage: kxconfig find [options] FILE XPATH\n"));
    EXPECT_THAT(help, HasSubstr("\n  XPATH     an XPath 1.0 expression\n"));
    EXPECT_THAT(help, HasSubstr("kxconfig find device.xml '//net[@id]'"));
    EXPECT_THAT(help, Not(HasSubstr("--log-mask")));
    EXPECT_THAT(help, Not(HasSubstr("kxconfig get")));
    EXPECT_EQ(help, Tool({"--help", "find"}).out);
}

TEST_F(KxconfigUsage, HelpIsWrapped)
{
    const auto longest = [](const std::string& text)
    {
        size_t length = 0;
        std::istringstream lines(text);
        for (std::string line; std::getline(lines, line);)
        {
            length = std::max(length, line.size());
        }
        return length;
    };
    EXPECT_LE(longest(Tool({"--help"}, {"COLUMNS=80"}).out), 80u);
    EXPECT_LE(longest(Tool({"set", "--help"}, {"COLUMNS=60"}).out), 60u);
    EXPECT_GT(longest(Tool({"--help"}, {"COLUMNS=120"}).out), 80u);
    EXPECT_LE(longest(ToolProcess({"--help"}, {"COLUMNS="}).out), 80u);
}

TEST_F(KxconfigUsage, BadArgumentsAreAnsweredWithWhatToType)
{
    const std::string see = " (kxconfig --help shows the usage)";
    ExpectComplaint(Tool({"set", m_plain, "cfg.net.ip", "-a b"}), 2,
                    "\"-a b\" is not an option; for an argument that starts with a dash, use --: "
                    "kxconfig set " +
                        m_plain + " cfg.net.ip -- '-a b'" + see);
    ExpectComplaint(Tool({"keys", "--foo", m_plain}), 2,
                    "unknown option \"--foo\"; kxconfig keys --help lists the options" + see);
    ExpectComplaint(
        Tool({"find", m_plain, "//a", "b"}), 2,
        "surplus argument \"b\"; usage: kxconfig find [options] FILE XPATH; an argument "
        "with spaces needs quotes" +
            see);
}

TEST_F(KxconfigUsage, EachCommandDescribesASurplusArgument)
{
    const std::map<std::string, std::vector<std::string>> whole = {
        {"get", {}}, // takes any number
        {"set", {}},
        {"check", {}},
        {"add", {"/cfg", "a", "b"}},
        {"remove", {"/cfg/net"}},
        {"explain", {"--set", "cfg.net.ip", "v"}},
        {"keys", {"cfg"}},
        {"find", {"/cfg"}},
        {"diff", {m_plain}}};
    for (const std::string& verb : m_verbs)
    {
        std::vector<std::string> words = {verb, m_plain};
        words.insert(words.end(), whole.at(verb).begin(), whole.at(verb).end());
        if (!whole.at(verb).empty())
        {
            std::vector<std::string> more = words;
            more.emplace_back("surplus");
            EXPECT_THAT(Tool(more).err, HasSubstr("surplus argument \"surplus\"; usage: kxconfig " +
                                                  verb + " [options] FILE "));
        }
        words.emplace_back("--unknown");
        const Outcome outcome = Tool(words);
        EXPECT_EQ(2, outcome.status) << verb;
        EXPECT_THAT(outcome.err, AnyOf(HasSubstr("unknown option \"--unknown\"; kxconfig " + verb +
                                                 " --help lists the options"),
                                       HasSubstr(" -- --unknown (kxconfig --help")));
    }
}

TEST_F(KxconfigUsage, ExplainIgnoresTheValueOfAnUpdate)
{
    const Outcome without = Tool({"explain", "--set", m_plain, "cfg.net.ip"});
    EXPECT_EQ(0, without.status);
    EXPECT_EQ("", without.err);
    const Outcome with = Tool({"explain", "--set", m_plain, "cfg.net.ip", "a&"});
    EXPECT_EQ(0, with.status);
    EXPECT_EQ(without.out, with.out);
    EXPECT_EQ("kxconfig: note: \"a&\" is ignored: an update reaches the same elements with any "
              "value\n",
              with.err);
    ExpectComplaint(Tool({"explain", m_plain, "cfg.net.ip", "x"}), 2,
                    "VALUE requires --set (kxconfig --help shows the usage)");
}

TEST_F(KxconfigUsage, ManPageHasTheSectionsOfAManPage)
{
    const std::string page = Tool({"--man"}).out;
    for (const std::string section :
         {"ENVIRONMENT", "FILES", "EXIT STATUS", "SEE ALSO", "EXAMPLES", "OPTIONS"})
    {
        EXPECT_THAT(page, AnyOf(HasSubstr("\n.SH " + section + "\n"),
                                HasSubstr("\n.SH \"" + section + "\"\n")));
    }
    for (const std::string variable : {"KX_LOG_MASK", "NO_COLOR", "TERM", "COLUMNS"})
    {
        EXPECT_THAT(page, HasSubstr("\n\\fB" + variable + "\\fR\n"));
    }
}

TEST_F(KxconfigUsage, ACommandToTypeIsQuotedForTheShell)
{
    ExpectComplaint(Tool({"get", "it's.xml", "-k"}), 2,
                    "\"-k\" is not an option; for an argument that starts with a dash, use --: "
                    "kxconfig get 'it'\\''s.xml' -- -k (kxconfig --help shows the usage)");
    ExpectComplaint(Tool({"get", "", "-k"}), 2,
                    "\"-k\" is not an option; for an argument that starts with a dash, use --: "
                    "kxconfig get '' -- -k (kxconfig --help shows the usage)");
}

TEST_F(KxconfigUsage, HelpIsAsWideAsTheTerminal)
{
    if (!HasTerminals())
    {
        GTEST_SKIP() << "needs a terminal, and this machine gives out none";
    }
    std::istringstream lines(ScriptOnTerminal(
        "stty cols 60; unset COLUMNS; " + InShell(KX_CONFIG_TOOL) + " get --help", {}));
    size_t longest = 0;
    for (std::string line; std::getline(lines, line);)
    {
        longest = std::max(longest, line.find_last_not_of("\r") + 1);
    }
    EXPECT_GT(longest, 50u);
    EXPECT_LE(longest, 60u);
}

TEST_F(KxconfigUsage, AnUnknownTerminalHasNoColors)
{
    if (!HasTerminals())
    {
        GTEST_SKIP() << "needs a terminal, and this machine gives out none";
    }
    const std::string explain = InShell(KX_CONFIG_TOOL) + " explain " + m_plain + " cfg.net.ip";
    EXPECT_THAT(ScriptOnTerminal("unset TERM NO_COLOR; " + explain, {}), Not(HasSubstr("\x1B")));
    EXPECT_THAT(ScriptOnTerminal("unset NO_COLOR; TERM=xterm " + explain, {}),
                HasSubstr("\x1B[32maccepted"));
}
