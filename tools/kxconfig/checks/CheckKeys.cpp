#include "checks/CheckKeys.h"

#include "file/Nodes.h"
#include "output/Quoting.h"
#include "survey/KeyList.h"
#include "survey/KeyValues.h"
#include "walk/Trail.h"
#include "walk/UpdateReach.h"

#include "config/KeyPath.h"

#include <algorithm>
#include <iterator>
#include <unordered_set>

namespace
{

// Keys: what a lookup finds, and what it would find if the elements stood in another order.

std::string Counted(size_t count)
{
    return std::to_string(count) + (count == 1 ? " element" : " elements");
}

using Nodes = std::vector<const xmlNode*>;
using NodeOrder = OrderAmong<xmlNode>;

const xmlNode* NodeOf(const KeyElement* element)
{
    return element == nullptr ? nullptr : element->node;
}

NodeOrder InNodes(const Order& order)
{
    return {NodeOf(order.other), NodeOf(order.rejected), NodeOf(order.taken),
            NodeOf(order.suspender)};
}

/** @param found  the first ones of @p count elements. */
void CheckMatches(size_t count, const Nodes& found, const std::string& key, Kind kind,
                  Findings& findings)
{
    if (count > 1 && findings.Want(kind))
    {
        findings.Add(found[1], kind,
                     Quoted(key) + " matches " + Counted(count) + ", the first of them " +
                         findings.Place(found[0]));
    }
}

/** @param segment  has a condition, and is what the children of @p parent are compared with. */
void CheckOrder(const NodeOrder& order, const xmlNode* parent, const std::string& segment,
                Findings& findings)
{
    const std::string name = Text(kx::Segment(kx::TextView(segment)).name);
    if (order.taken != nullptr)
    {
        if (findings.Want(Kind::SuspendedCondition) &&
            findings.MarkReported(Kind::SuspendedCondition, parent, name))
        {
            findings.Add(
                order.taken, Kind::SuspendedCondition,
                findings.LocationOf(order.taken) + " is accepted for " + Quoted(segment) +
                    " although it does not fulfill it: " + findings.Place(order.suspender) +
                    ", a preceding element of another name, suspends the condition");
        }
    }
    else if (order.other != nullptr && order.rejected != nullptr &&
             findings.Want(Kind::ConditionDependsOnOrder) &&
             findings.MarkReported(Kind::ConditionDependsOnOrder, parent, name))
    {
        findings.Add(order.rejected, Kind::ConditionDependsOnOrder,
                     findings.LocationOf(order.rejected) + " would be accepted for " +
                         Quoted(segment) + " if " + findings.Place(order.other) +
                         ", which has another name, preceded it directly");
    }
}

/** Checks the order on the levels of a key that leads to one element. */
void CheckOrders(const ListedKey& listed, Findings& findings)
{
    if (!findings.Want(Kind::ConditionDependsOnOrder))
    {
        return; // no condition of such a key is suspended for another element
    }
    for (const auto& [parent, level, segment, isNew] : listed.steps)
    {
        if (isNew && level != nullptr && segment.condition != nullptr)
        {
            const std::string text = segment.Text();
            CheckOrder(InNodes(level->OrderFor(text)), parent->node, text, findings);
        }
    }
}

void CheckListedKey(const ListedKey& listed, KeyValues& values, Levels& levels, Findings& findings)
{
    if (listed.onlyBearer != nullptr)
    {
        CheckOrders(listed, findings);
        return;
    }
    const Bearers bearers = values.BearersUnder(listed.key, 2);
    Nodes found;
    std::transform(bearers.first.begin(), bearers.first.end(), std::back_inserter(found), NodeOf);
    CheckMatches(bearers.count, found, listed.key, Kind::SeveralValues, findings);
    for (const auto& [parent, segment] : values.NewComparisons())
    {
        const Order order = levels.Below(parent).OrderFor(segment);
        CheckOrder(InNodes(order), parent->node, segment, findings);
    }
}

// A given key can contain anything: what is reported of it comes from the library's walk.

NodeOrder OrderOf(const TrailLevel& level)
{
    NodeOrder order;
    const xmlNode* suspender = nullptr; // of the step that is looked at
    for (const TrailStep& step : level.steps)
    {
        const bool isOther = step.verdict == Verdict::OtherName;
        const bool isRejected = step.verdict == Verdict::Rejected;
        order.other = isOther && order.other == nullptr ? step.element : order.other;
        order.rejected = isRejected && order.rejected == nullptr ? step.element : order.rejected;
        if (step.suspended && order.taken == nullptr && !Fulfills(step.element, step.condition))
        {
            order.taken = step.element;
            order.suspender = suspender;
        }
        suspender = !isOther ? nullptr : suspender != nullptr ? suspender : step.element;
    }
    return order;
}

void CheckOrders(const TrailLevel& level, Findings& findings)
{
    if (!level.steps.empty() && !level.steps.front().condition.empty())
    {
        const TrailStep& first = level.steps.front();
        const std::string segment = Text(first.name) + "@" + Text(first.condition);
        CheckOrder(OrderOf(level), level.parent, segment, findings);
    }
    for (const TrailStep& step : level.steps)
    {
        if (step.below != nullptr)
        {
            CheckOrders(*step.below, findings);
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

/** @return why a lookup of @p key gives nothing, if @p end is as far as it leads. */
std::string WhyNoValueUnder(const std::string& key, const xmlNode* root, const xmlNode* end,
                            Findings& findings)
{
    if (!StartsAtRoot(root->doc, key))
    {
        return "it starts with " + Quoted(Text(kx::KeySplit(kx::TextView(key)).First())) +
               ", but the root element is " + Quoted(Text(root->name));
    }
    return "it leads as far as " + findings.LocationOf(end) + "; kxconfig explain shows the reason";
}

void AddNoValue(const Trail& trail, const xmlDoc* document, const std::string& key,
                Findings& findings)
{
    const Accepted root = {RootOf(document), 0};
    const xmlNode* const end =
        trail.top == nullptr ? root.element : DeepestAccepted(*trail.top, root).element;
    findings.Add(end, Kind::KeyWithoutValue,
                 Quoted(key) +
                     " has no value: " + WhyNoValueUnder(key, root.element, end, findings));
}

/** @return those of @p elements that are not in @p others. */
Nodes Without(const Nodes& others, const Nodes& elements)
{
    const std::unordered_set<const xmlNode*> excluded(others.begin(), others.end());
    Nodes rest;
    std::copy_if(elements.begin(), elements.end(), std::back_inserter(rest),
                 [&](const xmlNode* element) { return excluded.count(element) == 0; });
    return rest;
}

void CheckUpdate(const Nodes& updated, const Nodes& found, const std::string& key,
                 Findings& findings)
{
    const auto add =
        [&](const Nodes& elements, Kind kind, const std::string& what, const std::string& which)
    {
        if (!elements.empty())
        {
            findings.Add(elements[0], kind,
                         "an update of " + Quoted(key) + what + Counted(elements.size()) + which +
                             (elements.size() == 1 ? ": " : ", the first of them ") +
                             findings.Place(elements[0]));
        }
    };
    add(Without(found, updated), Kind::WiderUpdate, " also changes ",
        " that a lookup does not find");
    add(Without(updated, found), Kind::NarrowerUpdate, " does not change ", " that a lookup finds");
}

/** @return the elements that a lookup of @p key finds. */
Nodes CheckLookup(const xmlDoc* document, const std::string& key, Findings& findings)
{
    const Trail trail = RecordLookup(document, key);
    Nodes found;
    for (const TrailStep* const step : trail.StepsWithText())
    {
        found.push_back(step->element);
    }
    if (found.empty())
    {
        AddNoValue(trail, document, key, findings);
    }
    CheckMatches(found.size(), found, key, Kind::AmbiguousKey, findings);
    if (trail.top != nullptr)
    {
        CheckOrders(*trail.top, findings);
    }
    return found;
}

} // namespace

std::vector<Reach> CheckGivenKeys(const xmlDoc* document, const std::vector<std::string>& keys,
                                  Findings& findings)
{
    std::vector<Reach> reaches;
    for (const std::string& key : keys)
    {
        const Nodes found = CheckLookup(document, key, findings);
        const Nodes updated = ElementsOfUpdate(document, key);
        CheckUpdate(updated, found, key, findings);
        reaches.push_back({key, found.size(), updated.size()});
    }
    return reaches;
}

void CheckListedKeys(const KeyElement* root, Levels& levels, Findings& findings)
{
    KeyValues values(root, levels);
    VisitKeys(root, levels,
              [&](const ListedKey& listed)
              {
                  CheckListedKey(listed, values, levels, findings);
                  return true;
              });
}
