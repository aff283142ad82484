#ifndef KX_TOOLS_DEBRIS_H
#define KX_TOOLS_DEBRIS_H

#include <string>

// A save that is killed can leave one file. Its name identifies it, and its lock shows whether the
// save is still running.

/** @return a new name for a file that is about to replace another: ".kxconfig-", 16 digits, ".tmp".
 */
std::string NameOfReplacement();

/** Removes the files of such a name that no process has locked from @p folder, an open one. */
void RemoveDebris(int folder);

#endif
