#include "CXmlNode.h"

#include "Handle.h"
#include "diag/Log.h"
#include "diag/Status.h"
#include "engine/Edit.h"
#include "engine/Node.h"
#include "engine/OldEngine.h"

// CXmlNodeAttributes.cpp has the operations on attributes.

using namespace kx;

namespace
{

/** The kinds bear the engine's type numbers, from the first to the last that it knows. */
int TypeOf(const xmlNode* node)
{
    const int number = node != 0 ? static_cast<int>(node->type) : 0;
    return number >= NODE_ELEMENT && number <= NODE_XINCLUDE_END ? number : NODE_NONE;
}

/**
 * @return the first of @p child and the children after it under @p node that bears @p name.
 *
 * It is the node that must be an element, not the child: clients find text and comments under the
 * engine's names for them, and nothing under a document.
 */
xmlNode* NamedFrom(const xmlNode* node, xmlNode* child, const std::string& name)
{
    if (!IsElement(node))
    {
        return 0;
    }
    while (child != 0 && !SameText(NameOf(child), name))
    {
        child = child->next;
    }
    return child;
}

xmlNode* NewChild(xmlNode* parent, const std::string& name, const std::string& content)
{
    return WholeElement(NewElement(parent->doc, NamespaceOf(parent), ToEngine(name),
                                   content.empty() ? 0 : ToEngine(content)));
}

/** Links @p child by hand: the engine's own call would merge and reject by kind. */
void LinkLast(xmlNode* parent, xmlNode* child)
{
    child->type = XML_ELEMENT_NODE;
    child->parent = parent;
    child->doc = parent->doc;
    child->prev = parent->last;
    if (parent->children == 0)
    {
        parent->children = child;
    }
    else
    {
        parent->last->next = child;
    }
    parent->last = child;
}

/** @return the new element, linked as the last child of @p parent, or null. */
xmlNode* AppendChild(xmlNode* parent, const std::string& name, const std::string& content)
{
    xmlNode* const child = NewChild(parent, name, content);
    if (child != 0)
    {
        LinkLast(parent, child);
    }
    return child;
}

/** @return the new element, linked by the engine after the last sibling of @p node, or null. */
xmlNode* AppendSibling(xmlNode* node, const std::string& name, const std::string& content)
{
    xmlNode* const sibling = WholeElement(xmlNewNode(0, ToEngine(name)));
    if (sibling == 0)
    {
        return 0;
    }
    if (!content.empty())
    {
        SetContent(sibling, ToEngine(content));
    }
    xmlNode* const linked = xmlAddSibling(node, sibling);
    if (linked == 0)
    {
        xmlFreeNode(sibling);
    }
    return linked;
}

} // namespace

CXmlNode kx::LeaveWithHandle(const char* tag, xmlNode* node)
{
    CXmlNode handle;
    SetIfFound(handle, node);
    KX_TRACE(LogReturn, tag);
    return handle;
}

// --- The handle

CXmlNode::CXmlNode() : m_pXmlNode(0)
{
    KX_ENTER_AND_LEAVE();
}

CXmlNode::CXmlNode(xmlNode* node) : m_pXmlNode(node)
{
    KX_ENTER_AND_LEAVE();
}

CXmlNode::~CXmlNode()
{
    KX_ENTER_AND_LEAVE();
}

void CXmlNode::SetXmlNodePtr(xmlNode* node)
{
    KX_ENTER_AND_LEAVE();
    m_pXmlNode = node;
}

bool CXmlNode::IsNull()
{
    KX_ENTER_AND_LEAVE();
    return m_pXmlNode == 0;
}

int CXmlNode::Type()
{
    KX_ENTER_AND_LEAVE();
    return TypeOf(m_pXmlNode);
}

std::string CXmlNode::Name()
{
    KX_ENTER();
    std::string name(FromEngine(NameOf(m_pXmlNode)));
    KX_LEAVE();
    return name;
}

// --- Navigation, from element to element: everything between them is stepped over

CXmlNode CXmlNode::Parent()
{
    KX_ENTER();
    xmlNode* const parent = LinkOf(m_pXmlNode, &xmlNode::parent);
    return LeaveWithHandle(__FUNCTION__, IsElement(parent) ? parent : 0);
}

CXmlNode CXmlNode::FirstChild()
{
    KX_ENTER();
    return LeaveWithHandle(__FUNCTION__, ElementFrom(LinkOf(m_pXmlNode, &xmlNode::children)));
}

CXmlNode CXmlNode::LastChild()
{
    KX_ENTER();
    return LeaveWithHandle(__FUNCTION__,
                           ElementFrom(LinkOf(m_pXmlNode, &xmlNode::last), &xmlNode::prev));
}

CXmlNode CXmlNode::NextSibling()
{
    KX_ENTER();
    return LeaveWithHandle(__FUNCTION__, ElementFrom(LinkOf(m_pXmlNode, &xmlNode::next)));
}

CXmlNode CXmlNode::PrevSibling()
{
    KX_ENTER();
    return LeaveWithHandle(__FUNCTION__,
                           ElementFrom(LinkOf(m_pXmlNode, &xmlNode::prev), &xmlNode::prev));
}

// --- Emptying

int CXmlNode::ClearNode()
{
    KX_ENTER();
    int status = StatusMissing;
    if (CanBeCleared(m_pXmlNode))
    {
        Clear(m_pXmlNode);
        status = StatusOk;
    }
    KX_LEAVE();
    return status;
}

// --- Content

std::string CXmlNode::GetContent()
{
    KX_ENTER();
    std::string content;
    if (OnlyText(LinkOf(m_pXmlNode, &xmlNode::children)) != 0)
    {
        // The engine's buffer stays allocated: clients are built around what this call leaves
        // behind.
        content = FromEngine(xmlNodeGetContent(m_pXmlNode));
    }
    KX_LEAVE();
    return content;
}

int CXmlNode::SetContent(std::string text)
{
    KX_ENTER();
    int status = StatusMissing;
    if (CanTakeContent(m_pXmlNode))
    {
        ReplaceContent(m_pXmlNode, text);
        status = StatusOk;
    }
    KX_LEAVE();
    return status;
}

int CXmlNode::GetContentOfChildNode(std::string name, std::string& value)
{
    KX_ENTER();
    int status = StatusNotFound;
    CXmlNode child = FindChildNode(name);
    if (child.m_pXmlNode != 0)
    {
        value = child.GetContent();
        status = StatusOk;
    }
    KX_LEAVE();
    return status;
}

// --- Finding children

std::list<CXmlNode> CXmlNode::Children()
{
    KX_ENTER();
    std::list<CXmlNode> children;
    xmlNode* child = ElementFrom(LinkOf(m_pXmlNode, &xmlNode::children));
    while (child != 0)
    {
        children.push_back(CXmlNode(child));
        child = ElementFrom(child->next);
    }
    KX_LEAVE();
    return children;
}

CXmlNode CXmlNode::FindChildNode(std::string name)
{
    KX_ENTER();
    return LeaveWithHandle(__FUNCTION__,
                           NamedFrom(m_pXmlNode, LinkOf(m_pXmlNode, &xmlNode::children), name));
}

std::list<CXmlNode> CXmlNode::FindAllChildNodes(std::string name)
{
    KX_ENTER();
    std::list<CXmlNode> children;
    xmlNode* child = NamedFrom(m_pXmlNode, LinkOf(m_pXmlNode, &xmlNode::children), name);
    while (child != 0)
    {
        children.push_back(CXmlNode(child));
        child = NamedFrom(m_pXmlNode, child->next, name);
    }
    KX_LEAVE();
    return children;
}

// --- Adding and removing

CXmlNode CXmlNode::AddChildNode(std::string name, std::string content)
{
    KX_ENTER();
    CXmlNode child;
    if (CanHoldChildren(m_pXmlNode) && !name.empty())
    {
        xmlNode* const made = AppendChild(m_pXmlNode, name, content);
        if (made == 0)
        {
            KX_ERROR("Error creating child node");
        }
        SetIfFound(child, made);
    }
    KX_LEAVE();
    return child;
}

CXmlNode CXmlNode::AddSiblingNode(std::string name, std::string content)
{
    KX_ENTER();
    CXmlNode sibling;
    if (!CanHaveSiblings(m_pXmlNode))
    {
        KX_LEAVE();
        return sibling;
    }
    CXmlNode parent = Parent();
    if (parent.m_pXmlNode != 0)
    {
        // Last in the row, without a namespace, under an empty name too: clients count on each.
        SetIfFound(sibling, AppendSibling(m_pXmlNode, name, content));
    }
    KX_LEAVE();
    return sibling;
}

int CXmlNode::RemoveChildNode(std::string name)
{
    KX_ENTER();
    int status = StatusMissing;
    CXmlNode child = FindChildNode(name);
    if (CanBeRemoved(child.m_pXmlNode))
    {
        FreeFromTree(child.m_pXmlNode);
        status = StatusOk;
    }
    KX_LEAVE();
    return status;
}
