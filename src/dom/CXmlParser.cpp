#include "CXmlParser.h"

#include "Handle.h"
#include "diag/Log.h"
#include "diag/Status.h"
#include "engine/Edit.h"
#include "engine/Kind.h"
#include "engine/Query.h"
#include "engine/Text.h"

#include <libxml/parser.h>
#include <libxml/xpath.h>

#include <fcntl.h>
#include <unistd.h>

// Later engines call the blanks default deprecated; there is no other for parses by xmlParseFile.
#pragma GCC diagnostic ignored "-Wdeprecated-declarations"

using namespace kx;

namespace
{

// The target has no such flag and needs none; nor has a 64-bit platform a use for it.
#ifdef O_LARGEFILE
const int kOpenForReading = O_RDONLY | O_LARGEFILE;
#else
const int kOpenForReading = O_RDONLY;
#endif

/** By the system's own call: a file stream would do no more, and takes more code. */
bool CanBeOpened(const char* path)
{
    const int file = open(path, kOpenForReading);
    if (file < 0)
    {
        return false;
    }
    close(file);
    return true;
}

/** Gives @p document a root element, on behalf of CreateNewXmlDoc, and sets @p handle on it. */
int CreateRoot(xmlDoc* document, const std::string& name, CXmlNode& handle)
{
    xmlNode* const root = WholeElement(xmlNewNode(0, ToEngine(name)));
    if (root == 0)
    {
        // The document stays held without a root until the next release.
        KX_LOG(LogLevelError, "CreateNewXmlDoc", "Error creating new root node");
        return StatusMissing;
    }
    xmlDocSetRootElement(document, root);
    handle.SetXmlNodePtr(root);
    return StatusOk;
}

/**
 * Runs the engine's global cleanup. From 2.14 on it also forgets whether blanks are kept, which the
 * construction of a parser has settled for the whole process: so that is put back.
 */
void CleanUpEngine()
{
#if LIBXML_VERSION >= 21400
    const int keepBlanks = xmlKeepBlanksDefault(0);
    xmlCleanupParser();
    xmlKeepBlanksDefault(keepBlanks);
#else
    xmlCleanupParser();
#endif
}

/**
 * @return the nodes of @p result, at least one, on behalf of the operation @p tag; or null, with
 * the record that says why: no result, or a number, say, or an empty selection.
 */
const xmlNodeSet* NodesOf(const xmlXPathObject* result, const char* tag)
{
    if (result == 0)
    {
        KX_LOG(LogLevelXPath, tag, "xmlXPathObjectPtr is NULL");
        return 0;
    }
    const xmlNodeSet* const nodes = result->nodesetval;
    if (nodes == 0 || nodes->nodeNr < 1)
    {
        KX_LOG(LogLevelXPath, tag, "NodeSetVal is NULL");
        return 0;
    }
    return nodes;
}

/** @return an entry, or null for a namespace: that is a copy which dies with the result. */
xmlNode* EntryOf(const xmlNodeSet* nodes, int index)
{
    xmlNode* const entry = nodes->nodeTab[index];
    return entry != 0 && entry->type != XML_NAMESPACE_DECL ? entry : 0;
}

/**
 * Appends a handle on each entry, on behalf of FindAllNodes.
 *
 * The index is a byte, deliberately: up to 255 nodes are listed, and from 256 on the walk starts
 * over until memory runs out. The exception that ends it leaves the XPath result allocated.
 */
void AppendEntries(const xmlNodeSet* nodes, std::list<CXmlNode>& found)
{
    unsigned char index = 0;
    do
    {
        xmlNode* const entry = EntryOf(nodes, index);
        if (entry != 0)
        {
            found.push_back(CXmlNode(entry));
        }
        else
        {
            KX_LOG(LogLevelXPath, "FindAllNodes", "node pointer is NULL");
        }
        index = static_cast<unsigned char>(index + 1);
    } while (index < nodes->nodeNr);
}

/** Frees @p result; without one the engine is not called. */
void FreeResult(xmlXPathObject* result)
{
    if (result != 0)
    {
        xmlXPathFreeObject(result);
    }
}

} // namespace

// --- Construction and release

CXmlParser::CXmlParser() : m_pXmlDoc(0)
{
    KX_ENTER();
    // Deliberately for every later parse, the configuration reader's included.
    xmlKeepBlanksDefault(0);
    KX_LEAVE();
}

CXmlParser::~CXmlParser()
{
    KX_ENTER();
    ClearDocument();
    KX_LEAVE();
}

void CXmlParser::ClearDocument()
{
    if (m_pXmlDoc != 0)
    {
        xmlFreeDoc(m_pXmlDoc);
        m_pXmlDoc = 0;
        // Clients count on each release to give the engine's global tables back.
        CleanUpEngine();
    }
    m_RootNode.m_pXmlNode = 0;
    m_strXmlFile.clear();
}

// --- Files

int CXmlParser::ParseXml(std::string path)
{
    KX_ENTER();
    int status = StatusOk;
    ClearDocument();
    m_strXmlFile = path;
    if (!IsReadable(m_strXmlFile))
    {
        KX_ERROR_OF("File not exists :: %s", path.c_str());
        status = StatusBadArgument;
    }
    else if ((m_pXmlDoc = xmlParseFile(m_strXmlFile.c_str())) == 0)
    {
        KX_ERROR_OF("Document not parsed successfully :: %s", path.c_str());
        status = StatusMissing;
    }
    else
    {
        m_RootNode.SetXmlNodePtr(xmlDocGetRootElement(m_pXmlDoc));
    }
    KX_LEAVE();
    return status;
}

int CXmlParser::SaveXml(std::string path)
{
    KX_ENTER();
    int status = StatusOk;
    const std::string& target = path.empty() ? m_strXmlFile : path;
    if (m_pXmlDoc == 0)
    {
        KX_ERROR("m_pXmlDoc is NULL");
        status = StatusMissing;
    }
    else if (!IsReadable(target))
    {
        // The path as it was given: an empty one shows clients that the recorded path failed.
        KX_ERROR_OF("File not exists :: %s", path.c_str());
        status = StatusBadArgument;
    }
    else if (xmlSaveFormatFileEnc(target.c_str(), m_pXmlDoc, "UTF-8", 1) < 0)
    {
        status = StatusNotFound;
    }
    KX_LEAVE();
    return status;
}

bool CXmlParser::IsReadable(const std::string& path)
{
    KX_ENTER();
    const bool isReadable = CanBeOpened(path.c_str());
    KX_LEAVE();
    return isReadable;
}

// --- A new document, the root

int CXmlParser::CreateNewXmlDoc(std::string rootName)
{
    KX_ENTER();
    int status = StatusMissing;
    ClearDocument();
    if (rootName.empty())
    {
        KX_ERROR_OF("Invalid root node name :: %s", rootName.c_str());
        status = StatusBadArgument;
    }
    else if ((m_pXmlDoc = xmlNewDoc(ToEngine("1.0"))) == 0)
    {
        KX_ERROR("Unable to create new xml document structure");
    }
    else
    {
        status = CreateRoot(m_pXmlDoc, rootName, m_RootNode);
    }
    KX_LEAVE();
    return status;
}

CXmlNode CXmlParser::GetRootNode()
{
    KX_ENTER();
    CXmlNode root(m_RootNode);
    KX_LEAVE();
    return root;
}

// --- Queries

xmlXPathObject* CXmlParser::GetNodeSet(std::string expression, CXmlNode contextNode)
{
    KX_ENTER();
    xmlXPathObject* result = 0;
    xmlXPathContext* context = 0;
    if (m_pXmlDoc == 0)
    {
        KX_ERROR("document object is NULL");
    }
    else if ((context = xmlXPathNewContext(m_pXmlDoc)) == 0)
    {
        KX_LOG(LogLevelXPath, __FUNCTION__, "Unable to create new XPath context");
    }
    else
    {
        context->node = contextNode.m_pXmlNode;
        if (QueryEnds(context, expression.c_str()))
        {
            result = xmlXPathEvalExpression(ToEngine(expression), context);
        }
        if (result == 0)
        {
            KX_LOG_OF(LogLevelXPath, __FUNCTION__, "Unable to evaluate nodepath :: \"%s\"",
                      expression.c_str());
        }
        xmlXPathFreeContext(context);
    }
    KX_LEAVE();
    return result;
}

CXmlNode CXmlParser::FindNode(std::string expression, CXmlNode contextNode)
{
    KX_ENTER();
    CXmlNode first;
    xmlXPathObject* const result = GetNodeSet(expression, contextNode);
    const xmlNodeSet* const nodes = NodesOf(result, "FindNode");
    if (nodes != 0)
    {
        first.SetXmlNodePtr(EntryOf(nodes, 0));
    }
    FreeResult(result);
    KX_LEAVE();
    return first;
}

std::list<CXmlNode> CXmlParser::FindAllNodes(std::string expression, CXmlNode contextNode)
{
    KX_ENTER();
    std::list<CXmlNode> found;
    xmlXPathObject* const result = GetNodeSet(expression, contextNode);
    const xmlNodeSet* const nodes = NodesOf(result, "FindAllNodes");
    if (nodes != 0)
    {
        AppendEntries(nodes, found);
    }
    FreeResult(result);
    KX_LEAVE();
    return found;
}

// --- Adding and removing

CXmlNode CXmlParser::AddNewNode(CXmlNode parent, std::string name, std::string content)
{
    KX_ENTER();
    CXmlNode child;
    if (!parent.IsNull())
    {
        child = parent.AddChildNode(name, content);
    }
    KX_LEAVE();
    return child;
}

int CXmlParser::RemoveNode(CXmlNode node)
{
    KX_ENTER();
    int status = StatusMissing;
    if (!node.IsNull() && CanBeRemoved(node.m_pXmlNode))
    {
        FreeFromTree(node.m_pXmlNode);
        status = StatusOk;
    }
    KX_LEAVE();
    return status;
}
