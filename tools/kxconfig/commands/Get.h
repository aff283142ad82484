#ifndef KX_TOOLS_GET_H
#define KX_TOOLS_GET_H

#include "output/ExitStatus.h"

#include <iosfwd>
#include <optional>
#include <string>
#include <vector>

class Report;

struct GetArguments
{
    std::string file;
    std::istream* input = nullptr; ///< what the file "-" stands for
    std::vector<std::string> keys;
    std::optional<std::string> defaultValue; ///< of a key that gives nothing
    bool endWithNul = false;                 ///< end each value with NUL, not with a line end
};

/** kxconfig get: prints the value or values under keys, one on a line. */
ExitStatus Get(const GetArguments& arguments, Report& report);

#endif
