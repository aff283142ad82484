#ifndef KX_TOOLS_SET_H
#define KX_TOOLS_SET_H

#include "commands/Edit.h"
#include "output/ExitStatus.h"

#include <iosfwd>
#include <string>
#include <vector>

struct SetArguments
{
    std::string file;
    std::string key;
    std::vector<std::string> values; ///< VALUE, and then KEY VALUE for each other key
    std::string valueFile;           ///< has the value, if there is none; "-": standard input
    std::istream* input = nullptr;   ///< standard input
    bool create = false;             ///< make elements that are not there
    bool byNode = false;             ///< the keys are XPath expressions
    bool all = false;                ///< these may select more than one node
    SaveArguments saving;
};

/** kxconfig set: replaces text by key, prints each element that changed, and saves. */
ExitStatus Set(const SetArguments& arguments, Report& report);

#endif
