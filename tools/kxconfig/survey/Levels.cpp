#include "survey/Levels.h"

#include "file/Nodes.h"

#include "config/KeyPath.h"

#include <algorithm>
#include <functional>
#include <iterator>
#include <unordered_set>
#include <utility>

namespace
{

using Names = std::vector<std::string>;

void AddDefaulted(const xmlDtd* dtd, std::map<std::string, Names>& defaulted)
{
    const xmlNode* node = dtd == nullptr ? nullptr : dtd->children;
    for (; node != nullptr; node = node->next)
    {
        const auto declaration = reinterpret_cast<const xmlAttribute*>(node);
        // One with a prefix would be the default of every element, for a condition asks for the
        // whole name and finds no attribute that an element bears itself: it distinguishes none.
        if (node->type == XML_ATTRIBUTE_DECL && declaration->defaultValue != nullptr &&
            declaration->prefix == nullptr)
        {
            defaulted[Text(declaration->elem)].push_back(Text(declaration->name));
        }
    }
}

struct NamedValue
{
    std::string name;
    std::string value;
};

/** The names of attributes that were seen: nearly always few. */
class SeenNames
{
public:
    /** @return whether @p name was not seen before. */
    bool Add(std::string_view name)
    {
        if (m_many.empty() && m_few.size() < kMostFew)
        {
            const bool isNew = std::find(m_few.begin(), m_few.end(), name) == m_few.end();
            if (isNew)
            {
                m_few.push_back(name);
            }
            return isNew;
        }
        m_many.insert(m_few.begin(), m_few.end());
        m_few.clear();
        return m_many.insert(name).second;
    }

private:
    static const size_t kMostFew = 8;

    std::vector<std::string_view> m_few;
    std::unordered_set<std::string_view> m_many;
};

/** @return the value of @p attribute; nearly always it is one text. */
std::string ValueOf(const xmlAttr* attribute)
{
    const xmlNode* const text = kx::OnlyText(attribute->children);
    return text == nullptr ? ContentOf(reinterpret_cast<const xmlNode*>(attribute))
                           : std::string(kx::ContentOf(text));
}

/** @return the attributes that a condition finds in @p element: the first of each name, without its
 * prefix, and the defaults of the others. */
std::vector<NamedValue> NamedValuesOf(const xmlNode* element,
                                      const std::map<std::string, Names>& defaulted)
{
    std::vector<NamedValue> attributes;
    SeenNames names;
    for (const xmlAttr* attribute = element->properties; attribute != nullptr;
         attribute = attribute->next)
    {
        if (names.Add(kx::FromEngine(attribute->name)))
        {
            attributes.push_back({Text(attribute->name), ValueOf(attribute)});
        }
    }
    if (defaulted.empty())
    {
        return attributes;
    }
    const auto more = defaulted.find(Text(element->name));
    for (const std::string& name : more == defaulted.end() ? Names() : more->second)
    {
        if (HasAttribute(element, name) && names.Add(name))
        {
            attributes.push_back({name, AttributeOf(element, name)});
        }
    }
    return attributes;
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
    size_t bearer;
    size_t number; ///< in the order of elements and attributes
    std::string condition;
};

bool ComesBefore(const FulfilledCondition& one, const FulfilledCondition& other)
{
    return one.hash != other.hash ? one.hash < other.hash : one.condition < other.condition;
}

using ConditionIterator = std::vector<FulfilledCondition>::const_iterator;

/** @return the end of the conditions that are the same as the one at @p begin. */
ConditionIterator EndOfSame(ConditionIterator begin, ConditionIterator end)
{
    return std::find_if(std::next(begin), end,
                        [begin](const FulfilledCondition& other)
                        { return ComesBefore(*begin, other); });
}

} // namespace

bool IsFreeOf(const char* separators, const std::string& text)
{
    return text.find_first_of(separators) == std::string::npos;
}

Level::Level(const Elements& parents, const std::map<std::string, Names>& defaulted)
    : m_defaulted(defaulted)
{
    for (const xmlNode* const parent : parents)
    {
        AddChildrenOf(parent);
    }
}

void Level::AddChildrenOf(const xmlNode* parent)
{
    const xmlNode* before = nullptr;
    Namesakes* namesakes = nullptr; // of the one before
    for (const xmlNode* node = kx::ElementFrom(parent->children); node != nullptr;
         node = kx::ElementFrom(node->next))
    {
        const bool isSameName = before != nullptr && xmlStrEqual(before->name, node->name) != 0;
        if (!isSameName)
        {
            namesakes = &m_byName[kx::FromEngine(node->name)];
        }
        Add(node, before != nullptr && !isSameName, *namesakes);
        before = node;
    }
}

void Level::Add(const xmlNode* element, bool suspended, Namesakes& namesakes)
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

std::vector<std::string> Level::Segments() const
{
    std::vector<std::string> segments;
    segments.reserve(m_elements.size());
    for (const xmlNode* const element : m_elements)
    {
        segments.push_back(Text(element->name));
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

/** Adds to the segment of each of @p namesakes the first condition that no other one fulfills. */
void Level::AddConditions(const Siblings& namesakes, std::vector<std::string>& segments) const
{
    std::vector<FulfilledCondition> all;
    all.reserve(namesakes.size());
    for (size_t i = 0; i != namesakes.size(); ++i)
    {
        for (std::string& condition : ConditionsOf(namesakes[i].element))
        {
            all.push_back(
                {std::hash<std::string>()(condition), i, all.size(), std::move(condition)});
        }
    }
    std::sort(all.begin(), all.end(), ComesBefore);
    std::vector<const FulfilledCondition*> chosen(namesakes.size());
    for (ConditionIterator at = all.begin(), next; at != all.end(); at = next)
    {
        next = EndOfSame(at, all.end());
        const FulfilledCondition*& before = chosen[at->bearer];
        const bool isUnique = next == std::next(at);
        before = isUnique && (before == nullptr || at->number < before->number) ? &*at : before;
    }
    for (size_t i = 0; i != namesakes.size(); ++i)
    {
        segments[namesakes[i].place] += chosen[i] == nullptr ? "" : chosen[i]->condition;
    }
}

bool Level::SelectsOnly(const xmlNode* element, const std::string& segment) const
{
    const std::string_view name = kx::FromEngine(element->name);
    const Namesakes& namesakes = NamesakesOf(name);
    if (segment.size() == name.size())
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

const Siblings& Level::Named(const std::string& name) const
{
    return NamesakesOf(name).all;
}

const Siblings& Level::Suspended(const std::string& name) const
{
    return NamesakesOf(name).suspended;
}

const Siblings& Level::Fulfilling(const std::string& segment) const
{
    const kx::TextView name = kx::Segment(kx::TextView(segment)).name;
    return Fulfilling(NamesakesOf({name.data, name.size}), segment.substr(name.size));
}

const Siblings& Level::Fulfilling(const Namesakes& namesakes, const std::string& condition) const
{
    static const Siblings kNone;
    if (!namesakes.fulfilling)
    {
        namesakes.fulfilling = SortByCondition(namesakes.all);
    }
    const auto found = namesakes.fulfilling->find(condition);
    return found == namesakes.fulfilling->end() ? kNone : found->second;
}

Level::ByCondition Level::SortByCondition(const Siblings& siblings) const
{
    ByCondition byCondition;
    for (const Sibling& sibling : siblings)
    {
        for (const std::string& condition : ConditionsOf(sibling.element))
        {
            byCondition[condition].push_back(sibling);
        }
    }
    return byCondition;
}

Order Level::OrderFor(const std::string& segment) const
{
    const std::string name = Text(kx::Segment(kx::TextView(segment)).name);
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

const xmlNode* Level::FirstNotNamed(const std::string& name) const
{
    if (m_elements.empty())
    {
        return nullptr;
    }
    const xmlNode* const first = m_elements.front();
    return Text(first->name) == name ? m_otherThanFirst : first;
}

/** @return the first element after the namesake in front of @p suspended. */
const xmlNode* Level::SuspenderOf(const Sibling& suspended, const Siblings& namesakes) const
{
    const auto at = std::lower_bound(namesakes.begin(), namesakes.end(), suspended, ComesFirst);
    return m_elements[at == namesakes.begin() ? 0 : std::prev(at)->place + 1];
}

/** @return the conditions of one attribute, as "@name=value", that @p element fulfills. */
std::vector<std::string> Level::ConditionsOf(const xmlNode* element) const
{
    std::vector<std::string> conditions;
    for (const auto& [name, value] : NamedValuesOf(element, m_defaulted))
    {
        if (IsFreeOf(".|&=@", name) && IsFreeOf(".|&\t\r\n", value))
        {
            std::string& condition = conditions.emplace_back("@");
            condition.append(name).append("=").append(value);
        }
    }
    return conditions;
}

Levels::Levels(const xmlDoc* document)
{
    AddDefaulted(document->intSubset, m_defaulted);
    AddDefaulted(document->extSubset, m_defaulted);
}

const Level& Levels::Below(const xmlNode* parent)
{
    const auto level = m_levels.find(parent);
    return level != m_levels.end()
               ? level->second
               : m_levels.emplace(parent, Below(Elements{parent})).first->second;
}

std::map<std::string, std::string> Levels::AttributesOf(const xmlNode* element) const
{
    std::map<std::string, std::string> attributes;
    for (NamedValue& attribute : NamedValuesOf(element, m_defaulted))
    {
        attributes.emplace(std::move(attribute.name), std::move(attribute.value));
    }
    return attributes;
}
