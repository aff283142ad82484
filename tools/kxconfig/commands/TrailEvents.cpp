#include "commands/TrailEvents.h"

#include "commands/StepText.h"
#include "file/Nodes.h"
#include "output/Quoting.h"

#include <nlohmann/json.hpp>

#include <algorithm>

namespace
{

/** In bytes: scripts get it with each step, and a deep document must not make that quadratic. */
const size_t kLongestLocation = 500;

/** Below this depth lines are indented no further: there, spaces would be most of the output. */
const int kDeepestIndentation = 20;

std::string Indented(int depth, const std::string& line)
{
    const int indentation = 2 * std::min(depth, kDeepestIndentation);
    return std::string(static_cast<size_t>(indentation), ' ') + line;
}

const char* VerdictInJson(const TrailStep& step)
{
    switch (step.verdict)
    {
    case Verdict::OtherName:
        return "other name";
    case Verdict::Rejected:
        return "rejected";
    default:
        return step.suspended ? "accepted by name alone" : "accepted";
    }
}

} // namespace

std::string Narration::StepOf(const xmlNode* node)
{
    const bool isRoot = node->parent == reinterpret_cast<const xmlNode*>(node->doc);
    return (isRoot ? "/" : "") + locations.LastStepOf(node);
}

Json Narration::LocationInJson(const xmlNode* node)
{
    const std::string location = locations.Of(node);
    return location.size() <= kLongestLocation ? Json(location) : Json();
}

std::string LevelEvent::Line() const
{
    std::string line = "below " + narration.StepOf(level.parent) + ": ";
    if (level.keyEnds)
    {
        line += "the key ends in \".\", so nothing is searched";
    }
    else if (level.steps.empty())
    {
        line += "there is no element";
    }
    else
    {
        line += narration.walk == Walk::Lookup ? "looking for " : "looking first for ";
        line += DescribeSegment(level.steps.front());
    }
    return Indented(depth, line);
}

Json LevelEvent::InJson() const
{
    return {{"event", "level"},
            {"location", narration.LocationInJson(level.parent)},
            {"step", narration.StepOf(level.parent)},
            {"sought", level.steps.empty() ? Json() : SegmentInJson(level.steps.front())},
            {"depth", depth}};
}

std::string StepEvent::Line() const
{
    return Indented(depth, "line " + LineOf(step.element) + ": " + narration.StepOf(step.element) +
                               ": " + DescribeVerdict());
}

Json StepEvent::InJson() const
{
    Json result = {{"event", "element"},
                   {"line", LineNumberOf(step.element)},
                   {"location", narration.LocationInJson(step.element)},
                   {"step", narration.StepOf(step.element)},
                   {"sought", SegmentInJson(step)},
                   {"verdict", VerdictInJson(step)},
                   {"terms", TermsInJson(step)},
                   {"value", step.text ? Json(step.text) : Json()}};
    if (step.verdict == Verdict::Accepted && !step.text)
    {
        result["reason"] = WhyNoValue(step.element);
    }
    result["depth"] = depth;
    return result;
}

std::string StepEvent::DescribeVerdict() const
{
    const Report& report = narration.report;
    switch (step.verdict)
    {
    case Verdict::OtherName:
        return report.Paint(Color::Faint, DescribeOtherName());
    case Verdict::Rejected:
        return report.Paint(Color::Bad, "rejected") + ": " + DescribeTerms(step) +
               (narration.walk == Walk::Update ? "; skipped with everything below it" : "");
    default:
        return report.Paint(Color::Good, "accepted") + DescribeAcceptance() + DescribeValue();
    }
}

std::string StepEvent::DescribeOtherName() const
{
    if (narration.walk == Walk::Update)
    {
        return "not " + DescribeSegment(step);
    }
    const bool suspends = !step.condition.empty() && suspender == nullptr;
    return "not named " + Quoted(Text(step.name)) +
           (suspends ? "; suspends the condition for the next element of that name" : "");
}

std::string StepEvent::DescribeAcceptance() const
{
    if (step.suspended)
    {
        return DescribeSuspension();
    }
    const std::string segment =
        narration.walk == Walk::Update ? " as " + DescribeSegment(step) : "";
    const std::string terms = DescribeTerms(step);
    return segment + (terms.empty() ? "" : ": " + terms);
}

std::string StepEvent::DescribeSuspension() const
{
    const std::string wouldHold =
        Fulfills(step.element, step.condition) ? "fulfills anyway" : "does not fulfill";
    return " by name alone: " + narration.StepOf(suspender) + " (line " + LineOf(suspender) +
           ") suspended the condition " + Quoted(Text(step.condition)) + ", which it " + wouldHold;
}

std::string StepEvent::DescribeValue() const
{
    const bool isUpdate = narration.walk == Walk::Update;
    if (step.text)
    {
        const std::string text = narration.report.Paint(Color::Good, Quoted(step.text));
        return isUpdate ? "; its text " + text + " is replaced" : "; value " + text;
    }
    // In the middle of a path a value is not expected.
    if (!isUpdate && (step.below != nullptr || step.keyEnds))
    {
        return "";
    }
    const std::string what = isUpdate ? "no text to replace: " : "no value: ";
    return "; " + narration.report.Paint(Color::Bad, what + WhyNoValue(step.element));
}

std::string MoreEvent::Line() const
{
    return Indented(depth, "... " + std::to_string(count) + " more " + what);
}

Json MoreEvent::InJson() const
{
    return {{"event", "more"}, {"count", count}, {"what", what}, {"depth", depth}};
}
