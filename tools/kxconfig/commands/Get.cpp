#include "commands/Commands.h"
#include "file/Document.h"
#include "file/Locations.h"
#include "file/Nodes.h"
#include "output/Output.h"
#include "walk/Trail.h"

namespace
{

/** The lookup runs all values together; a script wants them one by one, and from where. */
void PrintEachResult(const Trail& trail)
{
    Locations locations;
    for (const TrailStep* const step : trail.StepsWithText())
    {
        PrintResult({{"location", locations.Of(step->element)},
                     {"line", LineNumberOf(step->element)},
                     {"value", *step->text}});
    }
}

} // namespace

ExitStatus Get(const std::string& file, const std::string& key)
{
    const std::unique_ptr<CXMLReader> reader = LoadFile(file);
    if (reader == nullptr)
    {
        return ExitStatus::BadFile;
    }
    const ExitStatus keyStatus = CheckKey(file, key, *reader);
    if (keyStatus != ExitStatus::Done)
    {
        return keyStatus;
    }
    std::string values;
    if (reader->GetValue(key, values) != 0)
    {
        Complain("nothing found: no element of " + file + " has a value under " + Quoted(key));
        return ExitStatus::NothingFound;
    }
    PrintLine(values);
    PrintEachResult(RecordLookup(static_cast<xmlDoc*>(reader->GetDataPtr()), key));
    return ExitStatus::Done;
}
