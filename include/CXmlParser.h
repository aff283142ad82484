#ifndef KX_CXMLPARSER_H
#define KX_CXMLPARSER_H

/// @file CXmlParser.h
/// A whole document: load, create, query, change and save it.
///
/// docs/handbook/document-toolkit.md lists unexpected behavior. The log records of each operation
/// are listed in docs/handbook/status-codes-and-messages.md.

#include "CXmlNode.h"

#include <list>
#include <string>

struct _xmlDoc;
struct _xmlXPathObject;

#pragma GCC visibility push(default)

/// Owns at most one document.
///
/// Every handle that a CXmlParser returns points into its document and dangles after the document
/// is released: by ClearDocument(), ParseXml(), CreateNewXmlDoc() or the destructor.
///
/// Two calls act on the whole process and must not overlap with any other use of the engine (see
/// docs/handbook/threads.md):
/// - The constructor calls xmlKeepBlanksDefault(0): every later parse of the thread, also by
///   CXMLReader and CXMLWriter, drops white space between elements.
/// - Each release of a document calls xmlCleanupParser(). Other documents and later parses stay
///   usable, and blanks are still dropped.
///
/// Otherwise a CXmlParser is used by one thread at a time. It cannot be copied. Operations throw
/// only what strings and lists throw: std::bad_alloc and std::length_error.
///
///     CXmlParser parser;
///     if (parser.ParseXml("/etc/device.xml") == 0)
///     {
///         CXmlNode port = parser.FindNode("/cfg/net/port", CXmlNode());
///         port.SetContent("8080");
///         parser.SaveXml("");
///     }
class CXmlParser
{
public:
    /// @name Life of the document
    /// @{

    /// Creates an object without a document.
    CXmlParser();

    /// Releases the document as ClearDocument() does.
    ~CXmlParser();

    /// Releases the document, if one is held, and forgets the recorded path and root.
    void ClearDocument();

    /// Loads the file at path. Before that, whether or not the load succeeds, it releases the
    /// document held and records path. Returns
    /// - 0 if the file was loaded; short of memory, the document can lack its root element,
    /// - 7 if it cannot be opened for reading; no document is held,
    /// - 22 if it is not well-formed; no document is held, and the engine prints its diagnosis to
    ///   standard error.
    int ParseXml(std::string path);

    /// Saves the document to path, or to the recorded path if path is empty; indented, in UTF-8.
    /// Never creates a file: the target must exist. (Names with escapes such as "%20" are an
    /// exception: see docs/handbook/limits.md.) The recorded path does not change. Returns
    /// - 0 if the file was written,
    /// - 22 if there is no document,
    /// - 7 if the target cannot be opened for reading,
    /// - -2 if the engine could not write it; its old content can be lost.
    int SaveXml(std::string path);

    /// Creates a document with an empty root element. Before that, whether or not the call
    /// succeeds, it releases the document held and forgets the recorded path. Returns
    /// - 0 if the document was created,
    /// - 7 if rootName is empty; no document is held,
    /// - 22 if the engine runs out of memory; no document is held, or one without a root element.
    int CreateNewXmlDoc(std::string rootName);

    /// Returns the root element that was recorded when the document was loaded or created, or a
    /// null handle if there was none. After that element was removed the handle dangles, and a root
    /// element that was added later is not found: `FindNode("/*", CXmlNode())` finds it.
    CXmlNode GetRootNode();

    /// Returns whether the file at path can be opened for reading, as a directory can.
    bool IsReadable(const std::string& path);
    /// @}

    /// @name Queries
    /// The expression is XPath 1.0: "//item" selects every item of the document, "item" those
    /// right under contextNode. No namespace prefix, variable or function is registered.
    /// contextNode may be null for expressions that start at the document.
    /// @{

    /// Returns the result of the expression (an xmlXPathObjectPtr) of any type. The caller frees it
    /// with xmlXPathFreeObject(). Its nodes belong to the document, except for namespaces, which
    /// are freed with the result. Returns null if there is no document, the expression cannot be
    /// evaluated, or the engine runs out of memory.
    _xmlXPathObject* GetNodeSet(std::string expression, CXmlNode contextNode);

    /// Returns the first node, in document order, that the expression selects. Returns a null
    /// handle if it selects none or is not a node set, if the first node is a namespace (even if
    /// others follow), and if GetNodeSet() returns null.
    CXmlNode FindNode(std::string expression, CXmlNode contextNode);

    /// Returns the nodes that the expression selects, in document order and without namespaces.
    /// Returns none if it selects none or is not a node set, and if GetNodeSet() returns null.
    ///
    /// DOES NOT RETURN for 256 nodes or more: the list grows until an exception of the list leaves
    /// the call, and the result of GetNodeSet() stays allocated. If there can be more than 255:
    ///
    ///     xmlXPathObjectPtr result = parser.GetNodeSet("//item", CXmlNode());
    ///     const int count = result != 0 ? xmlXPathNodeSetGetLength(result->nodesetval) : 0;
    ///     for (int i = 0; i < count; ++i)
    ///     {
    ///         CXmlNode item(xmlXPathNodeSetItem(result->nodesetval, i));
    ///     }
    ///     xmlXPathFreeObject(result);
    std::list<CXmlNode> FindAllNodes(std::string expression, CXmlNode contextNode);
    /// @}

    /// @name Adding and removing
    /// The nodes need not belong to the document that is held.
    /// @{

    /// Returns the result of AddChildNode() on parent, or a null handle if parent is null.
    CXmlNode AddNewNode(CXmlNode parent, std::string name, std::string content);

    /// Frees node with its attributes and subtree. Returns 0, or 22 for a null handle or a kind
    /// that is refused. Handles on freed nodes dangle, node itself and the recorded root included.
    int RemoveNode(CXmlNode node);
    /// @}

private:
    CXmlParser(const CXmlParser&);
    CXmlParser& operator=(const CXmlParser&);

    _xmlDoc* m_pXmlDoc;
    std::string m_strXmlFile;
    CXmlNode m_RootNode;
};

#pragma GCC visibility pop

#endif
