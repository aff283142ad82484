#ifndef KX_TOOLS_CHECKKEYS_H
#define KX_TOOLS_CHECKKEYS_H

#include "checks/Warnings.h"
#include "survey/Levels.h"

#include <string>

/** Warns of what surprises in a lookup of @p key: no value, several, or a matter of order. */
void CheckLookup(xmlDoc* document, const std::string& key, Warnings& warnings);

/** The same for all keys that can be listed, which are too many to walk for each. */
void CheckListedKeys(const xmlNode* root, Levels& levels, Warnings& warnings);

#endif
