#include "file/Locations.h"

#include "file/Nodes.h"

#include <cstdint>
#include <map>
#include <optional>
#include <string_view>
#include <tuple>

namespace
{

/** Where an expression selects a node that has no path: a comment, say. */
const char* const kWithoutPath = "(in the document type declaration)";

bool IsKindWithLocation(const xmlNode* node)
{
    switch (node->type)
    {
    case XML_ELEMENT_NODE:
    case XML_ATTRIBUTE_NODE:
    case XML_TEXT_NODE:
    case XML_CDATA_SECTION_NODE:
    case XML_COMMENT_NODE:
    case XML_PI_NODE:
        return true;
    default:
        return false;
    }
}

/** @return the number of steps in the path of @p node; none if it has no path. */
std::optional<size_t> DepthOf(const xmlNode* node)
{
    size_t depth = 0;
    for (; node != nullptr && node->type != XML_DOCUMENT_NODE; node = node->parent)
    {
        if (!IsKindWithLocation(node))
        {
            return std::nullopt;
        }
        ++depth;
    }
    return depth;
}

/** @return whether XPath has no name for the element: it is in a namespace without a prefix. */
bool IsNameless(const xmlNode* node)
{
    const xmlNs* const space = kx::NamespaceOf(node);
    return node->type == XML_ELEMENT_NODE && space != nullptr && space->prefix == nullptr;
}

/** @return what selects the elements or attributes that are named like @p node. */
void AppendNameTest(std::string& text, const xmlNode* node, Spelling spelling)
{
    if (kx::NamespaceOf(node) != nullptr)
    {
        const std::string name = NameWithPrefix(node);
        text += spelling == Spelling::Path ? name : "*[name()='" + name + "']";
        return;
    }
    const std::string_view name = kx::FromEngine(node->name);
    const bool isPlain = spelling == Spelling::Path || name.find(':') == std::string_view::npos;
    text += isPlain ? "" : "*[name()='";
    text += name;
    text += isPlain ? "" : "']";
}

/** Appends a step without its position: nodes of one parent that share it are numbered. */
void AppendStep(std::string& text, const xmlNode* node, Spelling spelling)
{
    switch (node->type)
    {
    case XML_ATTRIBUTE_NODE:
        text += '@';
        AppendNameTest(text, node, spelling);
        break;
    case XML_TEXT_NODE:
    case XML_CDATA_SECTION_NODE:
        text += "text()";
        break;
    case XML_COMMENT_NODE:
        text += "comment()";
        break;
    case XML_PI_NODE:
        text += "processing-instruction('" + Text(node->name) + "')";
        break;
    default:
        if (IsNameless(node))
        {
            text += '*';
        }
        else
        {
            AppendNameTest(text, node, spelling);
        }
    }
}

/** What the nodes with the same step have in common: kind, name and prefix. */
using Alike = std::tuple<xmlElementType, std::string_view, std::string_view>;

std::string_view View(const xmlChar* text)
{
    return kx::FromEngine(text);
}

Alike AlikeOfElement(const xmlNode* element)
{
    const xmlNs* const space = kx::NamespaceOf(element);
    const std::string_view name = View(element->name);
    if (space != nullptr)
    {
        return {element->type, name, View(space->prefix)};
    }
    // A prefix that is not declared is a part of the name.
    const size_t colon = name.find(':');
    const bool hasPrefix = colon != std::string_view::npos && colon != 0;
    return hasPrefix ? Alike(element->type, name.substr(colon + 1), name.substr(0, colon))
                     : Alike(element->type, name, "");
}

Alike AlikeOf(const xmlNode* node)
{
    switch (node->type)
    {
    case XML_ELEMENT_NODE:
        return AlikeOfElement(node);
    case XML_CDATA_SECTION_NODE:
        return {XML_TEXT_NODE, "", ""};
    case XML_PI_NODE:
        return {node->type, View(node->name), ""};
    default:
        return {node->type, "", ""};
    }
}

/** More siblings than these are numbered all at once. */
const size_t kMostFew = 16;

bool HasFewChildren(const xmlNode* parent)
{
    size_t count = 0;
    for (const xmlNode* node = parent->children; node != nullptr && count <= kMostFew;
         node = node->next)
    {
        ++count;
    }
    return count <= kMostFew;
}

/** @return whether @p other shares the step of @p node: "*" stands for every element. */
bool ShareStep(const xmlNode* node, const xmlNode* other)
{
    return IsNameless(node) ? other->type == XML_ELEMENT_NODE
                            : !IsNameless(other) && AlikeOf(node) == AlikeOf(other);
}

/** @return the position of @p node among the siblings with the same step, or 0 if there is none. */
size_t PositionAmongSiblings(const xmlNode* node)
{
    size_t before = 0;
    size_t count = 0;
    for (const xmlNode* other = node->parent->children; other != nullptr; other = other->next)
    {
        before = other == node ? count : before;
        count += ShareStep(node, other) ? 1 : 0;
    }
    return count == 1 ? 0 : before + 1;
}

// The mark of a node: its position among the nodes with the same step, from 1, or 0 if there is no
// other; and in the lowest bit whether its own children are counted.

const uintptr_t kIsCounted = 1;

uintptr_t MarkOf(const xmlNode* node)
{
    return reinterpret_cast<uintptr_t>(node->_private);
}

void SetMark(const xmlNode* node, uintptr_t mark)
{
    // NOLINTNEXTLINE(performance-no-int-to-ptr): the engine's field is a pointer, the mark is none.
    const_cast<xmlNode*>(node)->_private = reinterpret_cast<void*>(mark);
}

void SetPosition(const xmlNode* node, uintptr_t position)
{
    SetMark(node, position << 1 | (MarkOf(node) & kIsCounted));
}

/** Numbers children that share a step. */
class Numbering
{
public:
    /** @return the position of @p node, which comes after those that were numbered before. */
    size_t Number(const xmlNode* node, const Alike& alike)
    {
        if (m_last == m_groups.end() || m_last->first != alike) // most are like the one before
        {
            m_last = m_groups.try_emplace(alike).first;
        }
        Group& group = m_last->second;
        group.first = group.count == 0 ? node : group.first;
        return ++group.count;
    }

    /** Takes the position from each node that shares its step with no other. */
    void RemoveFromSingleNodes() const
    {
        for (const auto& [alike, group] : m_groups)
        {
            if (group.count == 1)
            {
                SetPosition(group.first, 0);
            }
        }
    }

private:
    struct Group
    {
        const xmlNode* first = nullptr;
        size_t count = 0;
    };

    std::map<Alike, Group> m_groups;
    std::map<Alike, Group>::iterator m_last = m_groups.end();
};

void NumberChildren(const xmlNode* parent)
{
    Numbering named;
    Numbering others;   // texts between elements, too
    Numbering elements; // "*" stands for every one
    for (const xmlNode* node = parent->children; node != nullptr; node = node->next)
    {
        const bool isElement = node->type == XML_ELEMENT_NODE;
        const size_t place = isElement ? elements.Number(node, {}) : 0;
        Numbering& alike = isElement ? named : others;
        SetPosition(node, IsNameless(node) ? place : alike.Number(node, AlikeOf(node)));
    }
    named.RemoveFromSingleNodes();
    others.RemoveFromSingleNodes();
    elements.RemoveFromSingleNodes();
}

} // namespace

bool HasLocation(const xmlNode* node)
{
    return DepthOf(node).has_value();
}

Locations::~Locations()
{
    // The positions stay: they are not read before their parent's children are counted again.
    for (const xmlNode* const parent : m_counted)
    {
        SetMark(parent, MarkOf(parent) & ~kIsCounted);
    }
}

std::string Locations::Of(const xmlNode* node)
{
    std::string text;
    AppendTo(text, node);
    return text;
}

void Locations::AppendTo(std::string& text, const xmlNode* node)
{
    const std::optional<size_t> depth = DepthOf(node);
    if (!depth)
    {
        text += kWithoutPath;
        return;
    }
    Follow(node, *depth);
    text += m_path.empty() ? "/" : m_path;
}

std::string Locations::LastStepOf(const xmlNode* node)
{
    std::string step;
    AppendLastStep(step, node);
    return step;
}

bool Locations::IsOnPath(const xmlNode* node, size_t depth) const
{
    return depth <= m_steps.size() && m_steps[depth - 1].node == node;
}

/** Makes the path of @p node, which has @p depth steps, the last one. */
void Locations::Follow(const xmlNode* node, size_t depth)
{
    m_below.clear();
    for (; depth != 0 && !IsOnPath(node, depth); --depth)
    {
        m_below.push_back(node);
        node = node->parent;
    }
    m_steps.resize(depth);
    m_path.resize(depth == 0 ? 0 : m_steps.back().end);
    for (auto below = m_below.rbegin(); below != m_below.rend(); ++below)
    {
        m_path += '/';
        AppendLastStep(m_path, *below);
        m_steps.push_back({*below, m_path.size()});
    }
}

void Locations::AppendLastStep(std::string& text, const xmlNode* node)
{
    AppendStep(text, node, m_spelling);
    if (const size_t position = PositionOf(node))
    {
        text += '[' + std::to_string(position) + ']';
    }
}

size_t Locations::PositionOf(const xmlNode* node)
{
    if (node->type == XML_ATTRIBUTE_NODE || node->parent == nullptr)
    {
        return 0;
    }
    if (HasFewChildren(node->parent))
    {
        return PositionAmongSiblings(node);
    }
    if ((MarkOf(node->parent) & kIsCounted) == 0)
    {
        NumberChildren(node->parent);
        SetMark(node->parent, MarkOf(node->parent) | kIsCounted);
        m_counted.push_back(node->parent);
    }
    return MarkOf(node) >> 1;
}
