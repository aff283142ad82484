// For every command: each request for memory that it makes, and each that the engine makes for it,
// fails in turn. The status is the documented one, nothing leaks, and the file is the old one or
// the new one.

#include "cli/Run.h"

#include "output/Report.h"
#include "support/Files.h"
#include "support/Memory.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <cstdlib>
#include <exception>
#include <sstream>

#include <sys/wait.h>
#include <unistd.h>

using kxtest::EngineMemory;
using kxtest::NewCounter;

namespace
{

const char* const kXml =
    "<!DOCTYPE cfg [<!ENTITY e \"v\"><!ATTLIST net d CDATA \"1\">]>\n"
    "<cfg xmlns:p=\"urn:p\">\n"
    "  <net id=\"a-value-that-needs-memory\" p:n=\"&e;\"><ip>10.0.0.1</ip></net>\n"
    "  <net id=\"2\"><ip>10.0.0.2</ip><!--c--></net>\n"
    "  <t>&e;</t>\n"
    "</cfg>\n";
const char* const kKey = "cfg.net@id=a-value-that-needs-memory.ip";

struct Command
{
    const char* name;
    std::vector<std::string> arguments; ///< "FILE" stands for the file
};

std::ostream& operator<<(std::ostream& out, const Command& command)
{
    return out << command.name;
}

/** A run, and the file after it. */
struct Result
{
    int status;
    std::string out;
    std::string err;
    std::string file;
};

} // namespace

class KxconfigMemoryFault : public testing::TestWithParam<Command>
{
protected:
    /** Runs the command while Memory fails the given request. */
    template <class Memory>
    Result RunWhile(std::size_t failing)
    {
        kxtest::WriteFile(m_file, kXml);
        const std::vector<std::string> arguments = Arguments(m_file);
        std::istringstream in;
        std::ostringstream out;
        std::ostringstream err;
        Memory::FailAt(failing);
        const int status = ::Run(arguments, in, out, err);
        m_failed = Memory::Failed();
        Memory::FailAt(0);
        return {status, out.str(), err.str(), kxtest::ReadFile(m_file)};
    }

    /** Makes requests fail from the @p first on, until the command makes no more. */
    template <class Memory>
    void FailEach(std::size_t first)
    {
        const Result expected = RunWhile<Memory>(0);
        std::size_t n = first;
        do
        {
            const EngineMemory engine;
            ExpectDocumented(RunWhile<Memory>(n), expected, n);
            EXPECT_EQ(0, engine.Live()) << "at " << n;
            ++n;
        } while (m_failed);
        EXPECT_LT(first + 10, n);
    }

    /** @return the number of a request shortly before the command's own: those before are of the
     * parser of arguments, and of all commands only one lets them fail. */
    std::size_t FirstOfCommand()
    {
        const std::size_t last = 30; // of a run without a file
        const NewCounter ours;
        std::istringstream in;
        std::ostringstream out;
        ::Run(Arguments(m_folder.Path("missing.xml")), in, out, out);
        return GetParam().name == std::string("get") ? 1 : ours.Requests() - last;
    }

    kxtest::TemporaryFolder m_folder;
    const std::string m_file = m_folder.Write("cfg.xml", kXml);

private:
    static std::vector<std::string> Arguments(const std::string& file)
    {
        std::vector<std::string> arguments = GetParam().arguments;
        std::replace(arguments.begin(), arguments.end(), std::string("FILE"), file);
        return arguments;
    }

    static void ExpectDocumented(const Result& result, const Result& expected, std::size_t n)
    {
        if (result.status == expected.status)
        {
            EXPECT_EQ(expected.out, result.out) << "at " << n;
            EXPECT_EQ(expected.file, result.file) << "at " << n;
            return; // done without it
        }
        const int outOfMemory = 4;
        const int savedNotReported = 5;
        EXPECT_EQ(result.file == kXml ? outOfMemory : savedNotReported, result.status)
            << "at " << n << ": " << result.err;
        EXPECT_TRUE(result.file == kXml || result.file == expected.file) << result.file;
        // The streams that stand for the terminal need memory, too.
        EXPECT_THAT(result.err + result.out,
                    testing::AnyOf(testing::HasSubstr("out of memory"),
                                   testing::HasSubstr("cannot write to standard output")))
            << "at " << n;
    }

    bool m_failed = false;
};

TEST_P(KxconfigMemoryFault, EndsWithItsStatusIfTheClientGetsNone)
{
    FailEach<NewCounter>(FirstOfCommand());
}

INSTANTIATE_TEST_SUITE_P(
    Commands, KxconfigMemoryFault,
    testing::Values(
        Command{"get", {"get", "FILE", kKey}},
        Command{"set", {"set", "FILE", kKey, "a new value that needs memory", "--backup"}},
        Command{"setCreate", {"set", "--create", "FILE", "cfg.new.path", "value", "--diff"}},
        Command{"setNode", {"set", "--node", "--all", "FILE", "//@id", "a &e; that needs memory"}},
        Command{"add", {"add", "FILE", "/cfg/net[1]", "name", "a text that needs memory"}},
        Command{"addAttribute", {"add", "--attribute", "FILE", "/cfg", "a", "a text of some size"}},
        Command{"remove", {"remove", "FILE", "//net[2]"}}, Command{"keys", {"keys", "FILE"}},
        Command{"explain", {"explain", "FILE", kKey}},
        Command{"explainSet", {"explain", "--set", "FILE", kKey}},
        Command{"check", {"check", "--notes", "FILE"}},
        Command{"checkKey", {"check", "FILE", kKey, "cfg.net.none"}},
        Command{"diff", {"diff", "FILE", "FILE"}},
        Command{"find", {"find", "FILE", "//ip[.='10.0.0.1']|//@*|//t"}},
        Command{"findValue", {"find", "FILE", "concat(name(//ip), 'and', //net/@id)"}}),
    [](const testing::TestParamInfo<Command>& command) { return command.param.name; });

// The engine's evaluation of XPath may end the process, so no command that uses it is here.
using KxconfigEngineMemoryFault = KxconfigMemoryFault;

TEST_P(KxconfigEngineMemoryFault, EndsWithItsStatusIfTheEngineGetsNone)
{
    FailEach<EngineMemory>(1);
}

INSTANTIATE_TEST_SUITE_P(
    Commands, KxconfigEngineMemoryFault,
    testing::Values(Command{"get", {"get", "FILE", kKey, "cfg.net.ip", "--json"}},
                    Command{"set", {"set", "FILE", kKey, "a new value that needs memory"}},
                    Command{"setDiff", {"set", "FILE", kKey, "<", "--json", "--diff", "--backup"}},
                    Command{"setCreate", {"set", "--create", "FILE", "cfg.new.path", "value"}},
                    Command{"keys", {"keys", "FILE"}},
                    Command{"explain", {"explain", "FILE", kKey}},
                    Command{"explainSet", {"explain", "--set", "FILE", kKey}},
                    Command{"check", {"check", "--notes", "FILE"}},
                    Command{"checkKey", {"check", "FILE", kKey, "cfg.net.none"}},
                    Command{"diff", {"diff", "FILE", "FILE", "--json"}}),
    [](const testing::TestParamInfo<Command>& command) { return command.param.name; });

// The destructors of the JSON library need memory, and so end the process if there is none.
class KxconfigMemoryFaultInJson : public KxconfigMemoryFault
{
protected:
    /** @return the exit status of a process that runs the command while the request fails. */
    int StatusWhile(std::size_t failing)
    {
        const pid_t child = fork();
        if (child == 0)
        {
            std::set_terminate(EndTerminated);
            freopen("/dev/null", "w", stderr);
            _exit(RunWhile<NewCounter>(failing).status);
        }
        int status = 0;
        waitpid(child, &status, 0);
        return WIFEXITED(status) ? WEXITSTATUS(status) : -WTERMSIG(status);
    }
};

TEST_P(KxconfigMemoryFaultInJson, EndsWithItsStatusIfTheClientGetsNone)
{
    const NewCounter ours;
    const Result expected = RunWhile<NewCounter>(0);
    const std::size_t requests = ours.Requests();
    for (std::size_t n = FirstOfCommand(); n != requests; ++n)
    {
        const int status = StatusWhile(n);
        const bool isOld = kxtest::ReadFile(m_file) == kXml;
        EXPECT_THAT(status, testing::AnyOf(expected.status, isOld ? 4 : 5)) << "at " << n;
        EXPECT_TRUE(isOld || kxtest::ReadFile(m_file) == expected.file) << "at " << n;
    }
}

INSTANTIATE_TEST_SUITE_P(Commands, KxconfigMemoryFaultInJson,
                         testing::Values(Command{"get", {"get", "FILE", kKey, "--json"}},
                                         Command{"set",
                                                 {"set", "FILE", kKey, "a new value", "--json"}}),
                         [](const testing::TestParamInfo<Command>& command)
                         { return command.param.name; });
