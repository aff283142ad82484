#include "commands/EditedDocument.h"

#include "commands/Evaluation.h"
#include "file/Load.h"
#include "file/Nodes.h"
#include "output/Failure.h"
#include "output/Quoting.h"

#include <libxml/parser.h>
#include <libxml/xpathInternals.h>

namespace
{

Failure Selects(ExitStatus status, const std::string& start, const std::string& expression,
                const std::string& what)
{
    return {status, start + Quoted(expression) + " selects " + what};
}

void RequireCount(size_t count, bool all, const std::string& expression, const std::string& file)
{
    if (count == 0)
    {
        throw Selects(ExitStatus::NothingFound, "nothing found: ", expression,
                      "no node of " + file);
    }
    if (count != 1 && !all)
    {
        throw Selects(ExitStatus::NotSaved, "not saved: ", expression,
                      std::to_string(count) + " nodes; --all changes them all");
    }
}

} // namespace

EditedDocument::EditedDocument(const std::string& file) : m_file(file)
{
    LoadDocument(file, m_parser);
}

std::vector<xmlNode*> EditedDocument::Select(const std::string& expression, bool all)
{
    const XPathResult result = Evaluate(m_parser, expression);
    if (result->type != XPATH_NODESET)
    {
        throw Selects(ExitStatus::BadUsage, "", expression, "no nodes: it is a value");
    }
    xmlXPathNodeSetSort(result->nodesetval);
    std::vector<xmlNode*> nodes;
    const int count = result->nodesetval == nullptr ? 0 : result->nodesetval->nodeNr;
    for (int i = 0; i < count; ++i)
    {
        nodes.push_back(result->nodesetval->nodeTab[i]);
        if (nodes.back()->type == XML_NAMESPACE_DECL)
        {
            throw Selects(ExitStatus::BadUsage, "", expression,
                          "a namespace declaration, which cannot be changed");
        }
    }
    RequireCount(nodes.size(), all, expression, m_file);
    return nodes;
}

xmlDoc* EditedDocument::Get()
{
    const XPathResult top = Evaluate(m_parser, "/");
    return top->nodesetval->nodeTab[0]->doc;
}

std::string KindName(const xmlNode* node)
{
    switch (node->type)
    {
    case XML_ELEMENT_NODE:
        return "an element";
    case XML_ATTRIBUTE_NODE:
        return "an attribute";
    case XML_TEXT_NODE:
    case XML_CDATA_SECTION_NODE:
        return "a text";
    case XML_COMMENT_NODE:
        return "a comment";
    case XML_PI_NODE:
        return "a processing instruction";
    case XML_DOCUMENT_NODE:
        return "the document";
    default:
        return "another node";
    }
}

void RequireName(const std::string& name)
{
    if (xmlValidateNCName(kx::ToEngine(name), 0) != 0)
    {
        throw Failure(ExitStatus::BadUsage,
                      Quoted(name) + " is not a name without a prefix, as elements and attributes "
                                     "get it");
    }
}
