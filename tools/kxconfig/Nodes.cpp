#include "Nodes.h"

namespace
{

const xmlChar* ToEngine(const std::string& text)
{
    return reinterpret_cast<const xmlChar*>(text.c_str());
}

} // namespace

std::string Text(const xmlChar* text)
{
    return text == nullptr ? "" : reinterpret_cast<const char*>(text);
}

std::string Taken(xmlChar* text)
{
    const std::string copy = Text(text);
    xmlFree(text);
    return copy;
}

std::string LocationOf(const xmlNode* node)
{
    return Taken(xmlGetNodePath(const_cast<xmlNode*>(node)));
}

std::string ContentOf(const xmlNode* node)
{
    return Taken(xmlNodeGetContent(const_cast<xmlNode*>(node)));
}

const xmlNode* OnlyTextOf(const xmlNode* element)
{
    const xmlNode* const child = element->children;
    const bool isOnlyText =
        child != nullptr && child->type == XML_TEXT_NODE && child->next == nullptr;
    return isOnlyText ? child : nullptr;
}

std::string AttributeOf(const xmlNode* element, const std::string& name)
{
    return Taken(xmlGetProp(const_cast<xmlNode*>(element), ToEngine(name)));
}
