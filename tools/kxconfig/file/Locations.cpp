#include "file/Locations.h"

#include "file/Nodes.h"

#include <map>
#include <utility>
#include <vector>

namespace
{

bool HasNoPath(const xmlNode* node)
{
    switch (node->type)
    {
    case XML_ELEMENT_NODE:
    case XML_ATTRIBUTE_NODE:
    case XML_TEXT_NODE:
    case XML_CDATA_SECTION_NODE:
    case XML_COMMENT_NODE:
    case XML_PI_NODE:
    case XML_DOCUMENT_NODE:
        return false;
    default:
        return true;
    }
}

/** @return whether XPath has no name for the element: it is in a namespace without a prefix. */
bool IsNameless(const xmlNode* node)
{
    return node->type == XML_ELEMENT_NODE && node->ns != nullptr && node->ns->prefix == nullptr;
}

/** @return a step without its position: nodes of one parent that share it are numbered. */
std::string StepOf(const xmlNode* node)
{
    switch (node->type)
    {
    case XML_ATTRIBUTE_NODE:
        return "/@" + NameWithPrefix(node);
    case XML_TEXT_NODE:
    case XML_CDATA_SECTION_NODE:
        return "/text()";
    case XML_COMMENT_NODE:
        return "/comment()";
    case XML_PI_NODE:
        return "/processing-instruction('" + Text(node->name) + "')";
    default:
        return IsNameless(node) ? "/*" : "/" + NameWithPrefix(node);
    }
}

} // namespace

std::string Locations::Of(const xmlNode* node)
{
    std::vector<std::string> steps;
    for (; node != nullptr && node->type != XML_DOCUMENT_NODE; node = node->parent)
    {
        if (HasNoPath(node))
        {
            return "";
        }
        steps.push_back(StepOf(node) + PositionOf(node));
    }
    std::string path;
    for (auto step = steps.rbegin(); step != steps.rend(); ++step)
    {
        path += *step;
    }
    return path.empty() ? "/" : path;
}

std::string Locations::PositionOf(const xmlNode* node)
{
    if (node->type == XML_ATTRIBUTE_NODE || node->parent == nullptr)
    {
        return "";
    }
    if (m_counted.insert(node->parent).second)
    {
        CountChildren(node->parent);
    }
    const auto position = m_positions.find(node);
    return position == m_positions.end() ? "" : "[" + std::to_string(position->second) + "]";
}

void Locations::CountChildren(const xmlNode* parent)
{
    struct Alike
    {
        const xmlNode* first = nullptr;
        long count = 0;
    };
    std::map<std::pair<std::string, bool>, Alike> groups;
    const auto countAs = [&groups](const std::string& step, bool hasSpace, const xmlNode* node)
    {
        Alike& group = groups[{step, hasSpace}];
        group.first = group.count == 0 ? node : group.first;
        return ++group.count;
    };
    for (const xmlNode* node = parent->children; node != nullptr; node = node->next)
    {
        const bool isElement = node->type == XML_ELEMENT_NODE;
        // "*" stands for every element, so that all of them count for one without a name.
        const long place = isElement ? countAs("/*", true, node) : 0;
        // A prefix that is not declared is a part of the name.
        const bool hasSpace = isElement && node->ns != nullptr;
        m_positions[node] = IsNameless(node) ? place : countAs(StepOf(node), hasSpace, node);
    }
    for (const auto& [step, group] : groups)
    {
        if (group.count == 1)
        {
            m_positions.erase(group.first);
        }
    }
}
