#ifndef KX_TOOLS_USAGE_H
#define KX_TOOLS_USAGE_H

#include <string>

namespace CLI
{
class App;
}

// What --help and the man page tell beyond the list of commands and options, from one source.

/** @return what stands at the end of --help. */
std::string HelpFooter();

/** @return the man page of @p app, in the language of man. */
std::string ManPage(const CLI::App& app);

#endif
