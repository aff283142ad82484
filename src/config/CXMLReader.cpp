#include "CXMLReader.h"

#include "KeyPath.h"
#include "KeyPathLookup.h"
#include "diag/Log.h"
#include "diag/Status.h"

#include <libxml/parser.h>

#include <new>

using namespace kx;

namespace
{

int FindValues(xmlDoc* document, TextView key, std::string& value)
{
    const xmlNode* const root = xmlDocGetRootElement(document);
    if (root == 0)
    {
        KX_LOG(LogLevelError, "GetValue", "Root Node ptr is NULL");
        return StatusMissing;
    }
    const KeySplit split(key);
    if (!split.HasRest())
    {
        return StatusBadArgument;
    }
    // Clients take a key of another document's for success with nothing in it.
    if (!SameText(root->name, split.First()))
    {
        return StatusOk;
    }
    unsigned int found = 0;
    AppendValues(root, split.Rest(), value, found);
    return found != 0 ? StatusOk : StatusNotFound;
}

} // namespace

CXMLReader::CXMLReader() : m_pXmlDoc(0)
{
}

CXMLReader::CXMLReader(const std::string& path) : m_pXmlDoc(0)
{
    KX_LOG_OF(LogLevelTrace, __FUNCTION__, "File Path %s", path.c_str());
    m_pXmlDoc = xmlParseFile(path.c_str());
    if (m_pXmlDoc == 0)
    {
        KX_ERROR("Pointer to document structure is NULL");
    }
}

CXMLReader::~CXMLReader()
{
    KX_LOG(LogLevelTrace, __FUNCTION__, "Destructor");
    if (m_pXmlDoc != 0)
    {
        xmlFreeDoc(m_pXmlDoc);
        m_pXmlDoc = 0;
    }
}

int CXMLReader::ParseFile(const std::string& path)
{
    KX_ENTER();
    int status = StatusOk;
    // The document held so far is overwritten and not freed: clients may still work on it.
    m_pXmlDoc = xmlParseFile(path.c_str());
    if (m_pXmlDoc == 0)
    {
        KX_ERROR("Pointer to document structure is NULL");
        status = StatusMissing;
    }
    KX_LEAVE();
    return status;
}

std::string CXMLReader::GetValue(const std::string& key)
{
    KX_LOG_OF(LogLevelTrace, __FUNCTION__, "Key %s", key.c_str());
    std::string result;
    if (m_pXmlDoc == 0 || key.empty())
    {
        KX_ERROR("Document structure pointer m_pXmlDoc is NULL");
        return result;
    }
    const xmlNode* const root = xmlDocGetRootElement(m_pXmlDoc);
    const KeySplit split((TextView(key)));
    if (root != 0 && split.HasRest() && SameText(root->name, split.First()))
    {
        CollectValues(root, split.Rest(), result);
    }
    KX_VALUE("Parsed Value :: %s", result.c_str());
    return result;
}

int CXMLReader::GetValue(const std::string& key, std::string& value)
{
    if (&key == &value)
    {
        // The lookup works on the key's own bytes, which must not be those that it appends to.
        return CXMLReader::GetValue(std::string(key), value);
    }
    KX_ENTER();
    if (m_pXmlDoc == 0 || key.empty())
    {
        KX_ERROR("Document structure pointer m_pXmlDoc is NULL");
        KX_LEAVE();
        return StatusMissing;
    }
    KX_VALUE("Key is %s", key.c_str());
    const int status = FindValues(m_pXmlDoc, TextView(key), value);
    KX_LOG_EITHER(LogLevelValue, LogLevelTrace)
    {
        KX_VALUE("Parsed Value :: %s", value.c_str());
        KX_LEAVE();
    }
    return status;
}

void* CXMLReader::GetDataPtr()
{
    return m_pXmlDoc;
}

std::string CXMLReader::XMLGetValue(xmlNode* node, const std::string& key)
{
    std::string result;
    CollectValues(node, TextView(key), result);
    return result;
}

int CXMLReader::XMLGetValue(xmlNode* node, const std::string& key, std::string& value,
                            unsigned int& found)
{
    return &key == &value ? AppendValues(node, TextView(std::string(key)), value, found)
                          : AppendValues(node, TextView(key), value, found);
}

extern "C" CXMLReader* GetCXMLReaderObject(const char* path)
{
    if (path == 0)
    {
        return 0;
    }
    const std::string file(path);
    return new (std::nothrow) CXMLReader(file);
}
