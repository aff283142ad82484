#ifndef KX_CONFIG_KEYPATHUPDATE_H
#define KX_CONFIG_KEYPATHUPDATE_H

#include "KeyPath.h"
#include "Observer.h"

namespace kx
{

/**
 * Replaces the text of the elements below @p top that @p key addresses by @p value, and then sets
 * @p updated to 1.
 *
 * A null node or an empty key changes nothing. @p key and @p value are zero-terminated.
 * UpdateWalk.h defines it; the library has it for the observer Silent.
 * @return the status of the last descent.
 */
template <class Observer>
int UpdateValues(xmlNode* top, TextView key, const char* value, unsigned int& updated);

inline int UpdateValues(xmlNode* top, TextView key, const char* value, unsigned int& updated)
{
    return UpdateValues<Silent>(top, key, value, updated);
}

} // namespace kx

#endif
