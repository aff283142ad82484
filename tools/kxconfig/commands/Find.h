#ifndef KX_TOOLS_FIND_H
#define KX_TOOLS_FIND_H

#include "output/ExitStatus.h"

#include <iosfwd>
#include <string>

class Report;

struct FindArguments
{
    std::string file;
    std::istream* input = nullptr; ///< what the file "-" stands for
    std::string expression;        ///< XPath 1.0
};

/** kxconfig find: prints each node that an expression selects, or the value that it has. */
ExitStatus Find(const FindArguments& arguments, Report& report);

#endif
