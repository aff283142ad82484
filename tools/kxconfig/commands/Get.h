#ifndef KX_TOOLS_GET_H
#define KX_TOOLS_GET_H

#include "output/ExitStatus.h"

#include <string>

class Report;

struct GetArguments
{
    std::string file;
    std::string key;
};

/** kxconfig get: prints the value or values under a key, one on a line. */
ExitStatus Get(const GetArguments& arguments, Report& report);

#endif
