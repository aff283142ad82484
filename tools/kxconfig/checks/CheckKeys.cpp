#include "checks/CheckKeys.h"

#include "file/Nodes.h"
#include "output/Quoting.h"
#include "survey/KeyList.h"
#include "survey/KeyValues.h"
#include "walk/Trail.h"

#include "config/KeyPath.h"

namespace
{

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
    const std::string name = Text(kx::Segment(kx::TextView(segment)).name);
    if (order.taken != nullptr)
    {
        if (warnings.IsNew("suspended condition", parent, name))
        {
            warnings.Warn(
                order.taken, "suspended condition",
                warnings.LocationOf(order.taken) + " is accepted for " + Quoted(segment) +
                    " although it does not fulfill it: " + warnings.Place(order.suspender) +
                    ", a preceding element of another name, suspends the condition");
        }
    }
    else if (order.other != nullptr && order.rejected != nullptr &&
             warnings.IsNew("condition depends on order", parent, name))
    {
        warnings.Warn(order.rejected, "condition depends on order",
                      warnings.LocationOf(order.rejected) + " would be accepted for " +
                          Quoted(segment) + " if " + warnings.Place(order.other) +
                          ", which has another name, preceded it directly");
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

/** @return why a lookup of @p key gives nothing, if @p end is as far as it leads. */
std::string WhyNoValueUnder(const std::string& key, const xmlNode* root, const xmlNode* end,
                            Warnings& warnings)
{
    if (!StartsAtRoot(root->doc, key))
    {
        return "it starts with " + Quoted(Text(kx::KeySplit(kx::TextView(key)).First())) +
               ", but the root element is " + Quoted(Text(root->name));
    }
    return "it leads as far as " + warnings.LocationOf(end) + "; kxconfig explain shows the reason";
}

void WarnOfNoValue(const Trail& trail, xmlDoc* document, const std::string& key, Warnings& warnings)
{
    const Accepted root = {xmlDocGetRootElement(document), 0};
    const xmlNode* const end =
        trail.top == nullptr ? root.element : DeepestAccepted(*trail.top, root).element;
    warnings.Warn(end, "key without a value",
                  Quoted(key) +
                      " has no value: " + WhyNoValueUnder(key, root.element, end, warnings));
}

} // namespace

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

void CheckListedKeys(const xmlNode* root, Levels& levels, Warnings& warnings)
{
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
