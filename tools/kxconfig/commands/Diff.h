#ifndef KX_TOOLS_DIFF_H
#define KX_TOOLS_DIFF_H

#include "output/ExitStatus.h"

#include <iosfwd>
#include <string>

class Report;

struct DiffArguments
{
    std::string file;
    std::istream* input = nullptr; ///< what the file "-" stands for
    std::string other;             ///< the file to compare with
};

/**
 * kxconfig diff: prints the keys that only one of two files has, and those with other values.
 *
 * @return NothingFound if there are differences.
 */
ExitStatus Diff(const DiffArguments& arguments, Report& report);

#endif
