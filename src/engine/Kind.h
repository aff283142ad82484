#ifndef KX_ENGINE_KIND_H
#define KX_ENGINE_KIND_H

/**
 * @file Kind.h
 * What each kind of the engine's records has, and which changes it permits.
 *
 * A handle can designate any record that begins with the engine's type number. Documents,
 * attributes, DTDs and declarations share only their first fields (name, links, document) with a
 * node; a namespace shares nothing but the type. These functions look at the type before they
 * read a field, so that every operation is safe on every kind of node.
 */

#include <libxml/tree.h>

namespace kx
{

/** @return whether @p node, which may be null, is an element. */
inline bool IsElement(const xmlNode* node)
{
    return node != 0 && node->type == XML_ELEMENT_NODE;
}

inline bool IsAttribute(const xmlNode* node)
{
    return node->type == XML_ATTRIBUTE_NODE;
}

inline bool IsDocument(const xmlNode* node)
{
    return node->type == XML_DOCUMENT_NODE || node->type == XML_HTML_DOCUMENT_NODE;
}

/** One of a node's links: &xmlNode::next and its like. */
typedef xmlNode* xmlNode::*NodeLink;

/** @return the node that @p link of @p node leads to; null if @p node is null or has no links. */
inline xmlNode* LinkOf(const xmlNode* node, NodeLink link)
{
    return node != 0 && node->type != XML_NAMESPACE_DECL ? node->*link : 0;
}

/** @return the stored name of @p node, which may be null; null if it has none. */
inline const xmlChar* NameOf(const xmlNode* node)
{
    return node != 0 && node->type != XML_NAMESPACE_DECL ? node->name : 0;
}

/** @return whether @p node is an element or an XInclude mark, which was one and keeps its fields.
 */
inline bool HasElementFields(const xmlNode* node)
{
    return node->type == XML_ELEMENT_NODE || node->type == XML_XINCLUDE_START ||
           node->type == XML_XINCLUDE_END;
}

/** @return the namespace of @p node, or null; only elements, marks and attributes have one. */
inline xmlNs* NamespaceOf(const xmlNode* node)
{
    // They have it at different places of the record.
    if (IsAttribute(node))
    {
        return reinterpret_cast<const xmlAttr*>(node)->ns;
    }
    return HasElementFields(node) ? node->ns : 0;
}

/** @return the first attribute of @p node, which may be null; only elements and marks have any. */
inline xmlAttr* AttributesOf(const xmlNode* node)
{
    return node != 0 && HasElementFields(node) ? node->properties : 0;
}

/** @return whether @p node is a reference whose child is the declaration of its entity. */
bool RefersToDeclaration(const xmlNode* node);

/** @return whether a child linked under @p node, which may be null, is freed with it. */
bool CanHoldChildren(const xmlNode* node);

/** @return whether an element can be linked beside @p node, which may be null. */
bool CanHaveSiblings(const xmlNode* node);

/** @return whether @p node is of a kind whose content the engine replaces, and the nodes below. */
bool HasContent(const xmlNode* node);

// Changes of @p node, which may be null. One that would leave a pointer to freed memory is refused.

/** @return whether content can be set; not if it would be that of an entity's declaration. */
bool CanTakeContent(const xmlNode* node);

/** @return whether the children can be freed; a declaration is in the tables of its DTD, too. */
bool CanBeCleared(const xmlNode* node);

/** @return whether it can be freed; references point to the entities that a DTD declares. */
bool CanBeRemoved(const xmlNode* node);

} // namespace kx

#endif
