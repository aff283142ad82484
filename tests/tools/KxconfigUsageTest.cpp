#include "ToolTest.h"

#include <sstream>

using namespace kxtest;
using testing::HasSubstr;
using testing::Not;

namespace
{

const std::string kGateway = KX_EXAMPLE_DATA "/gateway.xml";

class KxconfigUsage : public ToolTest
{
protected:
    const std::string m_plain = m_folder.Write(
        "plain.xml", "<cfg><net id='1'><ip>a</ip></net><net id='2'><ip>b</ip></net></cfg>");

    /** Runs a command with a terminal for its output. */
    static std::string OnTerminal(const std::string& arguments,
                                  const std::vector<std::string>& environment)
    {
        const std::string command = InShell(KX_CONFIG_TOOL) + " " + arguments;
        return RunProgram({"/usr/bin/script", "-qec", command, "/dev/null"}, environment).out;
    }
};

} // namespace

TEST_F(KxconfigUsage, ManPageTellsAllThatHelpLists)
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

TEST_F(KxconfigUsage, ExitStatusesAreToldAlikeByHelpManPageAndDocumentation)
{
    const std::string help = Tool({"--help"}).out;
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

TEST_F(KxconfigUsage, TraceShowsTheLibrarysRecordsBesideTheResult)
{
    const Outcome outcome = ToolProcess({"--trace", "get", kGateway, "gateway.name"});
    EXPECT_EQ("line-3-gateway\n", outcome.out);
    EXPECT_THAT(outcome.err, HasSubstr(" trace GetValue:"));
    EXPECT_THAT(outcome.err, HasSubstr(" Key is gateway.name\n"));
    EXPECT_EQ(2, Tool({"--trace", "--log-mask", "error", "get", kGateway, "a.b"}).status);
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
    ExpectComplaint(Tool({"check", "-"}), 2, message);
}
