#include "Commands.h"
#include "Document.h"
#include "KeyList.h"
#include "KeyValues.h"
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

void CheckMatches(const Elements& found, const std::string& key, Warnings& warnings)
{
    if (found.size() > 1)
    {
        warnings.Warn(found[1], "ambiguous key",
                      Quoted(key) + " matches " + std::to_string(found.size()) +
                          " elements, the first of them " + warnings.Place(found[0]));
    }
}

/** @param segment  has a condition, and is what the children of @p parent are compared with. */
void CheckOrder(const Order& order, const xmlNode* parent, const std::string& segment,
                Warnings& warnings)
{
    if (order.taken != nullptr)
    {
        warnings.Warn(order.taken, "suspended condition",
                      warnings.LocationOf(order.taken) + " is taken for " + Quoted(segment) +
                          " though it does not fulfil it: " + warnings.Place(order.suspender) +
                          ", of another name and in front of it, suspends the condition");
    }
    else if (order.other != nullptr && order.rejected != nullptr &&
             warnings.IsNew(parent, segment.substr(0, segment.find('@'))))
    {
        warnings.Warn(order.rejected, "condition depends on order",
                      warnings.LocationOf(order.rejected) + " would be taken for " +
                          Quoted(segment) + " if " + warnings.Place(order.other) +
                          ", of another name, came right before it");
    }
}

// A key that somebody gives can hold anything: what is told of it comes from the library's walk.

Order OrderOf(const TrailLevel& level)
{
    Order order;
    const xmlNode* suspender = nullptr; // of the step that is looked at
    for (const TrailStep& step : level.steps)
    {
        const bool isOther = step.verdict == Verdict::OtherName;
        const bool isRejected = step.verdict == Verdict::Rejected;
        order.other = isOther && order.other == nullptr ? step.element : order.other;
        order.rejected = isRejected && order.rejected == nullptr ? step.element : order.rejected;
        if (step.suspended && order.taken == nullptr && !Fulfils(step.element, step.condition))
        {
            order.taken = step.element;
            order.suspender = suspender;
        }
        suspender = !isOther ? nullptr : suspender != nullptr ? suspender : step.element;
    }
    return order;
}

void CheckOrders(const TrailLevel& level, Warnings& warnings)
{
    if (!level.steps.empty() && !level.steps.front().condition.empty())
    {
        const TrailStep& first = level.steps.front();
        const std::string segment = Text(first.name) + "@" + Text(first.condition);
        CheckOrder(OrderOf(level), level.parent, segment, warnings);
    }
    for (const TrailStep& step : level.steps)
    {
        if (step.below != nullptr)
        {
            CheckOrders(*step.below, warnings);
        }
    }
}

/** An element that a lookup accepts, and the number of levels that it stands below the root. */
struct Accepted
{
    const xmlNode* element;
    int depth;
};

/** @return the deepest element accepted on @p level and below, the first of them; else @p above. */
Accepted DeepestAccepted(const TrailLevel& level, const Accepted& above)
{
    Accepted deepest = above;
    for (const TrailStep& step : level.steps)
    {
        if (step.verdict == Verdict::Accepted)
        {
            const Accepted here = {step.element, above.depth + 1};
            const Accepted below =
                step.below != nullptr ? DeepestAccepted(*step.below, here) : here;
            deepest = below.depth > deepest.depth ? below : deepest;
        }
    }
    return deepest;
}

void WarnOfNoValue(const Trail& trail, xmlDoc* document, const std::string& key, Warnings& warnings)
{
    const Accepted root = {xmlDocGetRootElement(document), 0};
    const xmlNode* const end =
        trail.top == nullptr ? root.element : DeepestAccepted(*trail.top, root).element;
    warnings.Warn(end, "key without a value",
                  Quoted(key) + " has no value: it leads as far as " + warnings.LocationOf(end) +
                      "; kxconfig explain tells why");
}

void CheckLookup(xmlDoc* document, const std::string& key, Warnings& warnings)
{
    const Trail trail = RecordLookup(document, key);
    Elements found;
    for (const TrailStep* const step : trail.StepsWithText())
    {
        found.push_back(step->element);
    }
    if (found.empty())
    {
        WarnOfNoValue(trail, document, key, warnings);
    }
    CheckMatches(found, key, warnings);
    if (trail.top != nullptr)
    {
        CheckOrders(*trail.top, warnings);
    }
}

/** The same for all keys that can be listed, which are too many to walk for each. */
void CheckListedKeys(const xmlNode* root, Warnings& warnings)
{
    Levels levels(root->doc);
    KeyValues values(root, levels);
    for (const std::string& key : ListKeys(root, levels))
    {
        CheckMatches(values.BearersUnder(key), key, warnings);
        for (const auto& [parent, segment] : values.NewComparisons())
        {
            if (!IsFreeOf("@", segment))
            {
                CheckOrder(levels.Below(parent).OrderFor(segment), parent, segment, warnings);
            }
        }
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
    Warnings warnings;
    for (const std::string& key : keys)
    {
        CheckLookup(static_cast<xmlDoc*>(reader->GetDataPtr()), key, warnings);
    }
    if (keys.empty())
    {
        CheckListedKeys(RootOf(*reader), warnings);
    }
    CheckElements(RootOf(*reader), warnings);
    CheckSaving(*reader, file, warnings);
    return warnings.PrintFor(file) ? ExitStatus::NothingFound : ExitStatus::Done;
}
