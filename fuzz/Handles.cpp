#include "Handles.h"

#include <cstring>

namespace kxfuzz
{

namespace
{

bool IsDeclaration(const xmlNode* node)
{
    switch (node->type)
    {
    case XML_ELEMENT_DECL:
    case XML_ATTRIBUTE_DECL:
    case XML_ENTITY_DECL:
    case XML_ENTITY_NODE:
    case XML_NOTATION_NODE:
        return true;
    default:
        return false;
    }
}

} // namespace

Handles* Handles::s_listening = nullptr;

Handles::Handles()
{
    s_listening = this;
    ListenToEngine();
}

Handles::~Handles()
{
    s_listening = nullptr;
}

void Handles::ListenToEngine()
{
    xmlDeregisterNodeDefault(OnFreed);
}

xmlNodePtr Handles::NodeOf(const CXmlNode& handle)
{
    static_assert(sizeof handle == sizeof(xmlNodePtr), "a handle is one pointer");
    xmlNodePtr node;
    std::memcpy(&node, static_cast<const void*>(&handle), sizeof node);
    return node;
}

void Handles::Put(std::size_t index, const CXmlNode& handle)
{
    Slot& slot = m_slots[index % kCount];
    slot.handle = handle;
    slot.node = NodeOf(handle);
    slot.document = slot.node != nullptr ? slot.node->doc : nullptr;
    slot.isDeclaration = slot.node != nullptr && IsDeclaration(slot.node);
}

void Handles::OnFreed(xmlNodePtr node)
{
    if (s_listening != nullptr)
    {
        s_listening->Forget(node);
    }
}

void Handles::Forget(xmlNodePtr node)
{
    for (Slot& slot : m_slots)
    {
        const bool goesWithItsDtd =
            node->type == XML_DTD_NODE && slot.isDeclaration && slot.document == node->doc;
        const bool goesWithItsDocument =
            slot.document != nullptr && static_cast<void*>(slot.document) == node;
        if (slot.node == node || goesWithItsDtd || goesWithItsDocument)
        {
            slot.handle = CXmlNode();
            slot.node = nullptr;
            slot.document = nullptr;
            slot.isDeclaration = false;
        }
    }
    for (xmlNodePtr& watched : m_watched)
    {
        watched = watched == node ? nullptr : watched;
    }
}

} // namespace kxfuzz
