#ifndef KX_TOOLS_NODES_H
#define KX_TOOLS_NODES_H

#include "engine/Node.h"

#include <string>
#include <string_view>

// What kxconfig shows of the engine's nodes.

inline bool IsBlankText(const xmlNode* node)
{
    // Headers before 2.9.8 declare it without const.
    return xmlIsBlankNode(const_cast<xmlNode*>(node)) == 1;
}

/** @return a copy of the engine's @p text; empty for null. */
inline std::string Text(const xmlChar* text)
{
    return kx::FromEngine(text);
}

inline std::string Text(std::string_view view)
{
    return std::string(view);
}

inline std::string Text(const kx::TextView& view)
{
    return {view.data, view.size};
}

/** The same of a text that the caller owns, which is freed. */
std::string Taken(xmlChar* text);

/** @return the line of the file that @p node is on; negative for the document. */
long LineNumberOf(const xmlNode* node);

/** The same as it is printed: the engine counts up to 65535. */
std::string LineOf(const xmlNode* node);

/** @return the text of @p node and of all below it. */
std::string ContentOf(const xmlNode* node);

/** @return the name of @p node, an element or an attribute, with its prefix. */
std::string NameWithPrefix(const xmlNode* node);

/** @return why @p element, whose only child is not a text, has no value. */
std::string WhyNoValue(const xmlNode* element);

/** @return whether the library's conditions see the attribute, be it by a default of the DTD. */
bool HasAttribute(const xmlNode* element, const std::string& name);

/** @return the attribute's text as the library's conditions see it; empty if there is none. */
std::string AttributeOf(const xmlNode* element, const std::string& name);

#endif
