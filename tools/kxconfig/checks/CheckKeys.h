#ifndef KX_TOOLS_CHECKKEYS_H
#define KX_TOOLS_CHECKKEYS_H

#include "checks/Findings.h"
#include "survey/Levels.h"

#include <string>
#include <vector>

/** How many elements a key reaches. */
struct Reach
{
    std::string key;
    size_t lookup; ///< elements that a lookup finds
    size_t update; ///< elements that an update changes
};

/** Checks lookups and updates of @p keys: no value, several, other elements in an update than in a
 * lookup, suspended conditions. */
std::vector<Reach> CheckGivenKeys(const xmlDoc* document, const std::vector<std::string>& keys,
                                  Findings& findings);

/** Checks lookups of all keys that can be listed, which are too many to walk for each. */
void CheckListedKeys(const KeyElement* root, Levels& levels, Findings& findings);

#endif
