#ifndef KX_TOOLS_CHECK_H
#define KX_TOOLS_CHECK_H

#include "checks/Kinds.h"
#include "output/ExitStatus.h"

#include <iosfwd>
#include <string>
#include <vector>

class Report;

struct CheckArguments
{
    std::string file;
    std::istream* input = nullptr; ///< what the file "-" stands for
    std::vector<std::string> keys; ///< if empty, the whole file is checked
    Selection selection;
};

/** kxconfig check: reports pitfalls for lookups and updates. */
ExitStatus Check(const CheckArguments& arguments, Report& report);

#endif
