#ifndef KX_TOOLS_KEYS_H
#define KX_TOOLS_KEYS_H

#include "output/ExitStatus.h"

#include <iosfwd>
#include <string>

class Report;

struct KeysArguments
{
    std::string file;
    std::istream* input = nullptr; ///< what the file "-" stands for
    std::string prefix;            ///< print only the keys below it; empty: all
    bool namesOnly = false;        ///< print the keys without their values
    bool all = false;              ///< print every value under a key that has many
};

/** kxconfig keys: prints every key path under which a file holds a value, with that value. */
ExitStatus Keys(const KeysArguments& arguments, Report& report);

#endif
