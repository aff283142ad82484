#include "output/Terminal.h"

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <iostream>

#include <sys/ioctl.h>
#include <unistd.h>

namespace
{

const long kDefaultWidth = 80;
const long kNarrowest = 40; // below that, a description has no place beside its option
const long kWidest = 1000;

/** @return 0 if COLUMNS states no width. */
long WidthFromEnvironment()
{
    const char* const columns = std::getenv("COLUMNS");
    return columns == nullptr ? 0 : std::strtol(columns, nullptr, 10);
}

/** @return 0 if standard output is no terminal, or one that does not know its width. */
long WidthOfTerminal()
{
    winsize size = {};
    return ioctl(STDOUT_FILENO, TIOCGWINSZ, &size) == 0 ? size.ws_col : 0;
}

} // namespace

bool IsTerminal(const std::ostream& stream)
{
    return (stream.rdbuf() == std::cout.rdbuf() && isatty(STDOUT_FILENO) == 1) ||
           (stream.rdbuf() == std::cerr.rdbuf() && isatty(STDERR_FILENO) == 1);
}

bool IsDumbTerminal()
{
    const char* const terminal = std::getenv("TERM");
    return terminal == nullptr || std::strcmp(terminal, "dumb") == 0;
}

size_t OutputWidth()
{
    long width = WidthFromEnvironment();
    width = width > 0 ? width : WidthOfTerminal();
    width = width > 0 ? width : kDefaultWidth;
    return static_cast<size_t>(std::clamp(width, kNarrowest, kWidest));
}
