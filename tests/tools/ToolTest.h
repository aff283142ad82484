#ifndef KX_TESTS_TOOLS_TOOLTEST_H
#define KX_TESTS_TOOLS_TOOLTEST_H

#include "support/Files.h"
#include "support/Program.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

/** Runs kxconfig as a user would. */
class ToolTest : public testing::Test
{
protected:
    static kxtest::Outcome Tool(const std::vector<std::string>& arguments,
                                const std::vector<std::string>& environment = {"KX_LOG_MASK="})
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

    kxtest::TemporaryFolder m_folder;
};

#endif
