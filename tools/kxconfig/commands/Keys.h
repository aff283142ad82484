#ifndef KX_TOOLS_KEYS_H
#define KX_TOOLS_KEYS_H

#include "output/ExitStatus.h"

#include <string>

class Report;

struct KeysArguments
{
    std::string file;
};

/** kxconfig keys: prints every key path under which a file holds a value, with that value. */
ExitStatus Keys(const KeysArguments& arguments, Report& report);

#endif
