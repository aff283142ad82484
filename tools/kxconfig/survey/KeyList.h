#ifndef KX_TOOLS_KEYLIST_H
#define KX_TOOLS_KEYLIST_H

#include "survey/Levels.h"

#include <string>
#include <vector>

/** @return the key path of each element with a value, in document order and each key once; with a
 * condition where others bear the same name and an attribute distinguishes them. */
std::vector<std::string> ListKeys(const xmlNode* root, Levels& levels);

#endif
