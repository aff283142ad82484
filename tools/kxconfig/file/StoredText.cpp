#include "file/StoredText.h"

#include "file/Nodes.h"

#include <libxml/entities.h>
#include <libxml/parserInternals.h>

#include <charconv>
#include <new>

namespace
{

std::string Character(const std::string& digits, int base)
{
    int code = 0;
    std::from_chars(digits.data(), digits.data() + digits.size(), code, base);
    xmlChar bytes[8] = {};
    xmlCopyCharMultiByte(bytes, code);
    return Text(bytes);
}

/** @return the character of a predefined entity; of another one a mark that no text contains. */
std::string EntityText(const std::string& name)
{
    const xmlEntity* const predefined = xmlGetPredefinedEntity(kx::ToEngine(name));
    return predefined != nullptr ? Text(predefined->content) : std::string(1, '\0') + name + ";";
}

/** @param text  between "&" and ";". */
std::string ReferenceText(const std::string& text)
{
    if (text[0] != '#')
    {
        return EntityText(text);
    }
    const bool isHexadecimal = text.compare(1, 1, "x") == 0;
    return Character(text.substr(isHexadecimal ? 2 : 1), isHexadecimal ? 16 : 10);
}

std::string WithoutReferences(const std::string& value)
{
    std::string text;
    size_t begin = 0;
    for (size_t at = value.find('&'); at != std::string::npos; at = value.find('&', begin))
    {
        const size_t end = value.find(';', at);
        text += value.substr(begin, at - begin) + ReferenceText(value.substr(at + 1, end - at - 1));
        begin = end + 1;
    }
    return text + value.substr(begin);
}

std::string StoredText(const xmlNode* node)
{
    std::string text;
    for (const xmlNode* child = node->children; child != nullptr; child = child->next)
    {
        text += child->type == XML_ENTITY_REF_NODE ? EntityText(Text(child->name))
                                                   : Text(kx::ContentOf(child));
    }
    return text;
}

} // namespace

void RequireStored(const xmlNode* node, const std::string& value)
{
    if (StoredText(node) != WithoutReferences(value))
    {
        throw std::bad_alloc();
    }
}
