#ifndef KX_CXMLNODE_H
#define KX_CXMLNODE_H

/**
 * @file CXmlNode.h
 * A handle on one node of a document.
 *
 * @par What a handle is
 * A handle is one pointer to a node of the engine (libxml2), possibly null: a null handle. It is
 * copied freely and owns nothing. The tree belongs to its document, usually one that a CXmlParser
 * holds; the destruction of a handle changes nothing in it. Copies of a handle designate the same
 * node and see the same changes.
 *
 * @par How long a handle is valid
 * As long as its node lives. ClearNode(), SetContent(), RemoveChildNode(), CXmlParser::RemoveNode()
 * and every release of the document free nodes; a handle on a node that was freed dangles, nothing
 * detects it, and it must no longer be used except to be destroyed or set anew.
 *
 * @par Which nodes a handle can stand on
 * On all kinds: CXmlParser::FindNode() yields the document itself for "/", attributes, text and so
 * on. Every operation is safe on every kind:
 * - Only elements have attributes and only elements and attributes have a namespace.
 * - Where an operation would free what others still hold, or lose a node, it changes nothing and
 *   answers quietly as it does for a null handle. These are:
 *
 * | operation               | kinds of node refused                                             |
 * | ----------------------- | ----------------------------------------------------------------- |
 * | SetContent, ClearNode   | documents, DTDs, declarations, entity references, namespaces      |
 * | RemoveNode (CXmlParser) | documents, DTDs, declarations, namespaces                         |
 * | AddChildNode            | declarations, entity references, namespaces                       |
 * | AddSiblingNode          | attributes                                                        |
 *
 * An attribute of type ID whose value is changed through a handle on it or on its text is an
 * ordinary attribute from then on: the XPath function id() no longer finds it.
 *
 * @par Names and text
 * Strings hold UTF-8. Names are compared as exact byte strings: case matters, nothing is trimmed.
 * Content that is set or added is handed to the engine unescaped, and the engine recognises entity
 * references in it: write "\&amp;" for an ampersand and "\&lt;" for a less-than sign. What
 * the engine makes of a bare ampersand differs between its versions.
 *
 * @par Status codes
 * | code | meaning                                                                           |
 * | ---- | --------------------------------------------------------------------------------- |
 * | 0    | done; always for RemoveAttribute() and SetAttributeValue(), which do nothing      |
 * | 22   | null handle, a kind of node that is refused, no such child or attribute           |
 * | -2   | child not found (GetContentOfChildNode())                                         |
 *
 * @par Logging
 * Every operation, constructors and destructor included, logs "+" on entry and "-" on return (level
 * 11) under its bare name. Other records are told at the operation that writes them. Operations
 * that call others include their records: a navigation logs those of the default constructor
 * and, when it finds a node, of SetXmlNodePtr() between its own. Copies log nothing when they are
 * made, and "+" and "-" under "~CXmlNode" when they die.
 *
 * @par Memory
 * What the engine cannot make for want of memory is reported as told at each operation; new content
 * (SetContent(), AddChildNode(), AddSiblingNode()) may then be missing without a message, since the
 * engine does not tell.
 *
 * @par Exceptions
 * Memory exhausted in strings or lists leaves any operation as std::bad_alloc, without "-";
 * nothing else is thrown.
 */

#include "CXmlAttr.h"

#include <list>
#include <string>

struct _xmlNode;

#pragma GCC visibility push(default)

/** What CXmlNode::Type() answers; the numbers of the engine's node types. */
enum EXmlNodeType
{
    NODE_NONE = 0, ///< a null handle, or a type number outside of 1 to 20
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

/**
 * A handle on one node, possibly null.
 *
 * Handles of one document are used by one thread at a time.
 *
 * @code
 * CXmlNode root = parser.GetRootNode();
 * for (CXmlNode item = root.FirstChild(); !item.IsNull(); item = item.NextSibling())
 * {
 *     std::cout << item.Name() << ": " << item.GetContent() << "\n";
 * }
 * @endcode
 */
class CXmlNode
{
public:
    /** @name The handle */
    ///@{

    /** Makes a null handle. */
    CXmlNode();

    /**
     * Makes a handle on a node.
     *
     * @param node  an xmlNodePtr; may be null, and is not validated.
     */
    CXmlNode(_xmlNode* node);

    /** Releases nothing: neither the node nor its tree. */
    ~CXmlNode();

    /**
     * Makes the handle designate @p node. The node that it designated before is left as it is.
     *
     * @param node  an xmlNodePtr; may be null, and is not validated.
     */
    void SetXmlNodePtr(_xmlNode* node);

    /** @return whether this is a null handle. */
    bool IsNull();

    /** @return the node's kind, a value of EXmlNodeType; NODE_NONE for a null handle. */
    int Type();

    /**
     * @return the node's name as the engine stores it, without a namespace prefix; for nodes that
     *         are no elements whatever the engine calls them ("text", "comment", a processing
     *         instruction's target). Empty for a null handle or a node without a name.
     */
    std::string Name();
    ///@}

    /**
     * @name Navigation
     * From element to element: text, white space, comments and everything else between them is
     * stepped over. The handle itself may stand on any node. Each returns a new handle, null if
     * there is no such element or this handle is null.
     */
    ///@{

    /**
     * @return the parent if it is an element. Null for the root element: navigation never leaves
     * the element tree.
     */
    CXmlNode Parent();

    /** @return the first child that is an element. */
    CXmlNode FirstChild();

    /** @return the last child that is an element. */
    CXmlNode LastChild();

    /** @return the next sibling that is an element. */
    CXmlNode NextSibling();

    /** @return the previous sibling that is an element. */
    CXmlNode PrevSibling();
    ///@}

    /** @name Children and content */
    ///@{

    /**
     * Removes every child, of whatever kind and with all below it, then every attribute. The node
     * stays in its place with its name, namespace and namespace declarations, and this handle
     * stays valid. Handles on what was removed dangle.
     *
     * @return 0, also if there was nothing to remove; 22 for a null handle or a node that is
     *         refused.
     */
    int ClearNode();

    /**
     * @return the node's text if exactly one child lies under it and that child is text; otherwise
     *         empty: a null handle, no child, child elements, text in pieces, a comment beside
     *         the text, a CDATA section. A handle on a text node itself has no child and reads
     *         empty.
     *
     * Each call that finds text leaves a copy of it allocated in the engine, for good. A program
     * that reads often keeps the returned string rather than reading again.
     */
    std::string GetContent();

    /**
     * Replaces the node's content by @p text, in which entity references are recognised.
     *
     * Under an element or attribute every child is freed, child elements with all below them, and
     * handles on them dangle; an empty text leaves no child. A text, CDATA section, comment or
     * processing instruction gets @p text as its own.
     *
     * @param text  the new content; may be empty.
     * @return 0; 22 for a null handle or a node that is refused.
     */
    int SetContent(std::string text);

    /**
     * Reads the content of the first child that FindChildNode() finds under @p name.
     *
     * @param name   the child's name.
     * @param value  set to the child's GetContent(), which may be empty; unchanged if there is no
     *               such child.
     * @return 0, or -2 if there is no such child or this is a null handle.
     */
    int GetContentOfChildNode(std::string name, std::string& value);

    /** @return handles on the children that are elements, in document order; none for a null
     * handle. */
    std::list<CXmlNode> Children();

    /**
     * @param name  the child's name.
     * @return a handle on the first child with exactly this name, or a null handle.
     *
     * Under an element children of every kind are compared, each under the name that the engine
     * gives it: "text" finds the first text child, "comment" the first comment. Under a node that
     * is no element nothing is found: a handle on the document does not find the root element.
     */
    CXmlNode FindChildNode(std::string name);

    /**
     * @param name  the children's name.
     * @return handles on all children that FindChildNode() would accept, in document order.
     */
    std::list<CXmlNode> FindAllChildNodes(std::string name);

    /**
     * Adds an element as the last child, in this node's namespace.
     *
     * @param name     its name; with an empty one nothing is created.
     * @param content  its text, in which entity references are recognised; may be empty.
     * @return a handle on the new element. Null for a null handle, an empty name or a kind of node
     *         that is refused, and if the engine is out of memory: then "Error creating child node"
     *         (level 9) is logged.
     *
     * The kind of this node is not looked at otherwise. Under a document the new element follows
     * the root element, and the saved file is well-formed only if there was none. What is hung
     * under text, comments, CDATA sections, processing instructions and attributes is not saved.
     */
    CXmlNode AddChildNode(std::string name, std::string content);

    /**
     * Adds an element as the last child of this node's parent, not right after this node.
     *
     * @param name     its name; unlike AddChildNode() it may be empty, and the element then has an
     *                 empty name, which does not load again once saved.
     * @param content  its text, in which entity references are recognised; may be empty.
     * @return a handle on the new element. Null for a null handle, if the parent is no element (so
     *         for the root element), for an attribute, and if the engine is out of memory. Nothing
     *         is logged then.
     *
     * The new element has no namespace of its own.
     */
    CXmlNode AddSiblingNode(std::string name, std::string content);

    /**
     * Removes and frees the first child that FindChildNode() finds under @p name, with all below
     * it. Handles on what was removed dangle.
     *
     * @param name  the child's name.
     * @return 0, or 22 if there is no such child or this is a null handle.
     */
    int RemoveChildNode(std::string name);
    ///@}

    /** @name Attributes */
    ///@{

    /**
     * Adds an attribute without a namespace.
     *
     * It is not checked whether there is one of this name: the element then has two, the saved file
     * does not load again, and GetAttributeValue() finds the first. Ask GetAttributeValue() before.
     *
     * @param name   the attribute's name.
     * @param value  its value, given plain: references are not recognised.
     * @return
     * - 0 if it was added,
     * - 22 for a null handle ("Node ptr is NULL", level 9),
     * - 22 if this is no element or the engine is out of memory ("Unable to add new property :: %s"
     *   with the name, level 9).
     */
    int AddNewAttribute(std::string name, std::string value);

    /**
     * Reads an attribute, entity references replaced. A prefix is not part of the name, and a
     * default that the DTD declares is found too.
     *
     * @param name   the attribute's name.
     * @param value  set to the attribute's value; unchanged on failure.
     * @return
     * - 0 if there is such an attribute,
     * - 22 for a null handle ("Node ptr is NULL", level 9),
     * - 22 if there is none ("Attribute key :: %s not found" with the name, level 9).
     */
    int GetAttributeValue(std::string name, std::string& value);

    /**
     * @return the element's attributes in document order; none for a null handle or a node that is
     *         no element.
     *
     * Two things differ from GetAttributeValue(). An attribute without a value shows the value of
     * the attribute before it in the list, or an empty one if it is the first. No file holds one,
     * but SetContent("") and ClearNode() on a handle on an attribute leave one. Of a value in
     * several pieces, such as text around an entity reference, only the first piece is shown. Logs
     * the records of each CXmlAttr that is built and destroyed on the way.
     */
    std::list<CXmlAttr> GetAttributeItems();

    /**
     * Does nothing. Logs "RemoveAttribute feature is not available, Reason: This API is not
     * supported by libxml2 present in QNX650" (level 8).
     *
     * @param name  not looked at.
     * @return 0.
     */
    int RemoveAttribute(std::string name);

    /**
     * Does nothing. Logs "SetAttributeValue feature is not available, Reason: This API is not
     * supported by libxml2 present in QNX650" (level 8).
     *
     * @param name   not looked at.
     * @param value  not looked at.
     * @return 0.
     */
    int SetAttributeValue(std::string name, std::string value);
    ///@}

private:
    friend class CXmlParser;

    _xmlNode* m_pXmlNode;
};

#pragma GCC visibility pop

#endif
