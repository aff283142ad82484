#include "file/Nodes.h"

#include "file/Engine.h"

#include <memory>
#include <new>

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

/** Other nodes can have none. */
bool HasContent(const xmlNode* node)
{
    return node->type == XML_ELEMENT_NODE || node->type == XML_ATTRIBUTE_NODE ||
           (node->type == XML_TEXT_NODE && node->content != nullptr);
}

/** Engines from 2.13 on do not report that they are short of memory. */
void RequireMemory(bool isThere)
{
    if (!isThere)
    {
        throw std::bad_alloc();
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
    // Most elements have one text, of which the engine need not make a copy first.
    const xmlNode* const only = node->type == XML_ELEMENT_NODE ? kx::OnlyTextChild(node) : nullptr;
    if (only != nullptr)
    {
        return kx::ContentOf(only);
    }
    const FirstEngineError error;
    xmlChar* const content = xmlNodeGetContent(const_cast<xmlNode*>(node));
    const bool isMissing = content == nullptr && HasContent(node);
    std::string text = Taken(content);
    error.RequireMemory();
    RequireMemory(!isMissing);
    return text;
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
    return xmlHasProp(const_cast<xmlNode*>(element), kx::ToEngine(name)) != nullptr;
}

std::string AttributeOf(const xmlNode* element, const std::string& name)
{
    const FirstEngineError error;
    xmlChar* const value = xmlGetProp(const_cast<xmlNode*>(element), kx::ToEngine(name));
    const bool isMissing = value == nullptr && HasAttribute(element, name);
    std::string text = Taken(value);
    error.RequireMemory();
    RequireMemory(!isMissing);
    return text;
}
