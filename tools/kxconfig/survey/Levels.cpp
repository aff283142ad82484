#include "survey/Levels.h"

#include "survey/ByteSet.h"
#include "survey/KeyAttributes.h"

#include "config/KeyPath.h"

#include <algorithm>
#include <functional>
#include <iterator>
#include <utility>

namespace
{

constexpr ByteSet kNotInNames(".|&=@");
constexpr ByteSet kNotInValues(".|&\t\r\n");

/** @return whether a key can have the attribute as a condition. */
bool CanBeCondition(const KeyAttribute& attribute)
{
    return !kNotInNames.IsIn(attribute.name) && !kNotInValues.IsIn(attribute.value);
}

bool ComesFirst(const Sibling& one, const Sibling& other)
{
    return one.place < other.place;
}

/** @return the first of @p siblings that is none of @p excepted, or null; both are in order. */
const Sibling* FirstExcept(const Siblings& excepted, const Siblings& siblings)
{
    auto exception = excepted.begin();
    for (const Sibling& sibling : siblings)
    {
        exception = std::lower_bound(exception, excepted.end(), sibling, ComesFirst);
        if (exception == excepted.end() || exception->element != sibling.element)
        {
            return &sibling;
        }
    }
    return nullptr;
}

/** A condition, and an element that fulfills it. */
struct FulfilledCondition
{
    size_t hash; ///< of the condition: numbers are faster to sort than texts
    const KeyAttribute* condition;
    size_t bearer;
};

bool ComesBefore(const FulfilledCondition& one, const FulfilledCondition& other)
{
    return one.hash != other.hash ? one.hash < other.hash
                                  : CompareAttributes(*one.condition, *other.condition) < 0;
}

std::vector<FulfilledCondition> SortedConditions(const Siblings& namesakes)
{
    std::vector<FulfilledCondition> all;
    all.reserve(namesakes.size());
    for (size_t i = 0; i != namesakes.size(); ++i)
    {
        for (const KeyAttribute& attribute : *namesakes[i].element)
        {
            if (CanBeCondition(attribute))
            {
                all.push_back({HashOf(attribute), &attribute, i});
            }
        }
    }
    std::sort(all.begin(), all.end(), ComesBefore);
    return all;
}

using ConditionIterator = std::vector<FulfilledCondition>::const_iterator;

/** @return the end of the conditions that are the same as the one at @p begin. */
ConditionIterator EndOfSame(ConditionIterator begin, ConditionIterator end)
{
    return std::find_if(std::next(begin), end,
                        [begin](const FulfilledCondition& other)
                        { return ComesBefore(*begin, other); });
}

/** Gives the segment of each of @p namesakes the first condition that no other one fulfills. */
void AddConditions(const Siblings& namesakes, std::vector<KeySegment>& segments)
{
    const std::vector<FulfilledCondition> all = SortedConditions(namesakes);
    for (ConditionIterator at = all.begin(), next; at != all.end(); at = next)
    {
        next = EndOfSame(at, all.end());
        const KeyAttribute*& before = segments[namesakes[at->bearer].place].condition;
        const bool isUnique = next == std::next(at);
        before = isUnique && (before == nullptr || at->condition < before) ? at->condition : before;
    }
}

/** @return @p siblings by the conditions that they fulfill, "@name=value". */
std::unordered_map<std::string, Siblings> SortByCondition(const Siblings& siblings)
{
    std::unordered_map<std::string, Siblings> byCondition;
    for (const Sibling& sibling : siblings)
    {
        for (const KeyAttribute& attribute : *sibling.element)
        {
            if (CanBeCondition(attribute))
            {
                byCondition[KeySegment{"", &attribute}.Text()].push_back(sibling);
            }
        }
    }
    return byCondition;
}

std::string_view NameIn(const std::string& segment)
{
    const kx::TextView name = kx::Segment(kx::TextView(segment)).name;
    return {name.data, name.size};
}

} // namespace

void KeySegment::AppendTo(std::string& text) const
{
    text.append(name);
    if (condition != nullptr)
    {
        text.append(1, '@').append(condition->name).append(1, '=').append(condition->value);
    }
}

Level::Level(const Elements& parents)
{
    for (const KeyElement* const parent : parents)
    {
        AddChildrenOf(parent);
    }
}

void Level::AddChildrenOf(const KeyElement* parent)
{
    const KeyElement* before = nullptr;
    Namesakes* namesakes = nullptr; // of the one before
    for (const KeyElement* element = parent->children; element != nullptr; element = element->next)
    {
        const bool isSameName = before != nullptr && before->name == element->name;
        if (!isSameName)
        {
            namesakes = &m_byName[element->name];
        }
        Add(element, before != nullptr && !isSameName, *namesakes);
        before = element;
    }
}

void Level::Add(const KeyElement* element, bool suspended, Namesakes& namesakes)
{
    const Sibling sibling = {m_elements.size(), element, suspended};
    m_elements.push_back(element);
    namesakes.all.push_back(sibling);
    if (suspended)
    {
        namesakes.suspended.push_back(sibling);
        m_otherThanFirst = m_otherThanFirst == nullptr ? element : m_otherThanFirst;
    }
}

std::vector<KeySegment> Level::Segments() const
{
    std::vector<KeySegment> segments;
    segments.reserve(m_elements.size());
    for (const KeyElement* const element : m_elements)
    {
        segments.push_back({element->name, nullptr});
    }
    for (const auto& [name, namesakes] : m_byName)
    {
        if (namesakes.all.size() > 1)
        {
            AddConditions(namesakes.all, segments);
        }
    }
    return segments;
}

bool Level::SelectsOnly(const KeyElement* element, const KeySegment& segment) const
{
    const Namesakes& namesakes = NamesakesOf(element->name);
    if (segment.condition == nullptr)
    {
        return namesakes.all.size() == 1;
    }
    // No other element fulfills the condition.
    const Siblings& suspended = namesakes.suspended;
    return suspended.empty() || (suspended.size() == 1 && suspended[0].element == element);
}

const Level::Namesakes& Level::NamesakesOf(std::string_view name) const
{
    static const Namesakes kNone;
    const auto found = m_byName.find(name);
    return found == m_byName.end() ? kNone : found->second;
}

const Siblings& Level::Named(std::string_view name) const
{
    return NamesakesOf(name).all;
}

const Siblings& Level::Suspended(std::string_view name) const
{
    return NamesakesOf(name).suspended;
}

const Siblings& Level::Fulfilling(const std::string& segment) const
{
    static const Siblings kNone;
    const std::string_view name = NameIn(segment);
    const Namesakes& namesakes = NamesakesOf(name);
    if (!namesakes.fulfilling)
    {
        namesakes.fulfilling = SortByCondition(namesakes.all);
    }
    const auto found = namesakes.fulfilling->find(segment.substr(name.size()));
    return found == namesakes.fulfilling->end() ? kNone : found->second;
}

Order Level::OrderFor(const std::string& segment) const
{
    const std::string_view name = NameIn(segment);
    const Siblings& fulfilling = Fulfilling(segment);
    Order order;
    order.other = FirstNotNamed(name);
    if (const Sibling* const taken = FirstExcept(fulfilling, Suspended(name)))
    {
        order.taken = taken->element;
        order.suspender = SuspenderOf(*taken, Named(name));
    }
    // If none is taken like that, the condition rejects all the others that do not fulfill it.
    else if (const Sibling* const rejected = FirstExcept(fulfilling, Named(name)))
    {
        order.rejected = rejected->element;
    }
    return order;
}

const KeyElement* Level::FirstNotNamed(std::string_view name) const
{
    if (m_elements.empty())
    {
        return nullptr;
    }
    const KeyElement* const first = m_elements.front();
    return first->name == name ? m_otherThanFirst : first;
}

/** @return the first element after the namesake in front of @p suspended. */
const KeyElement* Level::SuspenderOf(const Sibling& suspended, const Siblings& namesakes) const
{
    const auto at = std::lower_bound(namesakes.begin(), namesakes.end(), suspended, ComesFirst);
    return m_elements[at == namesakes.begin() ? 0 : std::prev(at)->place + 1];
}

const Level& Levels::Below(const KeyElement* parent)
{
    const auto level = m_levels.find(parent);
    return level != m_levels.end() ? level->second
                                   : m_levels.emplace(parent, Elements{parent}).first->second;
}
