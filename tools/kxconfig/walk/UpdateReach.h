#ifndef KX_TOOLS_UPDATEREACH_H
#define KX_TOOLS_UPDATEREACH_H

#include <libxml/tree.h>

#include <string>
#include <vector>

/** @return the elements of @p document that an update under @p key would change, in document order.
 * Writes no log records. */
std::vector<const xmlNode*> ElementsOfUpdate(const xmlDoc* document, const std::string& key);

#endif
