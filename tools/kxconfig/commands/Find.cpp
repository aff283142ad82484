#include "commands/Find.h"

#include "commands/Evaluation.h"
#include "file/Load.h"
#include "file/Locations.h"
#include "file/Nodes.h"
#include "output/Failure.h"
#include "output/Quoting.h"
#include "output/Report.h"

#include <nlohmann/json.hpp>

namespace
{

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

std::string Attributes(const xmlNode* element)
{
    std::string attributes;
    for (const xmlAttr* attribute = element->properties; attribute != nullptr;
         attribute = attribute->next)
    {
        const auto node = reinterpret_cast<const xmlNode*>(attribute);
        attributes += " " + NameWithPrefix(node) + "=" + Quoted(ContentOf(node));
    }
    return attributes;
}

/** @return whether @p node is best described by its content: not if that is all below it. */
bool ShowsContent(const xmlNode* node)
{
    return node->type != XML_DOCUMENT_NODE &&
           (node->type != XML_ELEMENT_NODE || kx::OnlyTextChild(node) != nullptr);
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
        const auto node = reinterpret_cast<const xmlNode*>(attribute);
        attributes[NameWithPrefix(node)] = ContentOf(node);
    }
    return attributes;
}

/** Where locations of nodes are spelled in both ways. */
struct Places
{
    Locations locations;
    Locations expressions{Spelling::Expression};
};

/** Adds the expression that selects @p node to @p result, where its location does not. */
void AddExpression(const xmlNode* node, Places& places, Json& result)
{
    const std::string expression = places.expressions.Of(node);
    if (expression != result["location"])
    {
        result["expression"] = expression;
    }
}

Json InJson(const xmlNode* node, Places& places)
{
    Locations& locations = places.locations;
    if (node->type == XML_NAMESPACE_DECL)
    {
        const auto space = reinterpret_cast<const xmlNs*>(node);
        return {{"location", LocationOfNamespace(space, locations)},
                {"type", TypeName(node)},
                {"value", Text(space->href)}};
    }
    const long line = LineNumberOf(node);
    Json result = {{"location", HasLocation(node) ? Json(locations.Of(node)) : Json()},
                   {"line", line > 0 ? Json(line) : Json()},
                   {"type", TypeName(node)},
                   {"value", ShowsContent(node) ? Json(ContentOf(node)) : Json()}};
    if (HasLocation(node))
    {
        AddExpression(node, places, result);
    }
    else
    {
        result["place"] = locations.Of(node);
    }
    if (node->type == XML_ELEMENT_NODE)
    {
        result["attributes"] = AttributesInJson(node);
    }
    return result;
}

/** A node that the expression selects. */
struct SelectedNode
{
    const xmlNode* node;
    Places& places;

    std::string Line() const { return ::Line(node, places.expressions); }
    Json InJson() const { return ::InJson(node, places); }
};

/** What an expression evaluates to that selects no nodes. */
struct Scalar
{
    std::string value;

    std::string Line() const { return value; }
    Json InJson() const { return {{"value", value}}; }
};

/** @return the number of nodes. */
int AddNodes(const xmlNodeSet* nodes, Report& report)
{
    const int count = nodes == nullptr ? 0 : nodes->nodeNr;
    Places places;
    for (int i = 0; i < count; ++i)
    {
        report.Add(SelectedNode{nodes->nodeTab[i], places});
    }
    return count;
}

} // namespace

ExitStatus Find(const FindArguments& arguments, Report& report)
{
    const LoadedParser document(new CXmlParser);
    LoadDocument(arguments.file, *document, arguments.input);
    const XPathResult result = Evaluate(*document, arguments.expression);
    if (result->type != XPATH_NODESET)
    {
        report.Add(Scalar{Taken(xmlXPathCastToString(result.get()))});
    }
    else if (AddNodes(result->nodesetval, report) == 0)
    {
        throw Failure(ExitStatus::NothingFound, "nothing found: " + Quoted(arguments.expression) +
                                                    " selects no node of " + arguments.file);
    }
    return ExitStatus::Done;
}
