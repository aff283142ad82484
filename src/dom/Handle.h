#ifndef KX_DOM_HANDLE_H
#define KX_DOM_HANDLE_H

#include "CXmlNode.h"

namespace kx
{

/** Sets @p handle, a null handle so far, on @p node; without a node it stays null. */
inline void Designate(CXmlNode& handle, _xmlNode* node)
{
    if (node != 0)
    {
        handle.SetXmlNodePtr(node);
    }
}

/**
 * How an operation that only finds a node ends: the handle is made, and "-" logged under @p tag.
 *
 * @return a handle on @p node; a null handle without one.
 */
CXmlNode HandleOn(const char* tag, _xmlNode* node);

} // namespace kx

#endif
