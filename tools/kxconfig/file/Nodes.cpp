#include "file/Nodes.h"

#include "file/Engine.h"

#include <memory>

namespace
{

const long kLastCountedLine = 65535;

/** More children than these are not listed one by one. */
const int kListedChildren = 5;

std::string KindOf(const xmlNode* node)
{
    switch (node->type)
    {
    case XML_ELEMENT_NODE:
        return "element " + Text(node->name);
    case XML_TEXT_NODE:
        return IsBlankText(node) ? "blank text" : "text";
    case XML_CDATA_SECTION_NODE:
        return "CDATA section";
    case XML_ENTITY_REF_NODE:
        return "entity reference &" + Text(node->name) + ";";
    case XML_COMMENT_NODE:
        return "comment";
    case XML_PI_NODE:
        return "processing instruction";
    default:
        return "node";
    }
}

} // namespace

std::string Taken(xmlChar* text)
{
    const std::unique_ptr<xmlChar, void (*)(xmlChar*)> owner(text, [](xmlChar* owned)
                                                             { xmlFree(owned); });
    return Text(text);
}

long LineNumberOf(const xmlNode* node)
{
    // For an element the engine would guess from its children, which an update replaces.
    return node->type == XML_ELEMENT_NODE ? node->line : xmlGetLineNo(const_cast<xmlNode*>(node));
}

std::string LineOf(const xmlNode* node)
{
    const long line = LineNumberOf(node);
    return std::to_string(line) + (line < kLastCountedLine ? "" : " or later");
}

std::string ContentOf(const xmlNode* node)
{
    const FirstEngineError error;
    std::string content = Taken(xmlNodeGetContent(const_cast<xmlNode*>(node)));
    error.RequireMemory();
    return content;
}

std::string NameWithPrefix(const xmlNode* node)
{
    const xmlNs* const space = kx::NamespaceOf(node);
    const bool hasPrefix = space != nullptr && space->prefix != nullptr;
    return (hasPrefix ? Text(space->prefix) + ":" : "") + Text(node->name);
}

std::string WhyNoValue(const xmlNode* element)
{
    if (element->children == nullptr)
    {
        return "it is empty";
    }
    if (element->children->next == nullptr)
    {
        return "its only child is not text: " + KindOf(element->children);
    }
    std::string kinds;
    int count = 0;
    for (const xmlNode* child = element->children; child != nullptr; child = child->next)
    {
        ++count;
        if (count <= kListedChildren)
        {
            kinds += (count == 1 ? "" : ", ") + KindOf(child);
        }
    }
    kinds += count > kListedChildren ? ", ..." : "";
    return "it has " + std::to_string(count) + " children: " + kinds;
}

bool HasAttribute(const xmlNode* element, const std::string& name)
{
    const FirstEngineError error;
    xmlChar* const text = xmlGetProp(const_cast<xmlNode*>(element), kx::ToEngine(name));
    xmlFree(text);
    error.RequireMemory();
    return text != nullptr;
}

std::string AttributeOf(const xmlNode* element, const std::string& name)
{
    const FirstEngineError error;
    std::string text = Taken(xmlGetProp(const_cast<xmlNode*>(element), kx::ToEngine(name)));
    error.RequireMemory();
    return text;
}
