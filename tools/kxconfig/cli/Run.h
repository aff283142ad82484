#ifndef KX_TOOLS_RUN_H
#define KX_TOOLS_RUN_H

#include <iosfwd>
#include <string>
#include <vector>

/**
 * Runs kxconfig. The engine's settings, the log mask and the handlers of signals are afterwards
 * what they were before; it is for one thread at a time.
 *
 * @param arguments  those after the program's name.
 * @param input      standard input: the file "-" of commands that only read, and --value-from -.
 * @return the exit status.
 */
int Run(const std::vector<std::string>& arguments, std::istream& input, std::ostream& output,
        std::ostream& errors);

#endif
