#include "commands/Commands.h"
#include "file/Document.h"
#include "file/Locations.h"
#include "file/Nodes.h"
#include "output/Output.h"

#include <libxml/xmlerror.h>
#include <libxml/xpath.h>

#include <memory>

namespace
{

struct FreeResult
{
    void operator()(xmlXPathObject* result) const { xmlXPathFreeObject(result); }
};
using Result = std::unique_ptr<xmlXPathObject, FreeResult>;

const char* TypeName(const xmlNode* node)
{
    switch (node->type)
    {
    case XML_ELEMENT_NODE:
        return "element";
    case XML_ATTRIBUTE_NODE:
        return "attribute";
    case XML_TEXT_NODE:
        return "text";
    case XML_CDATA_SECTION_NODE:
        return "cdata";
    case XML_PI_NODE:
        return "processing-instruction";
    case XML_COMMENT_NODE:
        return "comment";
    case XML_DOCUMENT_NODE:
        return "document";
    case XML_NAMESPACE_DECL:
        return "namespace";
    default:
        return "node"; // nothing else is selected by an expression
    }
}

/** A namespace is no node of the tree: in a result, its next is the element that it was found on.
 */
std::string LocationOfNamespace(const xmlNs* space, Locations& locations)
{
    const auto element = reinterpret_cast<const xmlNode*>(space->next);
    // One without a prefix has no name, which a path could end in.
    const std::string name = space->prefix == nullptr ? "*[name()='']" : Text(space->prefix);
    return locations.Of(element) + "/namespace::" + name;
}

std::string NameWithPrefix(const xmlAttr* attribute)
{
    const bool hasPrefix = attribute->ns != nullptr && attribute->ns->prefix != nullptr;
    return (hasPrefix ? Text(attribute->ns->prefix) + ":" : "") + Text(attribute->name);
}

std::string Attributes(const xmlNode* element)
{
    std::string attributes;
    for (const xmlAttr* attribute = element->properties; attribute != nullptr;
         attribute = attribute->next)
    {
        const auto node = reinterpret_cast<const xmlNode*>(attribute);
        attributes += " " + NameWithPrefix(attribute) + "=" + Quoted(ContentOf(node));
    }
    return attributes;
}

/** @return whether @p node is best described by its content: not if that is all below it. */
bool ShowsContent(const xmlNode* node)
{
    return node->type != XML_DOCUMENT_NODE &&
           (node->type != XML_ELEMENT_NODE || OnlyTextOf(node) != nullptr);
}

std::string Line(const xmlNode* node, Locations& locations)
{
    if (node->type == XML_NAMESPACE_DECL)
    {
        const auto space = reinterpret_cast<const xmlNs*>(node);
        return LocationOfNamespace(space, locations) + " namespace " + Quoted(Text(space->href));
    }
    std::string line = locations.Of(node) + " " + TypeName(node);
    if (node->type == XML_ELEMENT_NODE)
    {
        line += Attributes(node);
    }
    if (ShowsContent(node))
    {
        line += " " + Quoted(ContentOf(node));
    }
    return line;
}

Json AttributesInJson(const xmlNode* element)
{
    Json attributes = Json::object();
    for (const xmlAttr* attribute = element->properties; attribute != nullptr;
         attribute = attribute->next)
    {
        attributes[NameWithPrefix(attribute)] =
            ContentOf(reinterpret_cast<const xmlNode*>(attribute));
    }
    return attributes;
}

Json InJson(const xmlNode* node, Locations& locations)
{
    if (node->type == XML_NAMESPACE_DECL)
    {
        const auto space = reinterpret_cast<const xmlNs*>(node);
        return {{"location", LocationOfNamespace(space, locations)},
                {"type", TypeName(node)},
                {"value", Text(space->href)}};
    }
    const long line = LineNumberOf(node);
    Json result = {{"location", locations.Of(node)},
                   {"line", line > 0 ? Json(line) : Json()},
                   {"type", TypeName(node)},
                   {"value", ShowsContent(node) ? Json(ContentOf(node)) : Json()}};
    if (node->type == XML_ELEMENT_NODE)
    {
        result["attributes"] = AttributesInJson(node);
    }
    return result;
}

/** @return the number of nodes printed. */
int PrintNodes(const xmlNodeSet* nodes)
{
    const int count = nodes == nullptr ? 0 : nodes->nodeNr;
    Locations locations;
    for (int i = 0; i < count; ++i)
    {
        const xmlNode* const node = nodes->nodeTab[i];
        if (AnswersInJson())
        {
            PrintResult(InJson(node, locations));
        }
        else
        {
            PrintLine(Line(node, locations));
        }
    }
    return count;
}

void PrintScalar(xmlXPathObject* result)
{
    const std::string value = Taken(xmlXPathCastToString(result));
    Print(value, {{"value", value}});
}

/** The library evaluates without prefixes, though the locations that find prints have them. */
std::string AdviceOnPrefixes()
{
    const auto error = xmlGetLastError();
    const bool isPrefix = error != nullptr && error->code == XML_XPATH_UNDEF_PREFIX_ERROR;
    return isPrefix ? "; find knows no prefixes: write *[name()='p:a'] for p:a" : "";
}

} // namespace

ExitStatus Find(const std::string& file, const std::string& expression)
{
    CXmlParser document;
    if (!LoadDocument(file, document))
    {
        return ExitStatus::BadFile;
    }
    const CXmlNode top = document.FindNode("/", CXmlNode());
    // Not FindAllNodes(), which ends at 255 nodes.
    const Result result(document.GetNodeSet(expression, top));
    if (result == nullptr)
    {
        Complain("malformed expression " + Quoted(expression) + FirstComplaint(": ") +
                 AdviceOnPrefixes());
        return ExitStatus::BadUsage;
    }
    if (result->type != XPATH_NODESET)
    {
        PrintScalar(result.get());
        return ExitStatus::Done;
    }
    if (PrintNodes(result->nodesetval) == 0)
    {
        Complain("nothing found: " + Quoted(expression) + " selects no node of " + file);
        return ExitStatus::NothingFound;
    }
    return ExitStatus::Done;
}
