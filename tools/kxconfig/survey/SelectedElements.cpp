#include "survey/SelectedElements.h"

#include "config/KeyPath.h"

#include <utility>

namespace
{

/** @return the parents of @p siblings, each once. */
Elements ParentsOf(const Siblings& siblings)
{
    Elements parents;
    for (const Sibling& sibling : siblings)
    {
        if (parents.empty() || parents.back() != sibling.element->parent)
        {
            parents.push_back(sibling.element->parent);
        }
    }
    return parents;
}

} // namespace

SelectedElements::SelectedElements(Levels& levels, const Elements& elements) : m_levels(levels)
{
    for (const KeyElement* const element : elements)
    {
        (element->HasValue() ? m_bearers : m_parents).push_back(element);
    }
}

void SelectedElements::Select(const std::string& segment,
                              std::vector<SelectedElements*>& selections,
                              std::vector<Comparison>& comparisons)
{
    if (m_parents.empty())
    {
        return;
    }
    const Level& children = Children();
    const kx::Segment split((kx::TextView(segment)));
    const std::string name(split.name.data, split.name.size);
    if (split.condition.IsEmpty())
    {
        Add({name, children.Named(name), true}, selections);
        return;
    }
    Compare(name, segment, comparisons);
    Add({name + "@", children.Suspended(name), true}, selections);
    Add({segment, children.Fulfilling(segment), false}, selections);
}

const Level& SelectedElements::Children()
{
    if (m_parents.size() == 1)
    {
        return m_levels.Below(m_parents.front());
    }
    if (m_children == nullptr)
    {
        m_children = std::make_unique<const Level>(m_parents);
    }
    return *m_children;
}

void SelectedElements::Add(const Part& part, std::vector<SelectedElements*>& selections)
{
    const auto [entry, isNew] = m_parts.try_emplace(part.name);
    if (isNew)
    {
        Elements elements;
        for (const Sibling& sibling : part.siblings)
        {
            if (part.withSuspended || !sibling.suspended)
            {
                elements.push_back(sibling.element);
            }
        }
        if (!elements.empty())
        {
            entry->second = std::make_unique<SelectedElements>(m_levels, elements);
        }
    }
    if (entry->second != nullptr)
    {
        selections.push_back(entry->second.get());
    }
}

// What no element below a parent fulfills is compared alike, so that it is enough to compare one
// such segment there.
void SelectedElements::Compare(const std::string& name, const std::string& segment,
                               std::vector<Comparison>& comparisons)
{
    if (!m_compared.insert(segment).second)
    {
        return;
    }
    const auto [uncompared, isFirst] = m_uncompared.try_emplace(name);
    if (isFirst)
    {
        uncompared->second = ParentsOf(Children().Named(name));
    }
    Elements fulfilling = ParentsOf(Children().Fulfilling(segment));
    for (const Elements* const parents : {&uncompared->second, &fulfilling})
    {
        for (const KeyElement* const parent : *parents)
        {
            comparisons.push_back({parent, segment});
        }
    }
    uncompared->second = std::move(fulfilling);
}
