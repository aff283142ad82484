#include "walk/Trail.h"

#include "walk/Muted.h"

#include "config/SiblingScan.h"
#include "config/UpdateWalk.h"

namespace
{

std::string_view View(const kx::TextView& text)
{
    return {text.data, text.size};
}

/** What an element was compared with, and whether it bears the name. */
TrailStep Compared(const xmlNode* element, const kx::Segment& segment, bool isNamed)
{
    TrailStep step;
    step.element = element;
    step.name = View(segment.name);
    step.condition = View(segment.condition.text);
    step.verdict = isNamed ? Verdict::Rejected : Verdict::OtherName;
    return step;
}

void Accept(TrailStep& step)
{
    step.verdict = Verdict::Accepted;
    if (const xmlNode* const text = kx::OnlyTextChild(step.element))
    {
        step.text = kx::ContentOf(text);
    }
}

TrailStep StepOf(const kx::SiblingScan& scan, const kx::Segment& segment)
{
    TrailStep step = Compared(scan.Element(), segment, scan.IsNamed());
    step.suspended = scan.IsNamed() && scan.IsSuspended() && !step.condition.empty();
    if (scan.IsSelected())
    {
        Accept(step);
    }
    return step;
}

TrailStep StepOf(const kx::UpdateWalk& walk)
{
    TrailStep step = Compared(walk.Element(), walk.Wanted(), walk.IsNamed());
    if (walk.IsSelected())
    {
        Accept(step);
    }
    step.keyEnds = !walk.IsRejected() && walk.EndsHere();
    return step;
}

std::unique_ptr<TrailLevel> LevelBelow(const xmlNode* parent)
{
    auto level = std::make_unique<TrailLevel>();
    level->parent = parent;
    return level;
}

/** The descent of AppendValues(), with each step of its scan written down. */
std::unique_ptr<TrailLevel> LookUp(const xmlNode* node, kx::TextView key)
{
    auto level = LevelBelow(node);
    const kx::KeySplit split(key);
    const kx::Segment segment(split.First());
    kx::SiblingScan scan(node, segment);
    while (scan.Next())
    {
        TrailStep step = StepOf(scan, segment);
        if (step.verdict == Verdict::Accepted && split.HasRest())
        {
            step.keyEnds = split.Rest().IsEmpty();
            step.below = step.keyEnds ? nullptr : LookUp(scan.Element(), split.Rest());
        }
        level->steps.push_back(std::move(step));
    }
    return level;
}

/** The walk of UpdateValues(), with each step written down; nothing is replaced. */
std::unique_ptr<TrailLevel> Update(const xmlNode* node, kx::TextView key)
{
    auto top = LevelBelow(node);
    std::vector<TrailLevel*> levels = {top.get()}; // that the walk is in, the innermost last
    kx::UpdateWalk walk(node, key);
    while (walk.Next())
    {
        while (levels.back()->parent != walk.Element()->parent)
        {
            levels.pop_back();
        }
        TrailStep step = StepOf(walk);
        if (!walk.IsRejected() && !step.keyEnds)
        {
            step.below = LevelBelow(walk.Element());
        }
        TrailLevel* const below = step.below.get();
        levels.back()->steps.push_back(std::move(step));
        if (below != nullptr)
        {
            levels.push_back(below);
        }
    }
    return top;
}

std::unique_ptr<TrailLevel> KeyEnd(const xmlNode* node)
{
    auto level = LevelBelow(node);
    level->keyEnds = true;
    return level;
}

/** Records @p walk, one of the two above, from the root of @p document on. */
template <class Walk>
Trail Record(const xmlDoc* document, const std::string& key, Walk walk)
{
    const Muted muted;
    Trail trail;
    if (StartsAtRoot(document, key))
    {
        const xmlNode* const root = RootOf(document);
        const kx::TextView rest = kx::KeySplit(kx::TextView(key)).Rest();
        trail.top = rest.IsEmpty() ? KeyEnd(root) : walk(root, rest);
    }
    return trail;
}

void AddStepsWithText(const TrailLevel& level, std::vector<const TrailStep*>& found)
{
    for (const TrailStep& step : level.steps)
    {
        if (step.text)
        {
            found.push_back(&step);
        }
        if (step.below != nullptr)
        {
            AddStepsWithText(*step.below, found);
        }
    }
}

} // namespace

std::vector<TestedTerm> TermsOf(const TrailStep& step)
{
    std::vector<TestedTerm> terms;
    const bool isInForce = step.verdict != Verdict::OtherName && !step.suspended;
    const kx::Condition condition(kx::TextView(step.condition.data(), step.condition.size()));
    if (isInForce && !condition.IsEmpty())
    {
        kx::ConditionTest test(condition, step.element);
        do
        {
            terms.push_back({View(test.GetTerm().name), View(test.GetTerm().value),
                             test.TermEndsWithOr(), test.TermHolds()});
        } while (test.Next());
    }
    return terms;
}

std::vector<const TrailStep*> Trail::StepsWithText() const
{
    std::vector<const TrailStep*> found;
    if (top != nullptr)
    {
        AddStepsWithText(*top, found);
    }
    return found;
}

bool StartsAtRoot(const xmlDoc* document, const std::string& key)
{
    const kx::KeySplit split((kx::TextView(key)));
    return split.HasRest() && kx::SameText(RootOf(document)->name, split.First());
}

Trail RecordLookup(const xmlDoc* document, const std::string& key)
{
    return Record(document, key, LookUp);
}

Trail RecordUpdate(const xmlDoc* document, const std::string& key)
{
    return Record(document, key, Update);
}

bool Fulfills(const xmlNode* element, std::string_view condition)
{
    return kx::Condition(kx::TextView(condition.data(), condition.size())).Admits(element);
}
