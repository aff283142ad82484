#ifndef KX_TOOLS_NODES_H
#define KX_TOOLS_NODES_H

#include <libxml/tree.h>

#include <string>

// What kxconfig shows of the engine's nodes.

/** @return a copy of the engine's @p text; empty for null. */
std::string Text(const xmlChar* text);

/** The same of a text that the caller owns, which is freed. */
std::string Taken(xmlChar* text);

/** @return the location path of @p node, such as /cfg/net[2]/ip. */
std::string LocationOf(const xmlNode* node);

/** @return the text of @p node and of all below it. */
std::string ContentOf(const xmlNode* node);

/** @return the text node that is the only child of @p element, or null: only then it has a value.
 */
const xmlNode* OnlyTextOf(const xmlNode* element);

/** @return the attribute's text as the library's conditions see it; empty if there is none. */
std::string AttributeOf(const xmlNode* element, const std::string& name);

#endif
