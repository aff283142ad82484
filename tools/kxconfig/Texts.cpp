#include "Texts.h"

#include <libxml/tree.h>

namespace
{

/** @return a copy of @p text, which is freed; empty for null. */
std::string Taken(xmlChar* text)
{
    const std::string copy = text == nullptr ? "" : reinterpret_cast<const char*>(text);
    xmlFree(text);
    return copy;
}

/** @return whether @p node can be changed by an update: an element that holds text and no more. */
bool HoldsOnlyText(const xmlNode* node)
{
    return node->type == XML_ELEMENT_NODE && node->children != nullptr &&
           node->children->type == XML_TEXT_NODE && node->children->next == nullptr;
}

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
        if (HoldsOnlyText(node))
        {
            m_texts.push_back({node, Taken(xmlNodeGetContent(node))});
        }
    }
}

std::vector<ChangedText> Texts::Changes() const
{
    std::vector<ChangedText> changes;
    for (const Text& text : m_texts)
    {
        const std::string now = Taken(xmlNodeGetContent(text.element));
        if (now != text.content)
        {
            changes.push_back({Taken(xmlGetNodePath(text.element)), text.content, now});
        }
    }
    return changes;
}
