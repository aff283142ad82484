#include "file/ElementChanges.h"

#include "file/Locations.h"
#include "file/Nodes.h"

#include <algorithm>
#include <utility>

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

void ElementChanges::Note(const xmlNode* element, std::optional<std::string> before)
{
    if (m_before.emplace(element, std::move(before)).second)
    {
        m_noted.push_back(element);
    }
}

void ElementChanges::NoteChanged(const xmlNode* element, const std::string& before)
{
    Note(element, before);
}

void ElementChanges::NoteCreated(const xmlNode* element)
{
    Note(element, std::nullopt);
}

std::vector<const xmlNode*> ElementChanges::InDocumentOrder(xmlDoc* document) const
{
    if (m_updates < 2 || m_noted.size() < 2)
    {
        return m_noted;
    }
    std::vector<const xmlNode*> ordered;
    for (xmlNode* node = xmlDocGetRootElement(document); node != nullptr;
         node = NextInDocument(node))
    {
        if (m_before.count(node) != 0)
        {
            ordered.push_back(node);
        }
    }
    return ordered;
}

std::vector<Change> ElementChanges::List(xmlDoc* document) const
{
    std::vector<Change> changes;
    Locations locations;
    for (const xmlNode* const element : InDocumentOrder(document))
    {
        const std::optional<std::string>& before = m_before.at(element);
        const std::string now = ContentOf(element);
        if (before != now)
        {
            changes.push_back({locations.Of(element), before, now});
        }
    }
    return changes;
}

size_t ElementChanges::CountTextless() const
{
    const auto isTextless = [](const auto& noted)
    {
        return kx::OnlyTextChild(noted.first) == nullptr &&
               kx::ElementFrom(noted.first->children) == nullptr;
    };
    return static_cast<size_t>(std::count_if(m_before.begin(), m_before.end(), isTextless));
}
