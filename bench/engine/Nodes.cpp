// What one would write by hand over libxml2 in place of handles.

#include "Documents.h"
#include "Operations.h"
#include "library/Loaded.h"

#include <libxml/tree.h>
#include <libxml/xpath.h>

#include <cstdlib>
#include <cstring>
#include <list>
#include <utility>

namespace bench
{

namespace
{

const char* Text(const xmlChar* text)
{
    return reinterpret_cast<const char*>(text);
}

std::size_t CountedByIteration(xmlNode* parent)
{
    std::size_t count = 0;
    for (xmlNode* child = xmlFirstElementChild(parent); child != nullptr;
         child = xmlNextElementSibling(child))
    {
        ++count;
    }
    return count;
}

std::list<xmlNode*> Children(const xmlNode* parent)
{
    std::list<xmlNode*> children;
    for (xmlNode* child = parent->children; child != nullptr; child = child->next)
    {
        if (child->type == XML_ELEMENT_NODE)
        {
            children.push_back(child);
        }
    }
    return children;
}

const xmlNode* FindChild(const xmlNode* parent, const char* name)
{
    const xmlNode* child = parent->children;
    while (child != nullptr &&
           (child->type != XML_ELEMENT_NODE || std::strcmp(Text(child->name), name) != 0))
    {
        child = child->next;
    }
    return child;
}

using Attributes = std::list<std::pair<std::string, std::string>>;

Attributes AttributesOf(const xmlNode* element)
{
    Attributes attributes;
    for (const xmlAttr* attribute = element->properties; attribute != nullptr;
         attribute = attribute->next)
    {
        attributes.emplace_back(Text(attribute->name), Text(attribute->children->content));
    }
    return attributes;
}

using Nodes = std::list<const xmlNode*>;

bool IsSelected(const xmlNode* element, double below)
{
    return std::strcmp(Text(element->name), "limit") == 0 &&
           (below == 0 || std::strtod(Text(element->children->content), nullptr) < below);
}

void AppendSelected(const xmlNode* parent, double below, Nodes& found)
{
    for (const xmlNode* child = parent->children; child != nullptr; child = child->next)
    {
        if (child->type != XML_ELEMENT_NODE)
        {
            continue;
        }
        if (IsSelected(child, below))
        {
            found.push_back(child);
        }
        AppendSelected(child, below, found);
    }
}

/** A list of what the query selects, without XPath. */
Nodes ListedByWalk(const xmlDoc* document, double below)
{
    Nodes found;
    AppendSelected(xmlDocGetRootElement(document), below, found);
    return found;
}

/** The evaluation, and a list of what it selects. */
std::list<xmlNode*> ListedByXPath(xmlDoc* document, const char* expression)
{
    xmlXPathContext* const context = xmlXPathNewContext(document);
    xmlXPathObject* const result =
        xmlXPathEvalExpression(reinterpret_cast<const xmlChar*>(expression), context);
    xmlNode** const nodes = result->nodesetval->nodeTab;
    std::list<xmlNode*> found(nodes, nodes + result->nodesetval->nodeNr);
    xmlXPathFreeObject(result);
    xmlXPathFreeContext(context);
    return found;
}

/** The evaluation alone, without a list of what it selects. */
std::size_t CountedByXPath(xmlDoc* document, const char* expression)
{
    xmlXPathContext* const context = xmlXPathNewContext(document);
    xmlXPathObject* const result =
        xmlXPathEvalExpression(reinterpret_cast<const xmlChar*>(expression), context);
    const int count = result->nodesetval->nodeNr;
    xmlXPathFreeObject(result);
    xmlXPathFreeContext(context);
    return static_cast<std::size_t>(count);
}

void AddChildren()
{
    Add(kIterate, kWalk, kIteratedChildren,
        [] {
            return [parent = LoadedRoot(Texts(kIteratedChildren))]
            { return CountedByIteration(parent); };
        });
    Add(kListChildren, kWalk, kIteratedChildren,
        [] {
            return [parent = LoadedRoot(Texts(kIteratedChildren))]
            { return Children(parent).size(); };
        });
    for (const std::size_t count : kFindChildCounts)
    {
        Add(Sized(kFindChild, count), kWalk, true,
            [count]
            {
                return [parent = LoadedRoot(Siblings(count))]
                { return FindChild(parent, "service") != nullptr; };
            });
    }
}

void AddAttributes()
{
    Add(kListAttributes, kWalk, kFourAttributes,
        []
        {
            return [element = xmlFirstElementChild(LoadedRoot(FourAttributes()))]
            { return AttributesOf(element).size(); };
        });
}

void AddQueries()
{
    for (const Query& query : kQueries)
    {
        Add(query.workload, kWalk, kQueryHits,
            [query]
            {
                return [document = ParserDocument(Channels(query.channels)), query]
                { return ListedByWalk(document, query.below).size(); };
            });
        Add(query.workload, kXPathFresh, kQueryHits,
            [query]
            {
                return [document = ParserDocument(Channels(query.channels)), query]
                { return CountedByXPath(document, query.expression); };
            });
        Add(query.workload, kXPathListed, kQueryHits,
            [query]
            {
                return [document = ParserDocument(Channels(query.channels)), query]
                { return ListedByXPath(document, query.expression).size(); };
            });
    }
}

const Registration registration(
    []
    {
        AddChildren();
        AddAttributes();
        AddQueries();
    });

} // namespace

} // namespace bench
