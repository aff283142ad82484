#include "survey/KeyValues.h"

#include "config/KeyPath.h"

#include <algorithm>
#include <cstddef>
#include <utility>

namespace
{

std::vector<std::string> Segments(const std::string& key)
{
    std::vector<std::string> segments;
    kx::TextView rest(key);
    for (bool hasRest = true; hasRest;)
    {
        const kx::KeySplit split(rest);
        segments.emplace_back(split.First().data, split.First().size);
        rest = split.Rest();
        hasRest = split.HasRest();
    }
    return segments;
}

bool IsBefore(const KeyElement* one, const KeyElement* other)
{
    return one->place < other->place;
}

} // namespace

std::string JoinedValues(const Elements& elements)
{
    std::string joined;
    for (const KeyElement* const element : elements)
    {
        joined += joined.empty() ? "" : "\n";
        joined += element->value;
    }
    return joined;
}

KeyValues::KeyValues(const KeyElement* root, Levels& levels) : m_start(levels, {root})
{
    m_path.push_back({std::string(root->name), {&m_start}});
}

Bearers KeyValues::BearersUnder(const std::string& key, size_t most)
{
    Follow(Segments(key));
    Bearers bearers = {};
    int parts = 0;
    for (const Step& step : m_path)
    {
        for (const SelectedElements* const selection : step.selected)
        {
            const Elements& part = selection->Bearers();
            const auto wanted = static_cast<std::ptrdiff_t>(std::min(part.size(), most));
            bearers.first.insert(bearers.first.end(), part.begin(), part.begin() + wanted);
            bearers.count += part.size();
            parts += part.empty() ? 0 : 1;
        }
    }
    if (parts > 1)
    {
        std::sort(bearers.first.begin(), bearers.first.end(), IsBefore);
        bearers.first.resize(std::min(bearers.first.size(), most));
    }
    return bearers;
}

void KeyValues::Follow(const std::vector<std::string>& segments)
{
    size_t shared = 1; // the root
    while (shared < std::min(m_path.size(), segments.size()) &&
           m_path[shared].segment == segments[shared])
    {
        ++shared;
    }
    m_path.resize(shared);
    m_comparisons.clear();
    for (size_t i = shared; i != segments.size(); ++i)
    {
        Step step = {segments[i], {}};
        for (SelectedElements* const selection : m_path.back().selected)
        {
            selection->Select(segments[i], step.selected, m_comparisons);
        }
        m_path.push_back(std::move(step));
    }
}

const std::vector<Comparison>& KeyValues::NewComparisons()
{
    std::stable_sort(m_comparisons.begin(), m_comparisons.end(),
                     [](const Comparison& one, const Comparison& other)
                     { return IsBefore(one.parent, other.parent); });
    return m_comparisons;
}
