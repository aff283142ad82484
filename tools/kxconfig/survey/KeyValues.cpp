#include "survey/KeyValues.h"

#include "file/Nodes.h"

#include "config/KeyPath.h"

#include <algorithm>
#include <iterator>

namespace
{

std::vector<std::string> Segments(const std::string& key)
{
    std::vector<std::string> segments;
    kx::TextView rest(key);
    for (bool hasRest = true; hasRest;)
    {
        const kx::KeySplit split(rest);
        segments.push_back(Text(split.First()));
        rest = split.Rest();
        hasRest = split.HasRest();
    }
    return segments;
}

} // namespace

const char* ValueOf(const xmlNode* element)
{
    return kx::ContentOf(kx::OnlyTextChild(element));
}

std::string JoinedValues(const Elements& elements)
{
    std::string joined;
    for (const xmlNode* const element : elements)
    {
        joined += joined.empty() ? "" : "\n";
        joined += ValueOf(element);
    }
    return joined;
}

KeyValues::KeyValues(const xmlNode* root, Levels& levels) : m_levels(levels)
{
    m_path.push_back({Text(root->name), {root}});
}

Elements KeyValues::BearersUnder(const std::string& key)
{
    const std::vector<std::string> segments = Segments(key);
    size_t shared = 1; // the root
    while (shared < std::min(m_path.size(), segments.size()) &&
           m_path[shared].segment == segments[shared])
    {
        ++shared;
    }
    m_path.resize(shared);
    for (size_t i = shared; i != segments.size(); ++i)
    {
        m_path.push_back({segments[i], {}});
    }
    m_comparisons.clear();
    for (const xmlNode* const element : m_path[shared - 1].reached)
    {
        ReachFrom(element, shared);
    }
    Elements bearers;
    const Elements& reached = m_path.back().reached;
    std::copy_if(reached.begin(), reached.end(), std::back_inserter(bearers),
                 [](const xmlNode* element) { return kx::OnlyTextChild(element) != nullptr; });
    return bearers;
}

/** Reaches what the steps from @p depth on select below @p element. */
void KeyValues::ReachFrom(const xmlNode* element, size_t depth)
{
    if (depth == m_path.size())
    {
        return;
    }
    // An element with a value counts for every deeper segment too: the lookup takes it on its way,
    // and nothing is below it.
    if (kx::OnlyTextChild(element) != nullptr)
    {
        m_path[depth].reached.push_back(element);
        ReachFrom(element, depth + 1);
        return;
    }
    const std::string& segment = m_path[depth].segment;
    m_comparisons.push_back({element, segment});
    for (const Sibling& sibling : m_levels.Below(element).SelectedBy(segment))
    {
        m_path[depth].reached.push_back(sibling.element);
        ReachFrom(sibling.element, depth + 1);
    }
}
