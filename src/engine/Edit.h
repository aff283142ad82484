#ifndef KX_ENGINE_EDIT_H
#define KX_ENGINE_EDIT_H

/**
 * @file Edit.h
 * Changes of a tree that leave no pointer to freed memory. Kind.h has what they require of a node.
 */

#include <libxml/tree.h>

#include <string>

namespace kx
{

/**
 * @return @p element, which the engine has just made, or null if it could not be made whole: short
 *         of memory the engine answers an element without a name, which is freed here.
 */
xmlNode* WholeElement(xmlNode* element);

/** Adds an attribute to @p node. @return whether the engine made it, name and value and all. */
bool AddAttribute(xmlNode* node, const std::string& name, const std::string& value);

/** Replaces the content of @p node, which can take it; of a kind without content it has none. */
void ReplaceContent(xmlNode* node, const std::string& text);

/** Removes every child and every attribute of @p node, which can be cleared. */
void Clear(xmlNode* node);

/** Takes @p node, which can be removed, out of its tree and frees it with all that it holds. */
void FreeFromTree(xmlNode* node);

} // namespace kx

#endif
