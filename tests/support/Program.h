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
 * Runs @p command, a program of the project's and its arguments, under its emulator if it was built
 * for another machine, with @p environment ("NAME=value") added to the
 * environment but without KX_LOG_MASK, standard input empty, and waits for its end.
 *
 * @param user  unless 0, who runs the program; only the superuser can choose.
 */
Outcome RunProgram(const std::vector<std::string>& command,
                   const std::vector<std::string>& environment = {}, unsigned user = 0);

/** Runs a script of the shell in the same way. */
Outcome RunShell(const std::string& script, const std::vector<std::string>& environment = {});

/** @return how a script of the shell starts @p program, one of the project's. */
std::string InShell(const std::string& program);

} // namespace kxtest

#endif
