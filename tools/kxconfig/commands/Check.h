#ifndef KX_TOOLS_CHECK_H
#define KX_TOOLS_CHECK_H

#include "output/ExitStatus.h"

#include <string>
#include <vector>

class Report;

struct CheckArguments
{
    std::string file;
    std::vector<std::string> keys; ///< empty: those that the file itself suggests
};

/** kxconfig check: reports pitfalls for lookups. */
ExitStatus Check(const CheckArguments& arguments, Report& report);

#endif
