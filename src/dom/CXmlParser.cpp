// The document's life: made, loaded, saved, released.

#include "CXmlParser.h"

#include "EngineNode.h"
#include "diag/Log.h"
#include "diag/Status.h"

#include <libxml/parser.h>

#include <fstream>

// Later engines call the blanks default deprecated; there is no other that acts on the whole
// process.
#pragma GCC diagnostic ignored "-Wdeprecated-declarations"

using namespace kx;

namespace
{

/** Gives @p document a root element, on behalf of CreateNewXmlDoc, and sets @p handle on it. */
int CreateRoot(xmlDoc* document, const std::string& name, CXmlNode& handle)
{
    xmlNode* const root = WholeElement(xmlNewNode(0, ToEngine(name)));
    if (root == 0)
    {
        // The document stays held without a root until the next release.
        KX_ERROR_AS("CreateNewXmlDoc", "Error creating new root node");
        return StatusMissing;
    }
    xmlDocSetRootElement(document, root);
    handle.SetXmlNodePtr(root);
    return StatusOk;
}

} // namespace

// --- Construction and release

CXmlParser::CXmlParser() : m_pXmlDoc(0)
{
    KX_TRACE("+");
    // Deliberately for every later parse of the process, the configuration reader's included.
    xmlKeepBlanksDefault(0);
    KX_TRACE("-");
}

CXmlParser::~CXmlParser()
{
    KX_TRACE("+");
    ClearDocument();
    KX_TRACE("-");
}

void CXmlParser::ClearDocument()
{
    if (m_pXmlDoc != 0)
    {
        xmlFreeDoc(m_pXmlDoc);
        m_pXmlDoc = 0;
        // Clients count on each release to give the engine's global tables back.
        xmlCleanupParser();
    }
    m_RootNode.m_pXmlNode = 0;
    m_strXmlFile.clear();
}

// --- Files

int CXmlParser::ParseXml(std::string path)
{
    KX_TRACE("+");
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
    KX_TRACE("-");
    return status;
}

int CXmlParser::SaveXml(std::string path)
{
    KX_TRACE("+");
    int status = StatusOk;
    const std::string target = path.empty() ? m_strXmlFile : path;
    if (m_pXmlDoc == 0)
    {
        KX_ERROR("m_pXmlDoc is NULL");
        status = StatusMissing;
    }
    else if (!IsReadable(target))
    {
        // The path as it was given: clients tell by the empty one that the recorded path failed.
        KX_ERROR_OF("File not exists :: %s", path.c_str());
        status = StatusBadArgument;
    }
    else if (xmlSaveFormatFileEnc(target.c_str(), m_pXmlDoc, "UTF-8", 1) < 0)
    {
        status = StatusNotFound;
    }
    KX_TRACE("-");
    return status;
}

bool CXmlParser::IsReadable(const std::string& path)
{
    KX_TRACE("+");
    std::ifstream file(path.c_str());
    const bool isReadable = file.is_open();
    if (isReadable)
    {
        file.close();
    }
    KX_TRACE("-");
    return isReadable;
}

// --- A new document, the root

int CXmlParser::CreateNewXmlDoc(std::string rootName)
{
    KX_TRACE("+");
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
    KX_TRACE("-");
    return status;
}

CXmlNode CXmlParser::GetRootNode()
{
    KX_TRACE("+");
    CXmlNode root(m_RootNode);
    KX_TRACE("-");
    return root;
}
