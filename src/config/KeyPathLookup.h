#ifndef KX_CONFIG_KEYPATHLOOKUP_H
#define KX_CONFIG_KEYPATHLOOKUP_H

#include "KeyPath.h"
#include "Observer.h"

#include <string>

namespace kx
{

/**
 * Appends to @p result what lies below @p node under @p key: values on the last level run together,
 * values found through different branches are separated by "\n".
 *
 * A null node or an empty key adds nothing. Logs nothing.
 */
void CollectValues(const xmlNode* node, TextView key, std::string& result);

/**
 * Appends to @p value what lies below @p node under @p key, each value preceded by "\n" unless the
 * string is empty at that moment, and then sets @p found to 1.
 *
 * @p key is zero-terminated, for the log. @return the status that the level's trace ends with.
 * LookupWalk.h defines it; the library has it for the observer Silent.
 */
template <class Observer>
int AppendValues(const xmlNode* node, TextView key, std::string& value, unsigned int& found);

inline int AppendValues(const xmlNode* node, TextView key, std::string& value, unsigned int& found)
{
    return AppendValues<Silent>(node, key, value, found);
}

} // namespace kx

#endif
