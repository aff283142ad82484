#ifndef KX_TESTS_TOOLS_TOOLTEST_H
#define KX_TESTS_TOOLS_TOOLTEST_H

#include "cli/Run.h"

#include "Environment.h"
#include "support/Files.h"
#include "support/Program.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <set>
#include <sstream>

#include <fcntl.h>
#include <stdlib.h>
#include <unistd.h>

/** An example of a device's configuration. */
inline const std::string kGateway = KX_EXAMPLE_DATA "/gateway.xml";

/** What each saved file begins with. */
inline const std::string kDeclaration = "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n";

/** Runs kxconfig. */
class ToolTest : public testing::Test
{
protected:
    /** Runs it in this process, where the library's log records are not printed. */
    static kxtest::Outcome Tool(const std::vector<std::string>& arguments,
                                const std::vector<std::string>& environment = {})
    {
        const kxtest::Environment changed(environment);
        return ToolWithInput(arguments, "");
    }

    /** The same with @p input as standard input. */
    static kxtest::Outcome ToolWithInput(const std::vector<std::string>& arguments,
                                         const std::string& input)
    {
        std::istringstream in(input);
        std::ostringstream out;
        std::ostringstream err;
        const int status = ::Run(arguments, in, out, err);
        return {status, out.str(), err.str()};
    }

    /** Runs the program as a user would. */
    static kxtest::Outcome ToolProcess(const std::vector<std::string>& arguments,
                                       const std::vector<std::string>& environment = {})
    {
        std::vector<std::string> command = {KX_CONFIG_TOOL};
        command.insert(command.end(), arguments.begin(), arguments.end());
        return kxtest::RunProgram(command, environment);
    }

    /** Expects nothing on standard output and one line on standard error. */
    static void ExpectComplaint(const kxtest::Outcome& outcome, int status,
                                const std::string& message)
    {
        EXPECT_EQ(status, outcome.status);
        EXPECT_EQ("", outcome.out);
        EXPECT_EQ("kxconfig: " + message + "\n", outcome.err);
    }

    /** @return the words that @p help lists as options ("--word"). */
    static std::set<std::string> OptionsOf(const std::string& help)
    {
        std::set<std::string> options;
        std::istringstream lines(help.substr(0, help.find("Examples:")));
        for (std::string line; std::getline(lines, line);)
        {
            const auto at = line.find("--");
            if (line.compare(0, 3, "  -") == 0 && at != std::string::npos)
            {
                options.insert(line.substr(at, line.find_first_of(" ,[", at) - at));
            }
        }
        return options;
    }

    /** @return whether programs can be given a terminal here. */
    static bool HasTerminals()
    {
        const int terminal = posix_openpt(O_RDWR | O_NOCTTY);
        close(terminal);
        return terminal >= 0;
    }

    const std::set<std::string> m_verbs = {"add", "check", "diff",   "explain", "find",
                                           "get", "keys",  "remove", "set"};
    kxtest::TemporaryFolder m_folder;
};

#endif
