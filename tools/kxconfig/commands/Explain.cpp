#include "commands/Commands.h"
#include "file/Document.h"
#include "file/Locations.h"
#include "file/Nodes.h"
#include "output/Output.h"
#include "walk/Trail.h"

namespace
{

/** A longer run of elements that are alike is told by its first and the number of the others. */
const size_t kShownOfARun = 2;

/** @return the segment as it stands in a key, quoted. */
std::string Sought(const TrailStep& step)
{
    const std::string condition = step.condition.empty() ? "" : "@" + Text(step.condition);
    return Quoted(Text(step.name) + condition);
}

Json SoughtInJson(const TrailStep& step)
{
    return {{"name", Text(step.name)}, {"condition", Text(step.condition)}};
}

/** @return the attribute's text as the condition saw it, or null. */
Json ActualValue(const xmlNode* element, const TestedTerm& term)
{
    const std::string name(term.attribute);
    const bool named = !name.empty() && name.find('\0') == std::string::npos;
    return named && HasAttribute(element, name) ? Json(AttributeOf(element, name)) : Json();
}

std::string Told(const xmlNode* element, const TestedTerm& term)
{
    if (term.attribute.empty())
    {
        return "a term without an attribute name never holds";
    }
    const Json actual = ActualValue(element, term);
    const std::string expected = Quoted(Text(term.expected));
    std::string told =
        Text(term.attribute) + " is " +
        (actual.is_null() ? std::string("absent") : Quoted(actual.get<std::string>()));
    told += term.holds ? "" : ", not " + expected;
    if (term.endsWithOr && term.expected.find('&') != std::string_view::npos)
    {
        told += " (\"&\" ahead of \"|\" is part of the value)";
    }
    return told;
}

std::string ToldTerms(const TrailStep& step)
{
    std::string told;
    bool joinedByOr = false;
    for (const TestedTerm& term : step.terms)
    {
        told += told.empty() ? "" : joinedByOr ? "; or " : "; and ";
        told += Told(step.element, term);
        joinedByOr = term.endsWithOr;
    }
    return told;
}

Json TermsInJson(const TrailStep& step)
{
    Json terms = Json::array();
    for (const TestedTerm& term : step.terms)
    {
        terms.push_back({{"attribute", Text(term.attribute)},
                         {"expected", Text(term.expected)},
                         {"actual", ActualValue(step.element, term)},
                         {"holds", term.holds}});
    }
    return terms;
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

Json StepInJson(const TrailStep& step, const std::string& location)
{
    Json result = {{"event", "element"},
                   {"line", LineNumberOf(step.element)},
                   {"location", location},
                   {"sought", SoughtInJson(step)},
                   {"verdict", VerdictInJson(step)},
                   {"terms", TermsInJson(step)},
                   {"value", step.text ? Json(*step.text) : Json()}};
    if (step.verdict == Verdict::Accepted && !step.text)
    {
        result["reason"] = WhyNoValue(step.element);
    }
    return result;
}

/** Whose steps are told: of a lookup or of an update. */
enum class Walk
{
    Lookup,
    Update
};

/** Tells a trail, level by level. */
class Narrator
{
public:
    explicit Narrator(Walk walk) : m_walk(walk) {}

    void TellLevel(const TrailLevel& level, int depth)
    {
        TellStart(level, depth);
        const xmlNode* suspender = nullptr; // the element that suspended the condition, if one did
        for (size_t i = 0; i != level.steps.size();)
        {
            const size_t end = EndOfRun(level, i);
            const size_t shown = end - i > kShownOfARun ? i + 1 : end;
            for (; i != shown; ++i)
            {
                TellStep(level.steps[i], suspender, depth + 1);
                suspender = SuspenderAfter(level.steps[i], suspender);
            }
            TellRest(level, i, end, depth + 1);
            i = end;
        }
    }

private:
    void TellStart(const TrailLevel& level, int depth)
    {
        std::string line = "below " + m_locations.Of(level.parent) + ": ";
        if (level.keyEnds)
        {
            line += "the key ends in \".\", so nothing is sought";
        }
        else if (level.steps.empty())
        {
            line += "there is no element";
        }
        else
        {
            line += m_walk == Walk::Lookup ? "looking for " : "looking, to begin with, for ";
            line += Sought(level.steps.front());
        }
        Say(depth, line,
            {{"event", "level"},
             {"location", m_locations.Of(level.parent)},
             {"sought", level.steps.empty() ? Json() : SoughtInJson(level.steps.front())}});
    }

    /** @return whether nothing came of @p step: it has another name, and so has all below it. */
    static bool IsDull(const TrailStep& step)
    {
        return step.verdict == Verdict::OtherName && !step.keyEnds &&
               (step.below == nullptr || IsDull(*step.below));
    }

    static bool IsDull(const TrailLevel& level)
    {
        for (const TrailStep& step : level.steps)
        {
            if (!IsDull(step))
            {
                return false;
            }
        }
        return true;
    }

    /** @return the end of the steps that are alike from @p begin on, and not worth a line each. */
    static size_t EndOfRun(const TrailLevel& level, size_t begin)
    {
        const TrailStep& first = level.steps[begin];
        size_t end = begin + 1;
        if (first.verdict == Verdict::Accepted || (!IsDull(first) && first.below != nullptr))
        {
            return end;
        }
        while (end != level.steps.size() && level.steps[end].verdict == first.verdict &&
               SoughtIsSame(first, level.steps[end]) &&
               (first.verdict == Verdict::Rejected || IsDull(level.steps[end])))
        {
            ++end;
        }
        return end;
    }

    static bool SoughtIsSame(const TrailStep& one, const TrailStep& other)
    {
        return one.name == other.name && one.condition == other.condition;
    }

    static const xmlNode* SuspenderAfter(const TrailStep& step, const xmlNode* before)
    {
        if (step.verdict != Verdict::OtherName || step.condition.empty())
        {
            return nullptr;
        }
        return before == nullptr ? step.element : before;
    }

    void TellStep(const TrailStep& step, const xmlNode* suspender, int depth)
    {
        const std::string location = m_locations.Of(step.element);
        Say(depth,
            "line " + LineOf(step.element) + ": " + location + ": " + ToldVerdict(step, suspender),
            StepInJson(step, location));
        TellBelow(step, depth + 1);
    }

    std::string ToldVerdict(const TrailStep& step, const xmlNode* suspender)
    {
        switch (step.verdict)
        {
        case Verdict::OtherName:
            return Painted(Colour::Faint, OtherName(step, suspender));
        case Verdict::Rejected:
            return Painted(Colour::Bad, "rejected") + ": " + ToldTerms(step) +
                   (m_walk == Walk::Update ? "; left out with all that is below" : "");
        default:
            return Painted(Colour::Good, "accepted") + Acceptance(step, suspender) + Value(step);
        }
    }

    std::string OtherName(const TrailStep& step, const xmlNode* suspender) const
    {
        if (m_walk == Walk::Update)
        {
            return "not " + Sought(step);
        }
        std::string told = "not named " + Quoted(Text(step.name));
        if (!step.condition.empty() && suspender == nullptr)
        {
            told += "; suspends the condition for the next element that is";
        }
        return told;
    }

    std::string Acceptance(const TrailStep& step, const xmlNode* suspender)
    {
        if (!step.suspended)
        {
            const std::string sought = m_walk == Walk::Update ? " as " + Sought(step) : "";
            return sought + (step.terms.empty() ? "" : ": " + ToldTerms(step));
        }
        const std::string wouldHold =
            Fulfils(step.element, step.condition) ? "fulfils anyway" : "does not fulfil";
        return " by name alone: " + m_locations.Of(suspender) + " (line " + LineOf(suspender) +
               ") suspended the condition " + Quoted(Text(step.condition)) + ", which it " +
               wouldHold;
    }

    std::string Value(const TrailStep& step) const
    {
        if (step.text)
        {
            const std::string text = Painted(Colour::Good, Quoted(*step.text));
            return m_walk == Walk::Update ? "; its text " + text + " is replaced"
                                          : "; value " + text;
        }
        // In the middle of a path nobody expects a value.
        if (m_walk == Walk::Lookup && (step.below != nullptr || step.keyEnds))
        {
            return "";
        }
        const std::string what = m_walk == Walk::Update ? "no text to replace: " : "no value: ";
        return "; " + Painted(Colour::Bad, what + WhyNoValue(step.element));
    }

    void TellBelow(const TrailStep& step, int depth)
    {
        if (step.keyEnds)
        {
            TrailLevel level;
            level.parent = step.element;
            level.keyEnds = true;
            TellStart(level, depth);
        }
        else if (step.below != nullptr && (m_walk == Walk::Lookup || !IsDull(*step.below)))
        {
            TellLevel(*step.below, depth);
        }
    }

    static void TellRest(const TrailLevel& level, size_t begin, size_t end, int depth)
    {
        if (begin == end)
        {
            return;
        }
        const size_t count = end - begin;
        const TrailStep& first = level.steps[begin];
        std::string what = first.verdict == Verdict::Rejected
                               ? "elements that the condition rejects"
                               : "elements of other names";
        if (first.verdict == Verdict::OtherName && NamesAreSame(level, begin, end))
        {
            what = "elements named " + Text(first.element->name);
        }
        Say(depth, "... " + std::to_string(count) + " more " + what,
            {{"event", "more"}, {"count", count}, {"what", what}});
    }

    static bool NamesAreSame(const TrailLevel& level, size_t begin, size_t end)
    {
        for (size_t i = begin; i != end; ++i)
        {
            if (!xmlStrEqual(level.steps[i].element->name, level.steps[begin].element->name))
            {
                return false;
            }
        }
        return true;
    }

    static void Say(int depth, const std::string& line, Json result)
    {
        result["depth"] = depth;
        Print(std::string(2 * static_cast<size_t>(depth), ' ') + line, result);
    }

    const Walk m_walk;
    Locations m_locations;
};

std::string StatusName(int status)
{
    switch (status)
    {
    case 0:
        return "success";
    case 7:
        return "malformed key";
    case -2:
        return "nothing found";
    default:
        return "missing object or empty key";
    }
}

std::string ToldStatus(int status)
{
    return "status " + std::to_string(status) + " (" + StatusName(status) + ")";
}

/** Tells how the root and the key's first name compare. */
void TellRoot(const xmlNode* root, const std::string& key)
{
    const std::string::size_type dot = key.find('.');
    const std::string name = Text(root->name);
    std::string told = "the key starts with the root's name";
    if (key.empty())
    {
        told = "the key is empty, so nothing is sought";
    }
    else if (dot == std::string::npos)
    {
        told = "the key " + Quoted(key) + " has no \".\", so nothing is sought";
    }
    else if (key.substr(0, dot) != name)
    {
        told = "the key starts with " + Quoted(key.substr(0, dot)) + ", not with the root's name " +
               Quoted(name) + ": nothing is sought, and that counts as success";
    }
    const std::string location = Locations().Of(root);
    Print("line " + LineOf(root) + ": " + location + ": " + told, {{"event", "root"},
                                                                   {"line", LineNumberOf(root)},
                                                                   {"location", location},
                                                                   {"told", told},
                                                                   {"depth", 0}});
}

void TellTrail(const Trail& trail, Walk walk)
{
    if (trail.top != nullptr)
    {
        Narrator(walk).TellLevel(*trail.top, 0);
    }
}

/** @return what get or set end with: to the library, too, @p found alone is no success. */
ExitStatus ToExitStatus(int status, bool found)
{
    if (status == 0)
    {
        return found ? ExitStatus::Done : ExitStatus::NothingFound; // a foreign root is success
    }
    return status == -2 ? ExitStatus::NothingFound : ExitStatus::BadUsage;
}

ExitStatus ExplainLookup(CXMLReader& reader, const std::string& key)
{
    const Trail trail = RecordLookup(static_cast<xmlDoc*>(reader.GetDataPtr()), key);
    TellTrail(trail, Walk::Lookup);

    const std::string joined = reader.GetValue(key);
    Print("GetValue(key): " + Quoted(joined),
          {{"event", "result"}, {"depth", 0}, {"call", "GetValue(key)"}, {"value", joined}});
    std::string value;
    const int status = reader.GetValue(key, value);
    Print("GetValue(key, value): " + ToldStatus(status) + ", value " + Quoted(value),
          {{"event", "result"},
           {"depth", 0},
           {"call", "GetValue(key, value)"},
           {"status", status},
           {"value", value}});
    return ToExitStatus(status, !trail.StepsWithText().empty());
}

ExitStatus ExplainUpdate(CXMLReader& reader, const std::string& key)
{
    // Any text that leaves an element with a text will do: both walks find the same elements.
    const char* const value = "-";
    const Trail trail = RecordUpdate(static_cast<xmlDoc*>(reader.GetDataPtr()), key, value);
    TellTrail(trail, Walk::Update);

    GuestWriter writer(reader);
    const int status = writer.Get().SetValue(key, value);
    Print(
        "SetValue(key, value): " + ToldStatus(status),
        {{"event", "result"}, {"depth", 0}, {"call", "SetValue(key, value)"}, {"status", status}});
    return ToExitStatus(status, !trail.StepsWithText().empty());
}

} // namespace

ExitStatus Explain(const std::string& file, const std::string& key, bool update)
{
    const std::unique_ptr<CXMLReader> reader = LoadFile(file);
    if (reader == nullptr)
    {
        return ExitStatus::BadFile;
    }
    TellRoot(RootOf(*reader), key);
    return update ? ExplainUpdate(*reader, key) : ExplainLookup(*reader, key);
}
