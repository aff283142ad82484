#include "model/Nodes.h"

namespace kxmodel
{

namespace
{

void ListNodes(xmlNodePtr node, std::vector<xmlNodePtr>& nodes)
{
    nodes.push_back(node);
    if (node->type == XML_ELEMENT_NODE)
    {
        for (xmlAttrPtr attribute = node->properties; attribute != nullptr;
             attribute = attribute->next)
        {
            nodes.push_back(reinterpret_cast<xmlNodePtr>(attribute));
        }
    }
    // What is below a reference or a DTD are declarations.
    if (node->type == XML_ELEMENT_NODE || node->type == XML_DOCUMENT_NODE)
    {
        for (xmlNodePtr child = node->children; child != nullptr; child = child->next)
        {
            ListNodes(child, nodes);
        }
    }
}

} // namespace

std::vector<xmlNodePtr> NodesOf(xmlDocPtr document)
{
    std::vector<xmlNodePtr> nodes = {nullptr};
    if (document != nullptr)
    {
        ListNodes(reinterpret_cast<xmlNodePtr>(document), nodes);
    }
    return nodes;
}

} // namespace kxmodel
