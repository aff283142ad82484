#ifndef KX_TOOLS_STOREDTEXT_H
#define KX_TOOLS_STOREDTEXT_H

#include <libxml/tree.h>

#include <string>

/**
 * Requires that the engine has stored @p value, a text with references, as the content of @p node:
 * short of memory, engines from 2.13 on store less or nothing, and report no error.
 *
 * @param value  has only complete references.
 * @throws std::bad_alloc if the content is another.
 */
void RequireStored(const xmlNode* node, const std::string& value);

#endif
