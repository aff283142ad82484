#ifndef KX_DOM_ENGINENODE_H
#define KX_DOM_ENGINENODE_H

/**
 * @file EngineNode.h
 * The engine's node records, as handles may use them.
 *
 * A handle can stand on any record that begins with the engine's type number. Documents,
 * attributes, DTDs and declarations share only their first fields (name, links, document) with a
 * node; a namespace shares nothing but the type. The functions below look at the type before they
 * read a field, so that every operation is safe on every kind of node.
 */

#include <libxml/tree.h>

#include <string.h>

#include <string>

namespace kx
{

inline const xmlChar* ToEngine(const std::string& text)
{
    return reinterpret_cast<const xmlChar*>(text.c_str());
}

/** @return the engine's zero-terminated @p text, which may be null: then it reads as empty. */
inline const char* FromEngine(const xmlChar* text)
{
    return text != 0 ? reinterpret_cast<const char*>(text) : "";
}

/**
 * @return whether the engine's @p text consists of exactly the bytes of @p name; not if it is null.
 */
inline bool SameText(const xmlChar* text, const std::string& name)
{
    const char* const bytes = FromEngine(text);
    const char* const wanted = name.c_str();
    // Most names differ at once. A NUL among the wanted bytes ends strcmp, but not the name.
    return text != 0 && bytes[0] == wanted[0] && strcmp(bytes, wanted) == 0 &&
           strlen(bytes) == name.size();
}

/** One of a node's links: &xmlNode::next and its like. */
typedef xmlNode* xmlNode::*NodeLink;

inline bool IsElement(const xmlNode* node)
{
    return node != 0 && node->type == XML_ELEMENT_NODE;
}

/** @return what @p node, which may be null, is linked to by @p link; null if it has no such link.
 */
inline xmlNode* LinkOf(const xmlNode* node, NodeLink link)
{
    return node != 0 && node->type != XML_NAMESPACE_DECL ? node->*link : 0;
}

/** @return the first of @p node and those that follow it by @p link that is an element, or null. */
inline xmlNode* ElementFrom(xmlNode* node, NodeLink link)
{
    while (node != 0 && node->type != XML_ELEMENT_NODE)
    {
        node = node->*link;
    }
    return node;
}

/** @return the stored name of @p node, which may be null; null if it has none. */
inline const xmlChar* NameOf(const xmlNode* node)
{
    return node != 0 && node->type != XML_NAMESPACE_DECL ? node->name : 0;
}

/** @return the namespace of @p node; null if it has none or is of a kind that cannot have one. */
xmlNs* NamespaceOf(xmlNode* node);

/** @return the first attribute of @p node, which may be null; only elements have attributes. */
xmlAttr* AttributesOf(const xmlNode* node);

/** @return whether a child linked under @p node, which may be null, is freed with it. */
bool CanHoldChildren(const xmlNode* node);

/** @return whether an element can be linked beside @p node, which may be null. */
bool CanHaveSiblings(const xmlNode* node);

// What an operation would do to @p node, which may be null: it is refused where that would leave a
// pointer to freed memory behind.

/** @return whether content can be set; not if it would be that of an entity's declaration. */
bool CanTakeContent(const xmlNode* node);

/** @return whether the children can be freed; a declaration is in the tables of its DTD, too. */
bool CanBeCleared(const xmlNode* node);

/** @return whether it can be freed; references point to the entities that a DTD declares. */
bool CanBeRemoved(const xmlNode* node);

/**
 * @return @p element, which the engine has just made, or null if it could not be made whole: short
 *         of memory the engine answers an element without a name, which is freed here.
 */
xmlNode* WholeElement(xmlNode* element);

/** Adds an attribute to @p node. @return whether the engine made it, name and value and all. */
bool AddAttribute(xmlNode* node, const std::string& name, const std::string& value);

/** Replaces the content of @p node, which can take it; of a kind without content it has none. */
void ReplaceContent(xmlNode* node, const std::string& text);

/** Removes every child of @p node, which can be cleared. */
void RemoveChildren(xmlNode* node);

/** Removes every attribute of @p node. */
void RemoveAttributes(xmlNode* node);

/** Takes @p node, which can be removed, out of its tree and frees it with all that it holds. */
void FreeFromTree(xmlNode* node);

} // namespace kx

#endif
