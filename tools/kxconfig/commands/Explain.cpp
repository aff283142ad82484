#include "commands/Explain.h"

#include "commands/Narrator.h"
#include "file/GuestWriter.h"
#include "file/Load.h"
#include "file/Nodes.h"
#include "output/Quoting.h"

#include "config/KeyPath.h"
#include "diag/Status.h"

#include <nlohmann/json.hpp>

namespace
{

const char* StatusName(int status)
{
    switch (status)
    {
    case kx::StatusOk:
        return "success";
    case kx::StatusBadArgument:
        return "malformed key";
    case kx::StatusNotFound:
        return "nothing found";
    default:
        return "missing object or empty key";
    }
}

std::string DescribeStatus(int status)
{
    return "status " + std::to_string(status) + " (" + StatusName(status) + ")";
}

/** @return how the root's name and the key's first name compare. */
std::string CompareRoot(const xmlNode* root, const std::string& key)
{
    const kx::KeySplit split((kx::TextView(key)));
    if (key.empty())
    {
        return "the key is empty, so nothing is searched";
    }
    if (!split.HasRest())
    {
        return "the key " + Quoted(key) + " has no \".\", so nothing is searched";
    }
    if (!kx::SameText(root->name, split.First()))
    {
        return "the key starts with " + Quoted(Text(split.First())) +
               ", not with the root's name " + Quoted(Text(root->name)) +
               ": nothing is searched, which counts as success";
    }
    return "the key starts with the root's name";
}

/** The walk compares the root with the key's first name. */
struct RootEvent
{
    const xmlNode* root;
    std::string text;

    std::string Line() const
    {
        return "line " + LineOf(root) + ": " + Locations().Of(root) + ": " + text;
    }

    Json InJson() const
    {
        return {{"event", "root"},
                {"line", LineNumberOf(root)},
                {"location", Locations().Of(root)},
                {"told", text}, // the name in every 1.x
                {"depth", 0}};
    }
};

/** What a call of the library gives: a status, a value, or both. */
struct CallEvent
{
    const char* call;
    std::optional<int> status;
    std::optional<std::string> value;

    std::string Line() const
    {
        std::string line = std::string(call) + ": ";
        line += status ? DescribeStatus(*status) : "";
        line += status && value ? ", value " : "";
        return line + (value ? Quoted(*value) : "");
    }

    Json InJson() const
    {
        Json result = {{"event", "result"}, {"depth", 0}, {"call", call}};
        if (status)
        {
            result["status"] = *status;
        }
        if (value)
        {
            result["value"] = *value;
        }
        return result;
    }
};

void AddTrail(const Trail& trail, Walk walk, Report& report)
{
    if (trail.top != nullptr)
    {
        Narrator(walk, report).AddLevel(*trail.top, 0);
    }
}

/** @return what get or set end with: to the library @p found alone is no success, either. */
ExitStatus ToExitStatus(int status, bool found)
{
    if (status == kx::StatusOk)
    {
        return found ? ExitStatus::Done : ExitStatus::NothingFound; // another root is success
    }
    return status == kx::StatusNotFound ? ExitStatus::NothingFound : ExitStatus::BadUsage;
}

ExitStatus ExplainLookup(CXMLReader& reader, const std::string& key, Report& report)
{
    const Trail trail = RecordLookup(DocumentOf(reader), key);
    AddTrail(trail, Walk::Lookup, report);

    report.Add(CallEvent{"GetValue(key)", std::nullopt, reader.GetValue(key)});
    std::string value;
    const int status = reader.GetValue(key, value);
    report.Add(CallEvent{"GetValue(key, value)", status, value});
    return ToExitStatus(status, !trail.StepsWithText().empty());
}

ExitStatus ExplainUpdate(CXMLReader& reader, const std::string& key, Report& report)
{
    const Trail trail = RecordUpdate(DocumentOf(reader), key);
    AddTrail(trail, Walk::Update, report);

    GuestWriter writer(reader);
    const int status = writer.Get().SetValue(key, "-");
    report.Add(CallEvent{"SetValue(key, value)", status, std::nullopt});
    return ToExitStatus(status, !trail.StepsWithText().empty());
}

} // namespace

ExitStatus Explain(const ExplainArguments& arguments, Report& report)
{
    const LoadedReader reader = LoadFile(arguments.file, arguments.input);
    const xmlNode* const root = RootOf(*reader);
    report.Add(RootEvent{root, CompareRoot(root, arguments.key)});
    if (!arguments.value.empty())
    {
        report.Complain("note: " + Quoted(arguments.value) +
                        " is ignored: an update reaches the same elements with any value");
    }
    return arguments.isUpdate ? ExplainUpdate(*reader, arguments.key, report)
                              : ExplainLookup(*reader, arguments.key, report);
}
