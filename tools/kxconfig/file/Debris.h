#ifndef KX_TOOLS_DEBRIS_H
#define KX_TOOLS_DEBRIS_H

#include "file/Place.h"

#include <string>

// A save that is killed can leave one file. Its name identifies it, and its lock shows whether the
// save is still running.

/** @return a new name for a file that is about to replace another: ".kxconfig-", 16 digits, ".tmp".
 */
std::string NameOfReplacement();

/**
 * Removes the files of such a name from the folder of @p place, unless a process has locked them:
 * the caller's own lock is the one on the file in @p place.
 */
void RemoveDebris(const Place& place);

#endif
