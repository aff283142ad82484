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
    std::string output;          ///< where to save; empty: over the file; "-": standard output
    bool dryRun = false;         ///< show what would change, and save nothing
    bool dropAttributes = false; ///< save even if the file cannot keep all of its attributes
    int waitSeconds = 10;        ///< for the file's lock
};

/** kxconfig set: replaces text by key, prints each element that changed, and saves. */
ExitStatus Set(const SetArguments& arguments, Report& report);

#endif
