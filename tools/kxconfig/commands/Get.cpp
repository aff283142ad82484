#include "commands/Get.h"

#include "commands/KeyArgument.h"
#include "file/Load.h"
#include "file/Locations.h"
#include "file/Nodes.h"
#include "output/Quoting.h"
#include "output/Report.h"
#include "walk/Trail.h"

#include <nlohmann/json.hpp>

namespace
{

/** One value under a key, and the element that it comes from. */
struct FoundValue
{
    const std::string* key; ///< null if the user asked for a single one
    std::string value;
    const xmlNode* element; ///< null if the value is the default
    Locations& locations;

    std::string Line() const { return key == nullptr ? value : *key + '\t' + Quoted(value); }

    /** @return the value as it is, for -z. */
    std::string Bytes() const { return (key == nullptr ? "" : *key + '\t') + value + '\0'; }

    Json InJson() const
    {
        Json result = key == nullptr ? Json::object() : Json{{"key", *key}};
        const bool isFound = element != nullptr;
        result["location"] = isFound ? Json(locations.Of(element)) : Json();
        result["line"] = isFound ? Json(LineNumberOf(element)) : Json();
        result["value"] = value;
        return result;
    }
};

/** Looks up keys in one file. */
class Getter
{
public:
    Getter(const GetArguments& arguments, CXMLReader& reader, Report& report)
        : m_arguments(arguments), m_reader(reader), m_report(report)
    {
    }

    /** Prints what is under @p key, or why nothing is. @return whether there is something. */
    bool Get(const std::string& key)
    {
        std::string values;
        if (StartsAtRoot(DocumentOf(m_reader), key) && m_reader.GetValue(key, values) == 0)
        {
            Print(key, values);
            return true;
        }
        if (m_arguments.defaultValue)
        {
            Add(key, *m_arguments.defaultValue, nullptr);
            return true;
        }
        m_report.Complain(WhyNothing(key));
        return false;
    }

private:
    bool IsOneKey() const { return m_arguments.keys.size() == 1; }

    /** The lookup joins all values; only a single key's lines need no more. */
    void Print(const std::string& key, const std::string& values)
    {
        if (IsOneKey() && !m_report.IsJson() && !m_arguments.endWithNul)
        {
            m_report.AddLine(values);
            return;
        }
        const Trail trail = RecordLookup(DocumentOf(m_reader), key);
        for (const TrailStep* const step : trail.StepsWithText())
        {
            Add(key, step->text, step->element);
        }
    }

    void Add(const std::string& key, const std::string& value, const xmlNode* element)
    {
        const FoundValue found{IsOneKey() ? nullptr : &key, value, element, m_locations};
        if (m_arguments.endWithNul && !m_report.IsJson())
        {
            m_report.AddBytes(found.Bytes());
            return;
        }
        m_report.Add(found);
    }

    std::string WhyNothing(const std::string& key) const
    {
        return StartsAtRoot(DocumentOf(m_reader), key)
                   ? "nothing found: no element of " + m_arguments.file + " has a value under " +
                         Quoted(key)
                   : "nothing found: " + OtherRootMessage(key, m_arguments.file, m_reader);
    }

    const GetArguments& m_arguments;
    CXMLReader& m_reader;
    Report& m_report;
    Locations m_locations;
};

} // namespace

ExitStatus Get(const GetArguments& arguments, Report& report)
{
    const LoadedReader reader = LoadFile(arguments.file, arguments.input);
    for (const std::string& key : arguments.keys)
    {
        RequireWellFormedKey(key);
    }
    Getter getter(arguments, *reader, report);
    ExitStatus status = ExitStatus::Done;
    for (const std::string& key : arguments.keys)
    {
        status = getter.Get(key) ? status : ExitStatus::NothingFound;
    }
    return status;
}
