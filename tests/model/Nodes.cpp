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

void AddChild(xmlAttrPtr attribute, xmlNodePtr child)
{
    child->parent = reinterpret_cast<xmlNodePtr>(attribute);
    child->prev = attribute->last;
    (attribute->last != nullptr ? attribute->last->next : attribute->children) = child;
    attribute->last = child;
}

void AddText(xmlAttrPtr attribute, const char* text)
{
    AddChild(attribute, xmlNewDocText(attribute->doc, reinterpret_cast<const xmlChar*>(text)));
}

/** @param shape  the character after "#". */
void Reshape(xmlAttrPtr attribute, char shape)
{
    xmlFreeNodeList(attribute->children);
    attribute->children = nullptr;
    attribute->last = nullptr;
    switch (shape)
    {
    case '0': // no content
        AddText(attribute, nullptr);
        break;
    case '2': // two texts: 12
        AddText(attribute, "1");
        AddText(attribute, "2");
        break;
    case 'c': // a CDATA section: 1
        AddChild(attribute,
                 xmlNewCDataBlock(attribute->doc, reinterpret_cast<const xmlChar*>("1"), 1));
        break;
    default: // no child
        break;
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

void Reshape(xmlDocPtr document)
{
    for (const xmlNodePtr node : NodesOf(document))
    {
        if (node == nullptr || node->type != XML_ATTRIBUTE_NODE)
        {
            continue;
        }
        const xmlAttrPtr attribute = reinterpret_cast<xmlAttrPtr>(node);
        const xmlNode* const text = attribute->children;
        if (attribute->atype != XML_ATTRIBUTE_ID && text != nullptr && text->content != nullptr &&
            text->type == XML_TEXT_NODE && text->content[0] == '#')
        {
            Reshape(attribute, static_cast<char>(text->content[1]));
        }
    }
}

} // namespace kxmodel
