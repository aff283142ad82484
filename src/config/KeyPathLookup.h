#ifndef KX_CONFIG_KEYPATHLOOKUP_H
#define KX_CONFIG_KEYPATHLOOKUP_H

#include "engine/Text.h"

#include <libxml/tree.h>

#include <string>

namespace kx
{

/**
 * Appends to @p result what lies below @p node under @p key: values on the last level run together,
 * values found through different branches are separated by "\n".
 *
 * A null node or an empty key adds nothing. Logs nothing.
 * @param separate  whether "\n" precedes what is appended, unless that is empty
 */
void CollectValues(const xmlNode* node, TextView key, std::string& result, bool separate = false);

/**
 * Appends to @p value what lies below @p node under @p key, each value preceded by "\n" unless the
 * string is empty at that moment, and then sets @p found to 1.
 *
 * @p key is zero-terminated, for the log.
 * @return the status of the last descent, 22 or -2: it depends on no value. 22 for a null node or
 *         an empty key.
 */
int AppendValues(const xmlNode* node, TextView key, std::string& value, unsigned int& found);

} // namespace kx

#endif
