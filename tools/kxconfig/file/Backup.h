#ifndef KX_TOOLS_BACKUP_H
#define KX_TOOLS_BACKUP_H

#include "file/Place.h"

#include <string>

/**
 * Gives the file in @p place a second name, its own and @p suffix, in place of what has that name.
 * The file that replaces it is a new one, so the second name keeps the content and all attributes.
 *
 * @throw std::system_error if that fails: then both names are as they were.
 */
void KeepBackup(const Place& place, const std::string& suffix);

#endif
