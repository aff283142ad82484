#ifndef KX_TOOLS_ADD_H
#define KX_TOOLS_ADD_H

#include "commands/Edit.h"
#include "output/ExitStatus.h"

#include <string>

struct AddArguments
{
    std::string file;
    std::string expression; ///< selects where to add
    std::string name;
    std::string content;    ///< as XML text
    bool after = false;     ///< add a sibling, not a child
    bool attribute = false; ///< add an attribute
    bool all = false;       ///< the expression may select more than one element
    SaveArguments saving;
};

/** kxconfig add: adds an element or an attribute, prints it, and saves. */
ExitStatus Add(const AddArguments& arguments, Report& report);

#endif
