// The handle itself, its kind and name, navigation, emptying.

#include "CXmlNode.h"

#include "EngineNode.h"
#include "Handle.h"
#include "diag/Log.h"
#include "diag/Status.h"

using namespace kx;

namespace
{

/** What Type() answers for the engine's type numbers, from 1 on. */
const int kNodeTypes[] = {NODE_ELEMENT,
                          NODE_ATTRIBUTE,
                          NODE_TEXT,
                          NODE_CDATA_SECTION,
                          NODE_ENTITY_REF,
                          NODE_ENTITY,
                          NODE_PI,
                          NODE_COMMENT,
                          NODE_DOCUMENT,
                          NODE_DOCUMENT_TYPE,
                          NODE_DOCUMENT_FRAG,
                          NODE_NOTATION,
                          NODE_HTML_DOCUMENT,
                          NODE_DTD,
                          NODE_ELEMENT_DECL,
                          NODE_ATTRIBUTE_DECL,
                          NODE_ENTITY_DECL,
                          NODE_NAMESPACE_DECL,
                          NODE_XINCLUDE_START,
                          NODE_XINCLUDE_END};
const int kNodeTypeCount = sizeof kNodeTypes / sizeof kNodeTypes[0];

int TypeOf(const xmlNode* node)
{
    const int number = node != 0 ? static_cast<int>(node->type) : 0;
    return number >= 1 && number <= kNodeTypeCount ? kNodeTypes[number - 1] : NODE_NONE;
}

} // namespace

// --- The handle

CXmlNode::CXmlNode() : m_pXmlNode(0)
{
    KX_TRACE("+");
    KX_TRACE("-");
}

CXmlNode::CXmlNode(xmlNode* node) : m_pXmlNode(node)
{
    KX_TRACE("+");
    KX_TRACE("-");
}

CXmlNode::~CXmlNode()
{
    KX_TRACE("+");
    KX_TRACE("-");
}

void CXmlNode::SetXmlNodePtr(xmlNode* node)
{
    KX_TRACE("+");
    m_pXmlNode = node;
    KX_TRACE("-");
}

bool CXmlNode::IsNull()
{
    KX_TRACE("+");
    const bool isNull = m_pXmlNode == 0;
    KX_TRACE("-");
    return isNull;
}

int CXmlNode::Type()
{
    KX_TRACE("+");
    const int type = TypeOf(m_pXmlNode);
    KX_TRACE("-");
    return type;
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
    CXmlNode parent;
    xmlNode* const found = LinkOf(m_pXmlNode, &xmlNode::parent);
    Designate(parent, IsElement(found) ? found : 0);
    KX_TRACE("-");
    return parent;
}

CXmlNode CXmlNode::FirstChild()
{
    KX_TRACE("+");
    CXmlNode child;
    Designate(child, ElementFrom(LinkOf(m_pXmlNode, &xmlNode::children), &xmlNode::next));
    KX_TRACE("-");
    return child;
}

CXmlNode CXmlNode::LastChild()
{
    KX_TRACE("+");
    CXmlNode child;
    Designate(child, ElementFrom(LinkOf(m_pXmlNode, &xmlNode::last), &xmlNode::prev));
    KX_TRACE("-");
    return child;
}

CXmlNode CXmlNode::NextSibling()
{
    KX_TRACE("+");
    CXmlNode sibling;
    Designate(sibling, ElementFrom(LinkOf(m_pXmlNode, &xmlNode::next), &xmlNode::next));
    KX_TRACE("-");
    return sibling;
}

CXmlNode CXmlNode::PrevSibling()
{
    KX_TRACE("+");
    CXmlNode sibling;
    Designate(sibling, ElementFrom(LinkOf(m_pXmlNode, &xmlNode::prev), &xmlNode::prev));
    KX_TRACE("-");
    return sibling;
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
