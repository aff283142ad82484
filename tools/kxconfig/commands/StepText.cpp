#include "commands/StepText.h"

#include "file/Nodes.h"
#include "output/Quoting.h"

#include <nlohmann/json.hpp>

#include <optional>

namespace
{

/** @return the attribute's text as the condition saw it, if there is the attribute. */
std::optional<std::string> ActualValue(const xmlNode* element, const TestedTerm& term)
{
    const std::string name(term.attribute);
    const bool isName = !name.empty() && name.find('\0') == std::string::npos;
    return isName && HasAttribute(element, name) ? std::optional(AttributeOf(element, name))
                                                 : std::nullopt;
}

std::string DescribeTerm(const xmlNode* element, const TestedTerm& term)
{
    if (term.attribute.empty())
    {
        return "a term without an attribute name is never true";
    }
    const std::optional<std::string> actual = ActualValue(element, term);
    std::string text =
        OnOneLine(Text(term.attribute)) + " is " + (actual ? Quoted(*actual) : "absent");
    text += term.holds ? "" : ", not " + Quoted(Text(term.expected));
    if (term.endsWithOr && term.expected.find('&') != std::string_view::npos)
    {
        text += " (\"&\" before \"|\" is part of the value)";
    }
    return text;
}

} // namespace

std::string DescribeSegment(const TrailStep& step)
{
    const std::string condition = step.condition.empty() ? "" : "@" + Text(step.condition);
    return Quoted(Text(step.name) + condition);
}

Json SegmentInJson(const TrailStep& step)
{
    return {{"name", Text(step.name)}, {"condition", Text(step.condition)}};
}

std::string DescribeTerms(const TrailStep& step)
{
    std::string text;
    bool joinedByOr = false;
    for (const TestedTerm& term : TermsOf(step))
    {
        text += text.empty() ? "" : joinedByOr ? "; or " : "; and ";
        text += DescribeTerm(step.element, term);
        joinedByOr = term.endsWithOr;
    }
    return text;
}

Json TermsInJson(const TrailStep& step)
{
    Json terms = Json::array();
    for (const TestedTerm& term : TermsOf(step))
    {
        const std::optional<std::string> actual = ActualValue(step.element, term);
        terms.push_back({{"attribute", Text(term.attribute)},
                         {"expected", Text(term.expected)},
                         {"actual", actual ? Json(*actual) : Json()},
                         {"holds", term.holds}});
    }
    return terms;
}
