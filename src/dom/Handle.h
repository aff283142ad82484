#ifndef KX_DOM_HANDLE_H
#define KX_DOM_HANDLE_H

#include "CXmlNode.h"

namespace kx
{

/** Sets @p handle, which is null, to @p node; a null @p node leaves it null. */
inline void SetIfFound(CXmlNode& handle, _xmlNode* node)
{
    if (node != 0)
    {
        handle.SetXmlNodePtr(node);
    }
}

/**
 * Ends an operation that only finds a node: creates the handle and logs "-" under @p tag.
 *
 * @return a handle on @p node, which may be null.
 */
CXmlNode LeaveWithHandle(const char* tag, _xmlNode* node);

} // namespace kx

#endif
