#include "file/Texts.h"

#include "file/Locations.h"
#include "file/Nodes.h"

namespace
{

/** @return the node after @p node in document order, or null. */
xmlNode* NextInDocument(xmlNode* node)
{
    if (node->type == XML_ELEMENT_NODE && node->children != nullptr)
    {
        return node->children;
    }
    while (node != nullptr && node->next == nullptr)
    {
        node = node->parent;
    }
    return node == nullptr ? nullptr : node->next;
}

} // namespace

Texts::Texts(void* document)
{
    xmlNode* node = xmlDocGetRootElement(static_cast<xmlDoc*>(document));
    for (; node != nullptr; node = NextInDocument(node))
    {
        if (node->type == XML_ELEMENT_NODE && kx::OnlyTextChild(node) != nullptr)
        {
            m_texts.push_back({node, ContentOf(node)});
        }
    }
}

std::vector<ChangedText> Texts::Changes() const
{
    std::vector<ChangedText> changes;
    Locations locations;
    for (const Text& text : m_texts)
    {
        const std::string now = ContentOf(text.element);
        if (now != text.content)
        {
            changes.push_back({locations.Of(text.element), text.content, now});
        }
    }
    return changes;
}
