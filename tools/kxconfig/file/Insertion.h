#ifndef KX_TOOLS_INSERTION_H
#define KX_TOOLS_INSERTION_H

#include <libxml/tree.h>

#include <string>

// Adding and removing elements as a person would who edits the file: what is on lines of its own
// stays on lines of its own, and the rest of the file keeps its form.

/**
 * Adds a child to @p parent, in its namespace and indented like the element before it.
 *
 * @param after    the child of @p parent that it follows; if null, it is the last child.
 * @param content  as XML text.
 * @return the new element. Null if the library adds none.
 */
xmlNode* AddElement(xmlNode* parent, xmlNode* after, const std::string& name,
                    const std::string& content);

/** @return the blank text before @p node that has to go with the node, so that no blank line is
 * left where the node was; null if there is none. */
xmlNode* LineBefore(const xmlNode* node);

#endif
