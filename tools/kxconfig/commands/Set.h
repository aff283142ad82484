#ifndef KX_TOOLS_SET_H
#define KX_TOOLS_SET_H

#include "output/ExitStatus.h"

#include <string>

class Report;

struct SetArguments
{
    std::string file;
    std::string key;
    std::string value;
    std::string output;  ///< where to save; empty: over the file
    bool dryRun = false; ///< show what would change, and save nothing
};

/** kxconfig set: replaces text by key, prints each element that changed, and saves. */
ExitStatus Set(const SetArguments& arguments, Report& report);

#endif
