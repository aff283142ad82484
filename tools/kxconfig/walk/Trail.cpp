#include "walk/Trail.h"

#include "KxLog.h"
#include "config/ConditionEvaluation.h"
#include "config/LookupWalk.h"
#include "config/UpdateWalk.h"

namespace
{

std::string_view View(const kx::TextView& text)
{
    return {text.data, text.size};
}

/** Writes down what the walks tell. They tell it to no object, so there is one recorder at a time.
 */
class Recorder
{
public:
    Recorder() { s_current = this; }
    ~Recorder() { s_current = nullptr; }
    Recorder(const Recorder&) = delete;
    Recorder& operator=(const Recorder&) = delete;

    Trail Take() { return std::move(m_trail); }

    // The observer of a walk: src/config/Observer.h tells what each call means.

    static void EnterLevel(const xmlNode* parent) { s_current->Enter(parent); }
    static void LeaveLevel() { s_current->m_levels.pop_back(); }
    static void EmptyKey(const xmlNode* parent) { s_current->EndKey(parent); }
    static void OtherName() { Step().verdict = Verdict::OtherName; }
    static void Rejected() { Step().verdict = Verdict::Rejected; }

    static void Compare(const xmlNode* element, const kx::Segment& segment)
    {
        TrailStep step;
        step.element = element;
        step.name = View(segment.name);
        step.condition = View(segment.condition);
        s_current->m_levels.back()->steps.push_back(std::move(step));
    }

    static void Selected(bool suspended)
    {
        Step().verdict = Verdict::Accepted;
        Step().suspended = suspended && !Step().condition.empty();
    }

    static void Tested(const kx::Term& term, bool holds)
    {
        Step().terms.push_back({View(term.name), View(term.value), term.endsWithOr, holds});
    }

    static void Value(const xmlNode* text)
    {
        if (text != nullptr)
        {
            Step().text = kx::ContentOf(text);
        }
    }

private:
    static TrailStep& Step() { return s_current->m_levels.back()->steps.back(); }

    void Enter(const xmlNode* parent)
    {
        auto level = std::make_unique<TrailLevel>();
        level->parent = parent;
        TrailLevel* const entered = level.get();
        (m_levels.empty() ? m_trail.top : Step().below) = std::move(level);
        m_levels.push_back(entered);
    }

    void EndKey(const xmlNode* parent)
    {
        if (!m_levels.empty())
        {
            Step().keyEnds = true;
            return;
        }
        m_trail.top = std::make_unique<TrailLevel>();
        m_trail.top->parent = parent;
        m_trail.top->keyEnds = true;
    }

    static Recorder* s_current;

    Trail m_trail;
    std::vector<TrailLevel*> m_levels; ///< that the walk is in, the innermost last
};

Recorder* Recorder::s_current = nullptr;

/** Keeps the recorded walk from logging: the library's own run writes the records. */
class Muted
{
public:
    Muted() { g_LumLogParams.xmlConfigParserMask = 0; }
    ~Muted() { g_LumLogParams.xmlConfigParserMask = m_mask; }
    Muted(const Muted&) = delete;
    Muted& operator=(const Muted&) = delete;

private:
    const unsigned int m_mask = g_LumLogParams.xmlConfigParserMask;
};

/** @return the part of @p key after the root's name. */
kx::TextView RestOf(const std::string& key)
{
    return kx::KeySplit(kx::TextView(key)).rest;
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
    return split.hasRest && kx::SameText(xmlDocGetRootElement(document)->name, split.first);
}

Trail RecordLookup(xmlDoc* document, const std::string& key)
{
    const Muted muted;
    Recorder recorder;
    if (StartsAtRoot(document, key))
    {
        std::string value;
        unsigned int found = 0;
        kx::AppendValues<Recorder>(xmlDocGetRootElement(document), RestOf(key), value, found);
    }
    return recorder.Take();
}

Trail RecordUpdate(xmlDoc* document, const std::string& key, const char* value)
{
    const Muted muted;
    Recorder recorder;
    if (StartsAtRoot(document, key))
    {
        unsigned int updated = 0;
        kx::UpdateValues<Recorder>(xmlDocGetRootElement(document), RestOf(key), value, updated);
    }
    return recorder.Take();
}

bool Fulfils(const xmlNode* element, std::string_view condition)
{
    return kx::Condition(kx::TextView(condition.data(), condition.size()))
        .Holds<kx::Silent>(const_cast<xmlNode*>(element));
}
