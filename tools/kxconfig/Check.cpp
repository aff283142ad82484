#include "Commands.h"
#include "Document.h"
#include "KeyList.h"
#include "Locations.h"
#include "Nodes.h"
#include "Output.h"
#include "RoundTrip.h"
#include "Trail.h"

#include <map>
#include <set>

namespace
{

/** What there is to warn of, each once. */
class Warnings
{
public:
    void Warn(const xmlNode* node, const char* kind, const std::string& text)
    {
        Warn(LineNumberOf(node), kind, text);
    }

    void Warn(long line, const char* kind, const std::string& text)
    {
        if (m_texts.insert(text).second)
        {
            m_byLine.emplace(line, Warning{kind, text});
        }
    }

    /** @return true once for each @p level and @p name: what many keys share is told once. */
    bool IsNew(const xmlNode* level, std::string_view name)
    {
        return m_levels.emplace(level, Text(name)).second;
    }

    std::string LocationOf(const xmlNode* node) { return m_locations.Of(node); }

    std::string Place(const xmlNode* node)
    {
        return LocationOf(node) + " (line " + LineOf(node) + ")";
    }

    /** Prints them by line. @return whether there are any. */
    bool PrintFor(const std::string& file) const
    {
        for (const auto& [line, warning] : m_byLine)
        {
            const std::string place = file + ":" + std::to_string(line) + ": ";
            Print(OnOneLine(place + warning.text),
                  {{"line", line}, {"kind", warning.kind}, {"text", warning.text}});
        }
        return !m_byLine.empty();
    }

private:
    struct Warning
    {
        const char* kind;
        std::string text;
    };

    Locations m_locations;
    std::multimap<long, Warning> m_byLine;
    std::set<std::string> m_texts;
    std::set<std::pair<const xmlNode*, std::string>> m_levels;
};

// Keys: what a lookup finds, and what it would find if the elements stood in another order.

void CheckMatches(const Trail& trail, const std::string& key, Warnings& warnings)
{
    const std::vector<const TrailStep*> found = trail.StepsWithText();
    if (found.size() > 1)
    {
        warnings.Warn(found[1]->element, "ambiguous key",
                      Quoted(key) + " matches " + std::to_string(found.size()) +
                          " elements, the first of them " + warnings.Place(found[0]->element));
    }
}

/** The elements on a level whose order matters to a condition. */
struct Order
{
    const TrailStep* other = nullptr;     ///< would suspend the condition if it came first
    const TrailStep* rejected = nullptr;  ///< would then be taken
    const TrailStep* taken = nullptr;     ///< is taken like that as the file stands
    const TrailStep* suspender = nullptr; ///< suspended the condition for it
};

Order OrderOf(const TrailLevel& level)
{
    Order order;
    const TrailStep* suspender = nullptr; // of the step that is looked at
    for (const TrailStep& step : level.steps)
    {
        const bool isOther = step.verdict == Verdict::OtherName;
        const bool isRejected = step.verdict == Verdict::Rejected;
        order.other = isOther && order.other == nullptr ? &step : order.other;
        order.rejected = isRejected && order.rejected == nullptr ? &step : order.rejected;
        if (step.suspended && order.taken == nullptr && !Fulfils(step.element, step.condition))
        {
            order.taken = &step;
            order.suspender = suspender;
        }
        suspender = !isOther ? nullptr : suspender != nullptr ? suspender : &step;
    }
    return order;
}

void CheckOrder(const TrailLevel& level, Warnings& warnings)
{
    const Order order = OrderOf(level);
    if (order.other == nullptr || level.steps.front().condition.empty())
    {
        return;
    }
    const std::string segment =
        Quoted(Text(level.steps.front().name) + "@" + Text(level.steps.front().condition));
    if (order.taken != nullptr)
    {
        warnings.Warn(
            order.taken->element, "suspended condition",
            warnings.LocationOf(order.taken->element) + " is taken for " + segment +
                " though it does not fulfil it: " + warnings.Place(order.suspender->element) +
                ", of another name and in front of it, suspends the condition");
    }
    else if (order.rejected != nullptr && warnings.IsNew(level.parent, level.steps.front().name))
    {
        warnings.Warn(order.rejected->element, "condition depends on order",
                      warnings.LocationOf(order.rejected->element) + " would be taken for " +
                          segment + " if " + warnings.Place(order.other->element) +
                          ", of another name, came right before it");
    }
}

void CheckOrders(const TrailLevel& level, Warnings& warnings)
{
    if (!level.steps.empty())
    {
        CheckOrder(level, warnings);
    }
    for (const TrailStep& step : level.steps)
    {
        if (step.below != nullptr)
        {
            CheckOrders(*step.below, warnings);
        }
    }
}

void CheckLookup(xmlDoc* document, const std::string& key, Warnings& warnings)
{
    const Trail trail = RecordLookup(document, key);
    CheckMatches(trail, key, warnings);
    if (trail.top != nullptr)
    {
        CheckOrders(*trail.top, warnings);
    }
}

// Elements: what no lookup can see, and what no condition can tell apart.

/** @return the text directly in @p element that is more than white space. */
std::string OwnText(const xmlNode* element)
{
    std::string text;
    for (const xmlNode* child = element->children; child != nullptr; child = child->next)
    {
        const bool isText = child->type == XML_TEXT_NODE || child->type == XML_CDATA_SECTION_NODE ||
                            child->type == XML_ENTITY_REF_NODE;
        if (isText && xmlIsBlankNode(child) != 1)
        {
            text += ContentOf(child);
        }
    }
    return text;
}

void CheckVisible(const xmlNode* element, Warnings& warnings)
{
    const std::string name = Text(element->name);
    if (name.find('.') != std::string::npos)
    {
        warnings.Warn(
            element, "unreachable element",
            warnings.LocationOf(element) +
                " cannot be named by a key: its name holds a \".\", which ends a segment");
    }
    const std::string text = OwnText(element);
    if (OnlyTextOf(element) == nullptr && !text.empty())
    {
        warnings.Warn(element, "invisible value",
                      warnings.LocationOf(element) + " has no value though it holds " +
                          Quoted(text) + ": " + WhyNoValue(element));
    }
}

using Group = std::vector<const xmlNode*>; // siblings of one name

/** @return how often each value of the attribute @p name occurs in @p group. */
std::map<std::string, int> CountValues(const Group& group, const std::string& name)
{
    std::map<std::string, int> counts;
    for (const xmlNode* const element : group)
    {
        if (HasAttribute(element, name))
        {
            ++counts[AttributeOf(element, name)];
        }
    }
    return counts;
}

/** @return the attribute that tells the most elements of @p group apart; empty if there is none. */
std::string TellingAttribute(const Group& group)
{
    std::string telling;
    size_t most = 0;
    for (const xmlAttr* attribute = group.front()->properties; attribute != nullptr;
         attribute = attribute->next)
    {
        const size_t values = CountValues(group, Text(attribute->name)).size();
        if (values > most)
        {
            most = values;
            telling = Text(attribute->name);
        }
    }
    return telling;
}

void CheckGroup(const Group& group, Warnings& warnings)
{
    const std::string telling = TellingAttribute(group);
    std::map<std::string, const xmlNode*> bearers;
    for (const xmlNode* const element : group)
    {
        if (telling.empty() || !HasAttribute(element, telling))
        {
            continue;
        }
        const std::string value = AttributeOf(element, telling);
        const auto bearer = bearers.emplace(value, element);
        if (!bearer.second)
        {
            warnings.Warn(element, "repeated attribute",
                          warnings.LocationOf(element) + " has the same " + telling + "=" +
                              Quoted(value) + " as " + warnings.Place(bearer.first->second));
        }
    }
}

void CheckElements(const xmlNode* element, Warnings& warnings)
{
    CheckVisible(element, warnings);
    std::map<std::string, Group> groups;
    for (const xmlNode* child = element->children; child != nullptr; child = child->next)
    {
        if (child->type == XML_ELEMENT_NODE)
        {
            groups[Text(child->name)].push_back(child);
        }
    }
    for (const auto& group : groups)
    {
        CheckGroup(group.second, warnings);
    }
    for (const xmlNode* child = element->children; child != nullptr; child = child->next)
    {
        if (child->type == XML_ELEMENT_NODE)
        {
            CheckElements(child, warnings);
        }
    }
}

void CheckSaving(CXMLReader& reader, const std::string& file, Warnings& warnings)
{
    for (const Difference& difference : WhatSavingChanges(reader, file))
    {
        warnings.Warn(difference.line, "changed by saving", "saving changes " + difference.what);
    }
}

} // namespace

ExitStatus Check(const std::string& file, const std::vector<std::string>& keys)
{
    const std::unique_ptr<CXMLReader> reader = LoadFile(file);
    if (reader == nullptr)
    {
        return ExitStatus::BadFile;
    }
    for (const std::string& key : keys)
    {
        const ExitStatus status = CheckKey(file, key, *reader);
        if (status != ExitStatus::Done)
        {
            return status;
        }
    }
    const auto document = static_cast<xmlDoc*>(reader->GetDataPtr());
    Warnings warnings;
    Levels levels(document);
    for (const std::string& key : keys.empty() ? ListKeys(RootOf(*reader), levels) : keys)
    {
        CheckLookup(document, key, warnings);
    }
    CheckElements(RootOf(*reader), warnings);
    CheckSaving(*reader, file, warnings);
    return warnings.PrintFor(file) ? ExitStatus::NothingFound : ExitStatus::Done;
}
