#ifndef KX_TOOLS_REMOVE_H
#define KX_TOOLS_REMOVE_H

#include "commands/Edit.h"
#include "output/ExitStatus.h"

#include <string>

struct RemoveArguments
{
    std::string file;
    std::string expression;
    bool all = false; ///< the expression may select more than one node
    SaveArguments saving;
};

/** kxconfig remove: removes nodes with all below them, prints them, and saves. */
ExitStatus Remove(const RemoveArguments& arguments, Report& report);

#endif
