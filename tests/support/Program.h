#ifndef KX_TESTS_SUPPORT_PROGRAM_H
#define KX_TESTS_SUPPORT_PROGRAM_H

#include <string>
#include <vector>

namespace kxtest
{

/** What a program left behind. */
struct Outcome
{
    int status;      ///< exit status, or 128 plus the signal that ended it
    std::string out; ///< standard output
    std::string err; ///< standard error
};

/**
 * Runs @p command (program and arguments) with @p environment ("NAME=value") added to the
 * environment, standard input empty, and waits for its end.
 *
 * @param output  the file that takes standard output instead of the outcome; empty for none.
 */
Outcome RunProgram(const std::vector<std::string>& command,
                   const std::vector<std::string>& environment = {},
                   const std::string& output = "");

} // namespace kxtest

#endif
