#include "commands/Remove.h"

#include "commands/EditedDocument.h"
#include "file/Insertion.h"
#include "file/Locations.h"
#include "file/Nodes.h"
#include "output/Failure.h"
#include "output/Quoting.h"

#include <algorithm>
#include <unordered_set>

namespace
{

using NodeSet = std::unordered_set<const xmlNode*>;

bool IsBelowAny(const xmlNode* node, const NodeSet& nodes)
{
    const xmlNode* above = node->parent;
    while (above != nullptr && nodes.count(above) == 0)
    {
        above = above->parent;
    }
    return above != nullptr;
}

/** @return @p nodes without those that are removed with another one. */
std::vector<xmlNode*> Topmost(const std::vector<xmlNode*>& nodes)
{
    const NodeSet all(nodes.begin(), nodes.end());
    std::vector<xmlNode*> topmost;
    std::copy_if(nodes.begin(), nodes.end(), std::back_inserter(topmost),
                 [&all](const xmlNode* node) { return !IsBelowAny(node, all); });
    return topmost;
}

std::vector<Change> Removals(const std::vector<xmlNode*>& nodes)
{
    std::vector<Change> changes;
    changes.reserve(nodes.size());
    Locations locations;
    for (const xmlNode* const node : nodes)
    {
        changes.push_back({locations.Of(node), ContentOf(node), std::nullopt});
    }
    return changes;
}

void RequireRemovable(const xmlNode* node, const std::string& expression)
{
    const bool isRoot = node->type == XML_ELEMENT_NODE && node == xmlDocGetRootElement(node->doc);
    if (isRoot || node->type == XML_DOCUMENT_NODE)
    {
        throw Failure(ExitStatus::NotSaved, "not saved: " + Quoted(expression) + " selects " +
                                                (isRoot ? "the root element" : KindName(node)) +
                                                ", without which there is no document");
    }
}

void RemoveNode(CXmlParser& parser, xmlNode* node, const std::string& expression)
{
    if (parser.RemoveNode(CXmlNode(node)) != 0)
    {
        throw Failure(ExitStatus::NotSaved, "not saved: " + Quoted(expression) + " selects " +
                                                KindName(node) + ", which cannot be removed");
    }
}

void RemoveNodes(CXmlParser& parser, const std::vector<xmlNode*>& nodes,
                 const std::string& expression)
{
    for (xmlNode* const node : nodes)
    {
        RequireRemovable(node, expression);
        // One that is selected itself comes before the node, and is removed already.
        if (xmlNode* const indentation = LineBefore(node))
        {
            RemoveNode(parser, indentation, expression);
        }
        RemoveNode(parser, node, expression);
    }
}

} // namespace

ExitStatus Remove(const RemoveArguments& arguments, Report& report)
{
    Edit edit(arguments.file, arguments.saving, report);
    EditedDocument document(arguments.file);
    const std::vector<xmlNode*> nodes =
        Topmost(document.Select(arguments.expression, arguments.all));
    const std::vector<Change> changes = Removals(nodes);
    RemoveNodes(document.Parser(), nodes, arguments.expression);
    return edit.Finish(document.Get(), changes);
}
