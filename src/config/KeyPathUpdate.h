#ifndef KX_CONFIG_KEYPATHUPDATE_H
#define KX_CONFIG_KEYPATHUPDATE_H

#include "engine/Text.h"

#include <libxml/tree.h>

namespace kx
{

/**
 * Replaces the text of the elements below @p top that @p key addresses by @p value, and then sets
 * @p updated to 1.
 *
 * @p key and @p value are zero-terminated.
 * @return the status of the last descent; 22 for a null node or an empty key, which change nothing.
 */
int UpdateValues(xmlNode* top, TextView key, const char* value, unsigned int& updated);

} // namespace kx

#endif
