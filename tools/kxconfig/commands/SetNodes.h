#ifndef KX_TOOLS_SETNODES_H
#define KX_TOOLS_SETNODES_H

#include "commands/Assignment.h"
#include "commands/Edit.h"
#include "output/ExitStatus.h"

#include <string>
#include <vector>

/**
 * The part of kxconfig set after the lock, for expressions in place of keys.
 *
 * @param all  whether an expression may select more than one node.
 */
ExitStatus SetNodes(const std::vector<Assignment>& assignments, const std::string& file, bool all,
                    Edit& edit);

#endif
