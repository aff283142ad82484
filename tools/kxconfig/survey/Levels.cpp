#include "survey/Levels.h"

#include "file/Nodes.h"

#include "config/KeyPath.h"

#include <algorithm>
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

/** @return the attributes that a condition finds in @p element: the first of each name, without its
 * prefix, and the defaults of the others. */
std::vector<NamedValue> NamedValuesOf(const xmlNode* element,
                                      const std::map<std::string, Names>& defaulted)
{
    std::vector<NamedValue> attributes;
    std::unordered_set<std::string> names;
    for (const xmlAttr* attribute = element->properties; attribute != nullptr;
         attribute = attribute->next)
    {
        if (names.insert(Text(attribute->name)).second)
        {
            const auto node = reinterpret_cast<const xmlNode*>(attribute);
            attributes.push_back({Text(attribute->name), ContentOf(node)});
        }
    }
    const auto more = defaulted.find(Text(element->name));
    for (const std::string& name : more == defaulted.end() ? Names() : more->second)
    {
        if (names.insert(name).second && HasAttribute(element, name))
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
    for (const xmlNode* node = kx::ElementFrom(parent->children); node != nullptr;
         node = kx::ElementFrom(node->next))
    {
        Add(node, before != nullptr && !xmlStrEqual(before->name, node->name));
        before = node;
    }
}

void Level::Add(const xmlNode* element, bool suspended)
{
    const Sibling sibling = {m_elements.size(), element, suspended};
    m_elements.push_back(element);
    Namesakes& namesakes = m_byName[Text(element->name)];
    namesakes.all.push_back(sibling);
    if (suspended)
    {
        namesakes.suspended.push_back(sibling);
        m_otherThanFirst = m_otherThanFirst == nullptr ? element : m_otherThanFirst;
    }
    for (const std::string& condition : ConditionsOf(element))
    {
        namesakes.fulfilling[condition].push_back(sibling);
    }
}

std::string Level::SegmentOf(const xmlNode* element) const
{
    const std::string name = Text(element->name);
    const Namesakes& namesakes = m_byName.at(name);
    if (namesakes.all.size() == 1)
    {
        return name;
    }
    for (const std::string& condition : ConditionsOf(element))
    {
        if (namesakes.fulfilling.at(condition).size() == 1)
        {
            return name + condition;
        }
    }
    return name;
}

const Level::Namesakes& Level::NamesakesOf(const std::string& name) const
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
    static const Siblings kNone;
    const kx::Segment split((kx::TextView(segment)));
    const auto& fulfilling = NamesakesOf(Text(split.name)).fulfilling;
    const auto found = fulfilling.find(segment.substr(split.name.size));
    return found == fulfilling.end() ? kNone : found->second;
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
            conditions.push_back("@" + name + "=" + value);
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
