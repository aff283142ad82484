#ifndef KX_TOOLS_USAGE_H
#define KX_TOOLS_USAGE_H

#include <cstddef>
#include <string>

namespace CLI
{
class App;
}

// What --help and the man page contain beyond the list of commands and options, from one source.

/** @return what --help prints for @p command, or for the program if that is null, in lines of at
 * most @p width columns. */
std::string Help(const CLI::App& app, const CLI::App* command, size_t width);

/** @return how the arguments of @p command are written, such as " FILE KEY". */
std::string Arguments(const CLI::App& command);

/** @return the man page of @p app, in the language of man. */
std::string ManPage(const CLI::App& app);

#endif
