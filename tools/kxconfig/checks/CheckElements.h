#ifndef KX_TOOLS_CHECKELEMENTS_H
#define KX_TOOLS_CHECKELEMENTS_H

#include "checks/Warnings.h"
#include "survey/Levels.h"

/** Warns of what no lookup can see in @p element and below, and of what no condition can tell
 * apart. */
void CheckElements(const xmlNode* element, const Levels& levels, Warnings& warnings);

#endif
