// The document's life: made, loaded, saved, released.

#include "CXmlParser.h"

#include "EngineNode.h"
#include "diag/Log.h"
#include "diag/Status.h"

#include <libxml/parser.h>

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
        KX_ERROR_AS("CreateNewXmlDoc", "Error creating new root node");
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

} // namespace

// --- Construction and release

CXmlParser::CXmlParser() : m_pXmlDoc(0)
{
    KX_TRACE("+");
    // Deliberately for every later parse, the configuration reader's included.
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
        CleanUpEngine();
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
    const std::string& target = path.empty() ? m_strXmlFile : path;
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
    const bool isReadable = CanBeOpened(path.c_str());
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
