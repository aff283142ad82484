// The handle itself, its kind and name, navigation, emptying.

#include "CXmlNode.h"

#include "EngineNode.h"
#include "Handle.h"
#include "diag/Log.h"
#include "diag/Status.h"

using namespace kx;

namespace
{

/** The kinds bear the engine's type numbers, from the first to the last that it knows. */
int TypeOf(const xmlNode* node)
{
    const int number = node != 0 ? static_cast<int>(node->type) : 0;
    return number >= NODE_ELEMENT && number <= NODE_XINCLUDE_END ? number : NODE_NONE;
}

} // namespace

CXmlNode kx::HandleOn(const char* tag, xmlNode* node)
{
    CXmlNode handle;
    Designate(handle, node);
    KX_TRACE_AS(tag, "-");
    return handle;
}

// --- The handle

CXmlNode::CXmlNode() : m_pXmlNode(0)
{
    KX_TRACE_BOTH();
}

CXmlNode::CXmlNode(xmlNode* node) : m_pXmlNode(node)
{
    KX_TRACE_BOTH();
}

CXmlNode::~CXmlNode()
{
    KX_TRACE_BOTH();
}

void CXmlNode::SetXmlNodePtr(xmlNode* node)
{
    KX_TRACE_BOTH();
    m_pXmlNode = node;
}

bool CXmlNode::IsNull()
{
    KX_TRACE_BOTH();
    return m_pXmlNode == 0;
}

int CXmlNode::Type()
{
    KX_TRACE_BOTH();
    return TypeOf(m_pXmlNode);
}

std::string CXmlNode::Name()
{
    KX_TRACE("+");
    std::string name(FromEngine(NameOf(m_pXmlNode)));
    KX_TRACE("-");
    return name;
}

// --- Navigation, from element to element: whatever lies between them is stepped over

CXmlNode CXmlNode::Parent()
{
    KX_TRACE("+");
    xmlNode* const parent = LinkOf(m_pXmlNode, &xmlNode::parent);
    return HandleOn(__FUNCTION__, IsElement(parent) ? parent : 0);
}

CXmlNode CXmlNode::FirstChild()
{
    KX_TRACE("+");
    return HandleOn(__FUNCTION__,
                    ElementFrom(LinkOf(m_pXmlNode, &xmlNode::children), &xmlNode::next));
}

CXmlNode CXmlNode::LastChild()
{
    KX_TRACE("+");
    return HandleOn(__FUNCTION__, ElementFrom(LinkOf(m_pXmlNode, &xmlNode::last), &xmlNode::prev));
}

CXmlNode CXmlNode::NextSibling()
{
    KX_TRACE("+");
    return HandleOn(__FUNCTION__, ElementFrom(LinkOf(m_pXmlNode, &xmlNode::next), &xmlNode::next));
}

CXmlNode CXmlNode::PrevSibling()
{
    KX_TRACE("+");
    return HandleOn(__FUNCTION__, ElementFrom(LinkOf(m_pXmlNode, &xmlNode::prev), &xmlNode::prev));
}

// --- Emptying

int CXmlNode::ClearNode()
{
    KX_TRACE("+");
    int status = StatusMissing;
    if (CanBeCleared(m_pXmlNode))
    {
        RemoveChildren(m_pXmlNode);
        RemoveAttributes(m_pXmlNode);
        status = StatusOk;
    }
    KX_TRACE("-");
    return status;
}
