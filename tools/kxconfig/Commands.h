#ifndef KX_TOOLS_COMMANDS_H
#define KX_TOOLS_COMMANDS_H

#include "ExitStatus.h"

#include <string>

/** kxconfig get: prints the value or values under @p key in @p file, one on a line. */
ExitStatus Get(const std::string& file, const std::string& key);

#endif
