#include "CXmlNode.h"

#include "diag/Log.h"
#include "diag/Status.h"
#include "engine/Edit.h"
#include "engine/Kind.h"
#include "engine/Text.h"

using namespace kx;

namespace
{

/** Text that the engine allocated, or null; freed with the object. */
class EngineText
{
public:
    explicit EngineText(xmlChar* text) : m_text(text) {}
    ~EngineText()
    {
        if (m_text != 0)
        {
            xmlFree(m_text);
        }
    }

    bool IsNull() const { return m_text == 0; }
    const char* Get() const { return FromEngine(m_text); }

private:
    EngineText(const EngineText&);
    EngineText& operator=(const EngineText&);

    xmlChar* const m_text;
};

} // namespace

int CXmlNode::AddNewAttribute(std::string name, std::string value)
{
    KX_ENTER();
    int status = StatusMissing;
    if (m_pXmlNode == 0)
    {
        KX_ERROR("Node ptr is NULL");
    }
    else if (!AddAttribute(m_pXmlNode, name, value))
    {
        KX_ERROR_OF("Unable to add new property :: %s", name.c_str());
    }
    else
    {
        status = StatusOk;
    }
    KX_LEAVE();
    return status;
}

int CXmlNode::GetAttributeValue(std::string name, std::string& value)
{
    KX_ENTER();
    int status = StatusMissing;
    if (m_pXmlNode == 0)
    {
        KX_ERROR("Node ptr is NULL");
    }
    else
    {
        const EngineText text(xmlGetProp(m_pXmlNode, ToEngine(name)));
        if (text.IsNull())
        {
            KX_ERROR_OF("Attribute key :: %s not found", name.c_str());
        }
        else
        {
            value = text.Get();
            status = StatusOk;
        }
    }
    KX_LEAVE();
    return status;
}

std::list<CXmlAttr> CXmlNode::GetAttributeItems()
{
    KX_ENTER();
    std::list<CXmlAttr> items;
    std::string value;
    for (const xmlAttr* attribute = AttributesOf(m_pXmlNode); attribute != 0;
         attribute = attribute->next)
    {
        // An attribute made without a value shows the one before it: clients rely on it.
        if (attribute->children != 0)
        {
            value = FromEngine(attribute->children->content);
        }
        items.push_back(CXmlAttr(FromEngine(attribute->name), value));
    }
    KX_LEAVE();
    return items;
}

// The next two do nothing and still answer success: clients take an error for a damaged document.

int CXmlNode::RemoveAttribute(std::string /*name*/)
{
    KX_ENTER();
    KX_LOG(LogLevelWarning, __FUNCTION__,
           "RemoveAttribute feature is not available, Reason: This API is not supported by "
           "libxml2 present in QNX650");
    KX_LEAVE();
    return StatusOk;
}

int CXmlNode::SetAttributeValue(std::string /*name*/, std::string /*value*/)
{
    KX_ENTER();
    KX_LOG(LogLevelWarning, __FUNCTION__,
           "SetAttributeValue feature is not available, Reason: This API is not supported by "
           "libxml2 present in QNX650");
    KX_LEAVE();
    return StatusOk;
}
