#include "CXMLWriter.h"

#include "KeyPath.h"
#include "KeyPathUpdate.h"
#include "diag/Log.h"
#include "diag/Status.h"

#include <libxml/parser.h>

#include <new>

using namespace kx;

CXMLWriter::CXMLWriter() : m_pXmlDoc(0)
{
    KX_ENTER();
}

CXMLWriter::CXMLWriter(const std::string& path) : m_pXmlDoc(0), m_strXmlFile(path)
{
    KX_LOG_OF(LogLevelTrace, __FUNCTION__, "File Path %s", path.c_str());
    m_pXmlDoc = xmlParseFile(m_strXmlFile.c_str());
    if (m_pXmlDoc == 0)
    {
        KX_ERROR("Pointer to document structure is NULL");
    }
}

CXMLWriter::~CXMLWriter()
{
    KX_LOG(LogLevelTrace, __FUNCTION__, "Destructor");
    if (m_pXmlDoc != 0)
    {
        xmlFreeDoc(m_pXmlDoc);
        m_pXmlDoc = 0;
    }
}

int CXMLWriter::ParseFile(const std::string& path)
{
    KX_ENTER();
    int status = SetPath(path);
    if (m_pXmlDoc != 0)
    {
        xmlFreeDoc(m_pXmlDoc);
        m_pXmlDoc = 0;
    }
    m_pXmlDoc = xmlParseFile(path.c_str());
    if (m_pXmlDoc == 0)
    {
        status = StatusMissing;
        KX_ERROR("Pointer to document structure is NULL");
    }
    KX_LEAVE();
    return status;
}

int CXMLWriter::SetValue(const std::string& key, std::string value)
{
    KX_LOG_OF(LogLevelTrace, __FUNCTION__, "Key %s", key.c_str());
    if (m_pXmlDoc == 0 || key.empty())
    {
        KX_ERROR("Document structure pointer m_pXmlDoc is NULL");
        return StatusBadArgument;
    }
    xmlNode* const root = xmlDocGetRootElement(m_pXmlDoc);
    if (root == 0)
    {
        return StatusMissing;
    }
    const KeySplit split((TextView(key)));
    if (!split.HasRest())
    {
        return StatusBadArgument;
    }
    // Clients take a key of another document's for success with nothing done.
    if (!SameText(root->name, split.First()))
    {
        return StatusOk;
    }
    unsigned int updated = 0;
    const int status = UpdateValues(root, split.Rest(), value.c_str(), updated);
    return updated == 0 ? StatusNotFound : status;
}

int CXMLWriter::SaveData()
{
    KX_ENTER();
    // Engines before 2.13 answer a failure with -1, later ones with other negative numbers.
    const int written = xmlSaveFileEnc(m_strXmlFile.c_str(), m_pXmlDoc, "UTF-8");
    return written < 0 ? StatusNotFound : StatusOk;
}

int CXMLWriter::SetPath(const std::string& path)
{
    if (path.empty())
    {
        return StatusBadArgument;
    }
    m_strXmlFile = path;
    return StatusOk;
}

void CXMLWriter::SetDataPtr(void* document)
{
    // The document held so far is dropped and not freed: a reader may own it.
    m_pXmlDoc = static_cast<xmlDoc*>(document);
    if (m_pXmlDoc == 0)
    {
        KX_ERROR("Data Pointer not set in xml writer");
    }
}

int CXMLWriter::XMLSetValue(xmlNode* node, const std::string& key, std::string& value,
                            unsigned int& updated)
{
    return UpdateValues(node, TextView(key), value.c_str(), updated);
}

extern "C" CXMLWriter* GetCXMLWriterObject(const char* path)
{
    if (path == 0)
    {
        return 0;
    }
    const std::string file(path);
    return new (std::nothrow) CXMLWriter(file);
}

extern "C" CXMLWriter* GetCXMLWriterObjectNoParam()
{
    return new (std::nothrow) CXMLWriter;
}
