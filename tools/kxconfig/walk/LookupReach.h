#ifndef KX_TOOLS_LOOKUPREACH_H
#define KX_TOOLS_LOOKUPREACH_H

#include <libxml/tree.h>

#include <string>
#include <vector>

/** @return the elements of @p document that have a value under @p key, in document order. Writes no
 * log records. */
std::vector<const xmlNode*> ElementsOfLookup(const xmlDoc* document, const std::string& key);

#endif
