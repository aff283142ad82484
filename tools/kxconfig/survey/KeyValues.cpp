#include "survey/KeyValues.h"

#include "file/Nodes.h"

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
        segments.push_back(Text(split.First()));
        rest = split.Rest();
        hasRest = split.HasRest();
    }
    return segments;
}

/** @return the element that follows @p element in document order below @p root, or null. */
const xmlNode* NextElement(const xmlNode* element, const xmlNode* root)
{
    const xmlNode* next = kx::ElementFrom(element->children);
    while (next == nullptr && element != root)
    {
        next = kx::ElementFrom(element->next);
        element = element->parent;
    }
    return next;
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

KeyValues::KeyValues(const xmlNode* root, Levels& levels) : m_root(root), m_start(levels, {root})
{
    m_path.push_back({Text(root->name), {&m_start}});
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
        SortByPlace(bearers.first);
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
                     [this](const Comparison& one, const Comparison& other)
                     { return PlaceOf(one.parent) < PlaceOf(other.parent); });
    return m_comparisons;
}

void KeyValues::SortByPlace(Elements& elements)
{
    std::sort(elements.begin(), elements.end(),
              [this](const xmlNode* one, const xmlNode* other)
              { return PlaceOf(one) < PlaceOf(other); });
}

size_t KeyValues::PlaceOf(const xmlNode* element)
{
    if (m_places.empty())
    {
        for (const xmlNode* node = m_root; node != nullptr; node = NextElement(node, m_root))
        {
            m_places.emplace(node, m_places.size());
        }
    }
    return m_places.at(element);
}
