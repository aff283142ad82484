#ifndef KX_CXMLNODE_H
#define KX_CXMLNODE_H

/// @file CXmlNode.h
/// A handle on one node of a document.
///
/// A handle is a pointer to a node of the engine (libxml2), or null. It owns nothing: the tree
/// belongs to its document, and copies of a handle designate the same node.
///
/// A handle is valid as long as its node. ClearNode(), SetContent(), RemoveChildNode(),
/// CXmlParser::RemoveNode() and every release of the document free nodes. Nothing detects a handle
/// on a freed node; destroy it or set it anew, but do not use it.
///
/// A handle can designate every kind of node, such as an attribute or the document itself. Every
/// operation is safe on every kind: where it would corrupt the engine's memory or leak a node, it
/// changes nothing and returns what it returns for a null handle. The kinds that each operation
/// refuses are listed in docs/handbook/document-toolkit.md.
///
/// Strings are UTF-8. Names are compared as whole byte strings. Content that is set or added is XML
/// text. Write an ampersand as an entity reference: a bare one drops text. Short of memory, new
/// content can be missing although an operation reports success. Operations throw only what strings
/// and lists throw: std::bad_alloc and std::length_error.
///
/// The log records of each operation are listed in docs/handbook/status-codes-and-messages.md.

#include "CXmlAttr.h"

#include <list>
#include <string>

struct _xmlNode;

#pragma GCC visibility push(default)

/// The kinds of nodes, by the engine's type numbers.
enum EXmlNodeType
{
    NODE_NONE = 0, ///< a null handle, or a node type number outside of 1 to 20
    NODE_ELEMENT = 1,
    NODE_ATTRIBUTE = 2,
    NODE_TEXT = 3,
    NODE_CDATA_SECTION = 4,
    NODE_ENTITY_REF = 5,
    NODE_ENTITY = 6,
    NODE_PI = 7,
    NODE_COMMENT = 8,
    NODE_DOCUMENT = 9,
    NODE_DOCUMENT_TYPE = 10,
    NODE_DOCUMENT_FRAG = 11,
    NODE_NOTATION = 12,
    NODE_HTML_DOCUMENT = 13,
    NODE_DTD = 14,
    NODE_ELEMENT_DECL = 15,
    NODE_ATTRIBUTE_DECL = 16,
    NODE_ENTITY_DECL = 17,
    NODE_NAMESPACE_DECL = 18,
    NODE_XINCLUDE_START = 19,
    NODE_XINCLUDE_END = 20
};

/// Designates one node, or none: a null handle.
///
/// Handles on nodes of one document are used by one thread at a time.
///
///     CXmlNode root = parser.GetRootNode();
///     for (CXmlNode item = root.FirstChild(); !item.IsNull(); item = item.NextSibling())
///     {
///         std::cout << item.Name() << ": " << item.GetContent() << "\n";
///     }
class CXmlNode
{
public:
    /// @name The handle
    /// @{

    /// Creates a null handle.
    CXmlNode();

    /// Creates a handle on node (an xmlNodePtr), which may be null and is not validated.
    CXmlNode(_xmlNode* node);

    /// Destroys the handle, and leaves the node as it is.
    ~CXmlNode();

    /// Makes the handle designate node, which may be null and is not validated.
    void SetXmlNodePtr(_xmlNode* node);

    /// Returns whether this is a null handle.
    bool IsNull();

    /// Returns the kind of the node, a value of EXmlNodeType.
    int Type();

    /// Returns the name that the engine stores for the node, without a namespace prefix: "text" or
    /// "comment" for such nodes, the target of a processing instruction. Returns "" for a null
    /// handle or a node without a name.
    std::string Name();
    /// @}

    /// @name Navigation
    /// From any node to an element; text, comments and other nodes are skipped. Returns a null
    /// handle if there is no such element or this is a null handle.
    /// @{

    /// Returns the parent if it is an element: a null handle for the root element.
    CXmlNode Parent();

    /// Returns the first child that is an element.
    CXmlNode FirstChild();

    /// Returns the last child that is an element.
    CXmlNode LastChild();

    /// Returns the next sibling that is an element.
    CXmlNode NextSibling();

    /// Returns the previous sibling that is an element.
    CXmlNode PrevSibling();
    /// @}

    /// @name Children and content
    /// @{

    /// Frees every child with its subtree, then every attribute. The node keeps its place, name,
    /// namespace and namespace declarations. Returns 0, also if there was nothing to free. Returns
    /// 22 for a null handle or a kind that is refused.
    int ClearNode();

    /// Returns the text of the node's one and only child. Returns "" for a null handle, if there is
    /// no child or more than one (text beside a comment, say), and if the child is not text (an
    /// element, a CDATA section). A text node itself has no child and gives "".
    ///
    /// Each call that finds text leaves the engine's buffer allocated for good. Keep the returned
    /// string instead of calling again.
    std::string GetContent();

    /// Replaces the content of the node by text. Under an element or attribute every child is freed
    /// with its subtree, and an empty text leaves no child; a text, CDATA section, comment or
    /// processing instruction takes text as its own. Returns 0, or 22 for a null handle or a kind
    /// that is refused.
    int SetContent(std::string text);

    /// Sets value to the GetContent() of FindChildNode(name), which can be "". Returns 0, or -2 if
    /// there is no such child or this is a null handle; value is then unchanged.
    int GetContentOfChildNode(std::string name, std::string& value);

    /// Returns the children that are elements, in document order; none for a null handle.
    std::list<CXmlNode> Children();

    /// Returns the first child with exactly this name, or a null handle. Compares children of every
    /// kind by their Name(): "text" finds the first text child. Finds nothing under a node that is
    /// not an element, such as the document.
    CXmlNode FindChildNode(std::string name);

    /// Returns every child that FindChildNode() would accept, in document order.
    std::list<CXmlNode> FindAllChildNodes(std::string name);

    /// Adds an element as the last child, in the namespace of this node. content may be empty.
    /// Returns the new element. Returns a null handle and adds nothing for a null handle, an empty
    /// name or a kind that is refused, and if the engine runs out of memory.
    ///
    /// Under a document the element follows the root element; the saved file is then well-formed
    /// only if there was none. Under text, comments, CDATA sections, processing instructions and
    /// attributes the element is not saved.
    CXmlNode AddChildNode(std::string name, std::string content);

    /// Adds an element as the last child of this node's parent, not next to this node, and without
    /// a namespace. content may be empty; so may name, but then a saved file does not load. Returns
    /// the new element. Returns a null handle and adds nothing for a null handle or an attribute,
    /// if the parent is not an element (as for the root element), and if the engine runs out of
    /// memory.
    CXmlNode AddSiblingNode(std::string name, std::string content);

    /// Frees FindChildNode(name) with its subtree. Returns 0, or 22 if there is no such child, this
    /// is a null handle or the kind of the child is refused.
    int RemoveChildNode(std::string name);
    /// @}

    /// @name Attributes
    /// @{

    /// Adds an attribute without a namespace. value is plain text: references are not recognized.
    /// Returns 0, or 22 for a null handle, if this is not an element, or if the engine runs out of
    /// memory.
    ///
    /// Does not check whether there is an attribute of that name. If there is, GetAttributeValue()
    /// finds the first, and the saved file does not load: call GetAttributeValue() before.
    int AddNewAttribute(std::string name, std::string value);

    /// Sets value to the value of an attribute, with entity references replaced. Ignores namespace
    /// prefixes, and finds defaults that the DTD declares. Returns 0, or 22 for a null handle or if
    /// there is no such attribute; value is then unchanged.
    int GetAttributeValue(std::string name, std::string& value);

    /// Returns the attributes in document order; none for a null handle or a node that is not an
    /// element. Unlike GetAttributeValue(), it gives
    /// - only the first piece of a value in several pieces, such as text around a reference,
    /// - for an attribute without a value that of the attribute before it, or "" for the first. No
    ///   file has such an attribute, but SetContent("") and ClearNode() on an attribute leave one.
    /// It does not list defaults that the DTD declares.
    std::list<CXmlAttr> GetAttributeItems();

    /// Does nothing but log that it is not supported, and returns 0. To remove an attribute, pass a
    /// handle on it to CXmlParser::RemoveNode().
    int RemoveAttribute(std::string name);

    /// Does nothing but log that it is not supported, and returns 0. To change an attribute, call
    /// SetContent() on a handle on it.
    int SetAttributeValue(std::string name, std::string value);
    /// @}

private:
    friend class CXmlParser;

    _xmlNode* m_pXmlNode;
};

#pragma GCC visibility pop

#endif
