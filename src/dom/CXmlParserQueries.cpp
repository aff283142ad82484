// Queries by XPath; adding and removing nodes.

#include "CXmlParser.h"

#include "EngineNode.h"
#include "Handle.h"
#include "diag/Log.h"
#include "diag/Status.h"

#include <libxml/xpath.h>

using namespace kx;

namespace
{

/**
 * @return the nodes of @p result, at least one, on behalf of the operation @p tag; or null, with
 * the record that says why: no result, or a number, say, or an empty selection.
 */
const xmlNodeSet* NodesOf(const xmlXPathObject* result, const char* tag)
{
    if (result == 0)
    {
        KX_XPATH_AS(tag, "xmlXPathObjectPtr is NULL");
        return 0;
    }
    const xmlNodeSet* const nodes = result->nodesetval;
    if (nodes == 0 || nodes->nodeNr < 1)
    {
        KX_XPATH_AS(tag, "NodeSetVal is NULL");
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
            KX_XPATH_AS("FindAllNodes", "node pointer is NULL");
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

// --- Queries

xmlXPathObject* CXmlParser::GetNodeSet(std::string expression, CXmlNode contextNode)
{
    KX_TRACE("+");
    xmlXPathObject* result = 0;
    xmlXPathContext* context = 0;
    if (m_pXmlDoc == 0)
    {
        KX_ERROR("document object is NULL");
    }
    else if ((context = xmlXPathNewContext(m_pXmlDoc)) == 0)
    {
        KX_XPATH("Unable to create new XPath context");
    }
    else
    {
        context->node = contextNode.m_pXmlNode;
        result = xmlXPathEvalExpression(ToEngine(expression), context);
        if (result == 0)
        {
            KX_XPATH_OF("Unable to evaluate nodepath :: \"%s\"", expression.c_str());
        }
        xmlXPathFreeContext(context);
    }
    KX_TRACE("-");
    return result;
}

CXmlNode CXmlParser::FindNode(std::string expression, CXmlNode contextNode)
{
    KX_TRACE("+");
    CXmlNode first;
    xmlXPathObject* const result = GetNodeSet(expression, contextNode);
    const xmlNodeSet* const nodes = NodesOf(result, "FindNode");
    if (nodes != 0)
    {
        first.SetXmlNodePtr(EntryOf(nodes, 0));
    }
    FreeResult(result);
    KX_TRACE("-");
    return first;
}

std::list<CXmlNode> CXmlParser::FindAllNodes(std::string expression, CXmlNode contextNode)
{
    KX_TRACE("+");
    std::list<CXmlNode> found;
    xmlXPathObject* const result = GetNodeSet(expression, contextNode);
    const xmlNodeSet* const nodes = NodesOf(result, "FindAllNodes");
    if (nodes != 0)
    {
        AppendEntries(nodes, found);
    }
    FreeResult(result);
    KX_TRACE("-");
    return found;
}

// --- Adding and removing

CXmlNode CXmlParser::AddNewNode(CXmlNode parent, std::string name, std::string content)
{
    KX_TRACE("+");
    CXmlNode child;
    if (!parent.IsNull())
    {
        child = parent.AddChildNode(name, content);
    }
    KX_TRACE("-");
    return child;
}

int CXmlParser::RemoveNode(CXmlNode node)
{
    KX_TRACE("+");
    int status = StatusMissing;
    if (!node.IsNull() && CanBeRemoved(node.m_pXmlNode))
    {
        FreeFromTree(node.m_pXmlNode);
        status = StatusOk;
    }
    KX_TRACE("-");
    return status;
}
