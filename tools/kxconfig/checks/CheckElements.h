#ifndef KX_TOOLS_CHECKELEMENTS_H
#define KX_TOOLS_CHECKELEMENTS_H

#include "checks/Findings.h"
#include "file/KeyTree.h"

/** Checks @p root and all elements below it for text that no lookup finds, names that no key can
 * contain, and attributes that no longer distinguish elements. */
void CheckElements(const KeyElement* root, Findings& findings);

#endif
