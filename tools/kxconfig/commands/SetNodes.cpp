#include "commands/SetNodes.h"

#include "commands/EditedDocument.h"
#include "commands/ValueArgument.h"
#include "file/Engine.h"
#include "file/Locations.h"
#include "file/Nodes.h"
#include "file/StoredText.h"
#include "output/Failure.h"
#include "output/Quoting.h"

#include <unordered_set>

namespace
{

/** A node and the text that it had. */
struct NodeText
{
    xmlNode* node;
    std::string content;
};

/** Requires that @p node is an attribute, or an element of which no other element is lost. */
void RequireReplaceable(const xmlNode* node, const std::string& expression)
{
    const bool isElement = node->type == XML_ELEMENT_NODE;
    if (!isElement && node->type != XML_ATTRIBUTE_NODE)
    {
        throw Failure(ExitStatus::BadUsage, Quoted(expression) + " selects " + KindName(node) +
                                                "; --node changes elements and attributes");
    }
    if (isElement && kx::ElementFrom(node->children) != nullptr)
    {
        throw Failure(ExitStatus::NotSaved,
                      "not saved: " + Quoted(expression) +
                          " selects an element with elements in it, which would be removed");
    }
}

std::vector<Change> ChangesOf(const std::vector<NodeText>& texts)
{
    std::vector<Change> changes;
    std::unordered_set<const xmlNode*> seen;
    Locations locations;
    for (const NodeText& text : texts)
    {
        const std::string now = ContentOf(text.node);
        if (seen.insert(text.node).second && now != text.content)
        {
            changes.push_back({locations.Of(text.node), text.content, now});
        }
    }
    return changes;
}

void SetContent(xmlNode* node, const std::string& value)
{
    const FirstEngineError error;
    CXmlNode(node).SetContent(value);
    error.RequireMemory();
    RequireStored(node, value);
}

} // namespace

ExitStatus SetNodes(const std::vector<Assignment>& assignments, const std::string& file, bool all,
                    Edit& edit)
{
    EditedDocument document(file);
    std::vector<NodeText> texts;
    for (const Assignment& assignment : assignments)
    {
        RequireXmlText(assignment.value);
        RequireDeclaredEntities(assignment.value, document.Get());
        for (xmlNode* const node : document.Select(assignment.key, all))
        {
            RequireReplaceable(node, assignment.key);
            texts.push_back({node, ContentOf(node)});
            SetContent(node, assignment.value);
        }
        edit.RequireLoadable(document.Get(), assignment.value);
    }
    return edit.Finish(document.Get(), ChangesOf(texts));
}
