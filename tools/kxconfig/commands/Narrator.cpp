#include "commands/Narrator.h"

#include "file/Nodes.h"

#include <nlohmann/json.hpp>

#include <algorithm>

namespace
{

/** A longer run of steps that are alike is shown as its first and the number of the others. */
const size_t kShownOfARun = 2;

bool IsDull(const TrailLevel& level);

/** @return whether nothing came of @p step: it has another name, and so has all below it. */
bool IsDull(const TrailStep& step)
{
    return step.verdict == Verdict::OtherName && !step.keyEnds &&
           (step.below == nullptr || IsDull(*step.below));
}

bool IsDull(const TrailLevel& level)
{
    return std::all_of(level.steps.begin(), level.steps.end(),
                       [](const TrailStep& step) { return IsDull(step); });
}

bool HaveSameSegment(const TrailStep& one, const TrailStep& other)
{
    return one.name == other.name && one.condition == other.condition;
}

/** @return the end of the steps that are alike from @p begin on, and not worth a line each. */
size_t EndOfRun(const TrailLevel& level, size_t begin)
{
    const TrailStep& first = level.steps[begin];
    size_t end = begin + 1;
    if (first.verdict == Verdict::Accepted || (!IsDull(first) && first.below != nullptr))
    {
        return end;
    }
    while (end != level.steps.size() && level.steps[end].verdict == first.verdict &&
           HaveSameSegment(first, level.steps[end]) &&
           (first.verdict == Verdict::Rejected || IsDull(level.steps[end])))
    {
        ++end;
    }
    return end;
}

/** @return the element that has suspended the condition after @p step, or null. */
const xmlNode* SuspenderAfter(const TrailStep& step, const xmlNode* before)
{
    if (step.verdict != Verdict::OtherName || step.condition.empty())
    {
        return nullptr;
    }
    return before == nullptr ? step.element : before;
}

bool HaveSameName(const TrailLevel& level, size_t begin, size_t end)
{
    const xmlChar* const name = level.steps[begin].element->name;
    const auto steps = level.steps.begin();
    return std::all_of(
        steps + static_cast<std::ptrdiff_t>(begin), steps + static_cast<std::ptrdiff_t>(end),
        [name](const TrailStep& step) { return xmlStrEqual(step.element->name, name) != 0; });
}

/** @return what the steps from @p begin to @p end, a part of a run, were about. */
std::string DescribeRun(const TrailLevel& level, size_t begin, size_t end)
{
    const TrailStep& first = level.steps[begin];
    if (first.verdict == Verdict::Rejected)
    {
        return "elements that the condition rejects";
    }
    return HaveSameName(level, begin, end) ? "elements named " + Text(first.element->name)
                                           : "elements of other names";
}

} // namespace

void Narrator::AddLevel(const TrailLevel& level, int depth)
{
    m_report.Add(LevelEvent{level, depth, m_narration});
    const xmlNode* suspender = nullptr;
    for (size_t i = 0; i != level.steps.size();)
    {
        const size_t end = EndOfRun(level, i);
        const size_t shown = end - i > kShownOfARun ? i + 1 : end;
        for (; i != shown; ++i)
        {
            const TrailStep& step = level.steps[i];
            m_report.Add(StepEvent{step, suspender, depth + 1, m_narration});
            AddBelow(step, depth + 2);
            suspender = SuspenderAfter(step, suspender);
        }
        if (i != end)
        {
            m_report.Add(MoreEvent{end - i, DescribeRun(level, i, end), depth + 1});
        }
        i = end;
    }
}

void Narrator::AddBelow(const TrailStep& step, int depth)
{
    if (step.keyEnds)
    {
        TrailLevel level;
        level.parent = step.element;
        level.keyEnds = true;
        m_report.Add(LevelEvent{level, depth, m_narration});
    }
    else if (step.below != nullptr && (m_narration.walk == Walk::Lookup || !IsDull(*step.below)))
    {
        AddLevel(*step.below, depth);
    }
}
