#ifndef KX_TOOLS_SETNODES_H
#define KX_TOOLS_SETNODES_H

#include "commands/Set.h"

#include <string>
#include <vector>

/** A key path or an XPath expression, and the new text under it. */
struct KeyValue
{
    std::string key;
    std::string value;
};

/** The part of kxconfig set after the lock, for expressions in place of keys. */
ExitStatus SetNodes(const std::vector<KeyValue>& pairs, const SetArguments& arguments, Edit& edit);

#endif
