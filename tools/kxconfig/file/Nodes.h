#ifndef KX_TOOLS_NODES_H
#define KX_TOOLS_NODES_H

#include <libxml/tree.h>

#include <string>
#include <string_view>

// What kxconfig shows of the engine's nodes.

/** @return a copy of the engine's @p text; empty for null. */
std::string Text(const xmlChar* text);

inline std::string Text(std::string_view view)
{
    return std::string(view);
}

/** The same of a text that the caller owns, which is freed. */
std::string Taken(xmlChar* text);

/** @return the line of the file that @p node stands on; negative for the document. */
long LineNumberOf(const xmlNode* node);

/** The same as it is told: the engine counts up to 65535. */
std::string LineOf(const xmlNode* node);

/** Makes the engine count lines; before a file is loaded. */
void CountLines();

/** @return the text of @p node and of all below it. */
std::string ContentOf(const xmlNode* node);

/** @return the text node that is the only child of @p element, or null: only then it has a value.
 */
const xmlNode* OnlyTextOf(const xmlNode* element);

/** @return why @p element, which OnlyTextOf() finds no text in, has no value. */
std::string WhyNoValue(const xmlNode* element);

/** @return whether the library's conditions see the attribute, be it by a default of the DTD. */
bool HasAttribute(const xmlNode* element, const std::string& name);

/** @return the attribute's text as the library's conditions see it; empty if there is none. */
std::string AttributeOf(const xmlNode* element, const std::string& name);

#endif
