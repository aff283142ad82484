#ifndef KX_CXMLPARSER_H
#define KX_CXMLPARSER_H

/**
 * @file CXmlParser.h
 * A whole document: loaded, created, queried, changed and saved.
 *
 * @par Ownership
 * A CXmlParser owns at most one document of the engine (libxml2). Every handle that it hands out
 * points into that document and is valid until the document is released: by ClearDocument(),
 * ParseXml(), CreateNewXmlDoc() or the destructor. Handles own nothing.
 *
 * @par Effects on the whole process
 * - Each construction sets the engine's xmlKeepBlanksDefault(0): from then on every parse of the
 *   thread, those of CXMLReader and CXMLWriter included, drops text between elements that is only
 *   white space. White space that is an element's only child survives.
 * - Each release of a held document calls the engine's xmlCleanupParser(). Documents that are held
 *   elsewhere, and later parses, stay usable, and the setting above stays as it is.
 *
 * Constructing a CXmlParser and releasing its document must therefore not overlap with any other
 * use of the engine in the process.
 *
 * @par Status codes
 * | code | meaning                                                               |
 * | ---- | --------------------------------------------------------------------- |
 * | 0    | success                                                               |
 * | 7    | a file that cannot be opened for reading, an empty root name          |
 * | 22   | no document, a file not parsed, a null handle, engine out of memory   |
 * | -2   | the engine could not write the file                                   |
 *
 * @par Logging
 * Every operation except ClearDocument() logs "+" on entry and "-" on return (level 11) under its
 * bare name, constructor and destructor included; records of the operations and handles that it
 * uses lie between them. Handles given by value die after the "-". The recorded root is a handle
 * too: its constructor's records come before the "+" of the constructor, its destructor's after the
 * "-" of the destructor.
 *
 * @par Exceptions
 * Memory exhausted in strings or lists leaves any operation as an exception of theirs, without "-".
 * FindAllNodes() runs into that by itself on 256 nodes and more.
 */

#include "CXmlNode.h"

#include <list>
#include <string>

struct _xmlDoc;
struct _xmlXPathObject;

#pragma GCC visibility push(default)

/**
 * Holds one document.
 *
 * Used by one thread at a time. Cannot be copied, so that no two objects own one document.
 *
 * @code
 * CXmlParser parser;
 * if (parser.ParseXml("/etc/device.xml") == 0)
 * {
 *     CXmlNode port = parser.FindNode("/cfg/net/port", CXmlNode());
 *     port.SetContent("8080");
 *     parser.SaveXml("");
 * }
 * @endcode
 */
class CXmlParser
{
public:
    /** @name Life of the document */
    ///@{

    /** Makes an object without document, path and root; sets xmlKeepBlanksDefault(0). */
    CXmlParser();

    /** Releases the document as ClearDocument() does. */
    ~CXmlParser();

    /**
     * Releases the document that is held, if any: all handles into it dangle. Then, and only then,
     * the engine's xmlCleanupParser() runs. The recorded path and root are reset in any case.
     *
     * Logs nothing at all.
     */
    void ClearDocument();

    /**
     * Loads the file at @p path.
     *
     * A document that was held is released first, whatever becomes of the load. The path is
     * recorded as the default target of SaveXml(), also when the load fails.
     *
     * @param path  a file's path.
     * @return
     * - 0 if a document is held now, also one without a root element,
     * - 7 if the file cannot be opened for reading ("File not exists :: %s" with the path, level
     * 9),
     * - 22 if it is not well-formed ("Document not parsed successfully :: %s" with the path, level
     *   9); the engine prints its own diagnosis to standard error.
     */
    int ParseXml(std::string path);

    /**
     * Saves the document: indented, in UTF-8, over a file that exists and can be read. A file is
     * never created; make an empty one first. The exception: the engine decodes escapes such as %20
     * in the path, so that a file "x%20y" lets a file "x y" be written, made if need be, and stays
     * as it was.
     *
     * @param path  the file to write, or an empty string for the recorded path. The recorded path
     * is not changed.
     * @return
     * - 0 if the file was written,
     * - 22 if no document is held ("m_pXmlDoc is NULL", level 9),
     * - 7 if the target cannot be opened for reading: "File not exists :: %s" (level 9) with the
     *   argument as it was given, so with an empty string if the recorded path was the target,
     * - -2 if the engine could not write it; nothing is logged. The file may have been truncated.
     */
    int SaveXml(std::string path);

    /**
     * Makes a new document (XML 1.0) with an empty root element named @p rootName.
     *
     * A document that was held is released first, whatever becomes of the call. There is no
     * recorded path: SaveXml() needs one.
     *
     * @param rootName  the root element's name.
     * @return
     * - 0 if the document is held now,
     * - 7 for an empty name ("Invalid root node name :: %s" with the name, level 9); no document is
     *   held,
     * - 22 if the engine cannot make the document ("Unable to create new xml document structure",
     *   level 9), or its root element ("Error creating new root node", level 9): then a document
     *   without a root is held until the next release.
     */
    int CreateNewXmlDoc(std::string rootName);

    /**
     * @return a handle on the root element as it was recorded when the document was loaded or
     *         created; null if there was none or no document is held.
     *
     * The document is not consulted: after RemoveNode() on the root element the handle dangles, and
     * a root element that was added later is not known. FindNode() with the expression "/\*" asks
     * the document.
     */
    CXmlNode GetRootNode();

    /**
     * @param path  a file's path.
     * @return whether the file at @p path can be opened for reading. Nothing is read, created or
     *         changed. A directory can be opened, too.
     */
    bool IsReadable(const std::string& path);
    ///@}

    /**
     * @name Queries
     * The expression is XPath 1.0 and goes to the engine unchanged: "//item" finds every element
     * item, "item" only those right under the context node. No namespace prefix, variable or
     * function is registered. The context node may be a null handle, for expressions that start at
     * the document.
     */
    ///@{

    /**
     * Evaluates @p expression from @p contextNode.
     *
     * @param expression   an XPath expression.
     * @param contextNode  where a relative expression starts; may be null.
     * @return the engine's result (an xmlXPathObjectPtr) of whatever type. The caller owns it and
     *         frees it with xmlXPathFreeObject(). Its nodes are the document's own, except for
     *         namespaces, which die with it. Null
     * - if no document is held ("document object is NULL", level 9),
     * - if the engine makes no context ("Unable to create new XPath context", level 31),
     * - if it cannot evaluate the expression ("Unable to evaluate nodepath :: \"%s\"" with the
     *   expression, level 31).
     */
    _xmlXPathObject* GetNodeSet(std::string expression, CXmlNode contextNode);

    /**
     * @param expression   an XPath expression.
     * @param contextNode  where a relative expression starts; may be null.
     * @return a handle on the first node that @p expression selects, in document order. Null
     * - if GetNodeSet() answers null ("xmlXPathObjectPtr is NULL", level 31, after its own record),
     * - if the result is no node-set or an empty one ("NodeSetVal is NULL", level 31),
     * - if the first node is a namespace, which would not outlive the call.
     */
    CXmlNode FindNode(std::string expression, CXmlNode contextNode);

    /**
     * @param expression   an XPath expression.
     * @param contextNode  where a relative expression starts; may be null.
     * @return handles on the nodes that @p expression selects, in document order; none in the cases
     *         in which FindNode() finds none, with the same records. A namespace is left out ("node
     *         pointer is NULL", level 31).
     *
     * @warning For 255 nodes at most. With 256 and more the call does not return: it fills the list
     * over and over until an exception of the list ends it. Use GetNodeSet() where there can be
     * more:
     *
     * @code
     * xmlXPathObjectPtr result = parser.GetNodeSet("//item", CXmlNode());
     * const int count = result != 0 ? xmlXPathNodeSetGetLength(result->nodesetval) : 0;
     * for (int i = 0; i < count; ++i)
     * {
     *     CXmlNode item(xmlXPathNodeSetItem(result->nodesetval, i));
     * }
     * xmlXPathFreeObject(result);
     * @endcode
     */
    std::list<CXmlNode> FindAllNodes(std::string expression, CXmlNode contextNode);
    ///@}

    /** @name Adding and removing */
    ///@{

    /**
     * Adds an element as the last child of @p parent, as CXmlNode::AddChildNode() does. The
     * document that is held does not matter: the element goes where the parent is.
     *
     * @param parent   the element that gets the new one; may be null.
     * @param name     its name; with an empty one nothing is created.
     * @param content  its text, in which entity references are recognised; may be empty.
     * @return a handle on the new element, or what AddChildNode() answers when it fails; null for a
     *         null @p parent.
     */
    CXmlNode AddNewNode(CXmlNode parent, std::string name, std::string content);

    /**
     * Takes @p node out of its tree and frees it with its attributes and all below it. It need not
     * belong to the document that is held. Every handle on it or below it dangles, the caller's own
     * and the recorded root included.
     *
     * @param node  what to remove; may be null.
     * @return 0, or 22 for a null handle or a kind of node that is refused (see CXmlNode.h);
     * nothing is logged.
     */
    int RemoveNode(CXmlNode node);
    ///@}

private:
    CXmlParser(const CXmlParser&);
    CXmlParser& operator=(const CXmlParser&);

    _xmlDoc* m_pXmlDoc;
    std::string m_strXmlFile;
    CXmlNode m_RootNode;
};

#pragma GCC visibility pop

#endif
