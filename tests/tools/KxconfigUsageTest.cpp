#include "ToolTest.h"

#include <fcntl.h>
#include <stdlib.h>
#include <unistd.h>

#include <algorithm>
#include <set>
#include <sstream>

using namespace kxtest;
using testing::HasSubstr;
using testing::Not;

namespace
{

const std::string kGateway = KX_EXAMPLE_DATA "/gateway.xml";
const std::set<std::string> kVerbs = {"check", "explain", "find", "get", "keys", "set"};

class KxconfigUsage : public ToolTest
{
protected:
    const std::string m_plain = m_folder.Write(
        "plain.xml", "<cfg><net id='1'><ip>a</ip></net><net id='2'><ip>b</ip></net></cfg>");

    /** @return what bash offers when somebody types @p line and then the tab key. */
    static std::set<std::string> Completions(const std::string& line)
    {
        const std::string script = "set -u; kxconfig() { " + InShell(KX_CONFIG_TOOL) +
                                   " \"$@\"; }; . \"$1\"; COMP_LINE=$2; COMP_POINT=${#2}; "
                                   "_kxconfig; printf '%s\\n' \"${COMPREPLY[@]}\"";
        const Outcome outcome =
            RunProgram({"/bin/bash", "-c", script, "bash", KX_COMPLETION, line});
        EXPECT_EQ("", outcome.err) << line;
        std::istringstream words(outcome.out);
        std::set<std::string> offered;
        for (std::string word; std::getline(words, word);)
        {
            offered.insert(word);
        }
        offered.erase("");
        return offered;
    }

    /** Runs a command with a terminal for its output. */
    static std::string OnTerminal(const std::string& arguments,
                                  const std::vector<std::string>& environment)
    {
        const std::string command = InShell(KX_CONFIG_TOOL) + " " + arguments;
        return RunProgram({"/usr/bin/script", "-qec", command, "/dev/null"}, environment).out;
    }
};

/** @return the words that --help lists as options ("--word"). */
std::set<std::string> OptionsOf(const std::string& help)
{
    std::set<std::string> options;
    std::istringstream lines(help.substr(0, help.find("Examples:")));
    for (std::string line; std::getline(lines, line);)
    {
        const auto at = line.find("--");
        if (line.compare(0, 3, "  -") == 0 && at != std::string::npos)
        {
            options.insert(line.substr(at, line.find_first_of(" ,", at) - at));
        }
    }
    return options;
}

} // namespace

TEST_F(KxconfigUsage, CompletionOffersTheCommandsThatHelpLists)
{
    EXPECT_EQ(kVerbs, Completions("kxconfig "));
    EXPECT_EQ(std::set<std::string>{"explain"}, Completions("kxconfig --json e"));
    const std::string help = Tool({"--help"}).out;
    for (const std::string& verb : kVerbs)
    {
        EXPECT_THAT(help, HasSubstr("\n  " + verb + " "));
    }
}

TEST_F(KxconfigUsage, CompletionOffersTheOptionsThatHelpLists)
{
    std::set<std::string> general = OptionsOf(Tool({"--help"}).out);
    EXPECT_EQ(general, Completions("kxconfig -"));
    general.erase("--version");
    for (const std::string& verb : kVerbs)
    {
        std::set<std::string> options = OptionsOf(Tool({verb, "--help"}).out);
        options.insert(general.begin(), general.end());
        EXPECT_EQ(options, Completions("kxconfig " + verb + " --"));
    }
}

TEST_F(KxconfigUsage, CompletionOffersTheFilesKeys)
{
    const std::set<std::string> both = {"cfg.net@id=1.ip", "cfg.net@id=2.ip"};
    for (const std::string verb : {"get", "set", "explain", "check", "--log-mask error get"})
    {
        EXPECT_EQ(both, Completions("kxconfig " + verb + " " + m_plain + " ")) << verb;
    }
    // What bash takes for a word of its own is not repeated.
    EXPECT_EQ(std::set<std::string>{"2.ip"},
              Completions("kxconfig get " + m_plain + " cfg.net@id=2"));
    EXPECT_EQ(std::set<std::string>{}, Completions("kxconfig get /missing.xml c"));
    EXPECT_EQ(std::set<std::string>{}, Completions("kxconfig find " + m_plain + " c"));
}

TEST_F(KxconfigUsage, CompletionOffersFilesAndLevels)
{
    EXPECT_EQ(std::set<std::string>{m_plain},
              Completions("kxconfig get " + m_plain.substr(0, m_plain.size() - 2)));
    EXPECT_EQ(std::set<std::string>{m_plain},
              Completions("kxconfig set --output " + m_plain.substr(0, m_plain.size() - 2)));
    EXPECT_EQ((std::set<std::string>{"trace"}), Completions("kxconfig --log-mask t"));
}

TEST_F(KxconfigUsage, ManPageTellsAllThatHelpLists)
{
    const Outcome page =
        RunShell(InShell(KX_CONFIG_TOOL) + " --man | LC_ALL=C groff -man -Tascii -ww -P -cbou");
    EXPECT_EQ("", page.err);
    for (const std::string& verb : kVerbs)
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
    EXPECT_EQ(5, count);
}

TEST_F(KxconfigUsage, ColoursAreForTerminals)
{
    const int terminal = posix_openpt(O_RDWR | O_NOCTTY);
    if (terminal < 0)
    {
        GTEST_SKIP() << "needs a terminal, and this machine gives out none";
    }
    close(terminal);
    const std::string arguments = "explain " + m_plain + " cfg.net.ip";
    const std::string green = "\x1B[32maccepted\x1B[0m";
    EXPECT_THAT(OnTerminal(arguments, {"TERM=xterm", "NO_COLOR="}), HasSubstr(green));
    EXPECT_THAT(OnTerminal(arguments, {"TERM=xterm", "NO_COLOR=1"}), Not(HasSubstr("\x1B")));
    EXPECT_THAT(OnTerminal(arguments, {"TERM=dumb"}), Not(HasSubstr("\x1B")));
    EXPECT_THAT(OnTerminal("--json " + arguments, {"TERM=xterm"}), Not(HasSubstr("\x1B")));
    EXPECT_THAT(Tool({"explain", m_plain, "cfg.net.ip"}, {"TERM=xterm"}).out,
                Not(HasSubstr("\x1B")));
}

TEST_F(KxconfigUsage, TraceShowsTheLibrarysRecordsBesideTheResult)
{
    const Outcome outcome = Tool({"--trace", "get", kGateway, "gateway.name"});
    EXPECT_EQ("line-3-gateway\n", outcome.out);
    EXPECT_THAT(outcome.err, HasSubstr(" trace GetValue:"));
    EXPECT_THAT(outcome.err, HasSubstr(" Key is gateway.name\n"));
    EXPECT_EQ(2, Tool({"--trace", "--log-mask", "error", "get", kGateway, "a.b"}).status);
}

TEST_F(KxconfigUsage, EveryVerbRefusesStandardInput)
{
    for (const std::string& verb : kVerbs)
    {
        ExpectComplaint(Tool({verb, "-", "a.b", "c"}), 2,
                        "FILE: \"-\" is no file; name one (kxconfig --help shows the usage)");
    }
}
