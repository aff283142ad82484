#include "commands/Get.h"

#include "commands/KeyArgument.h"
#include "file/Load.h"
#include "file/Locations.h"
#include "file/Nodes.h"
#include "output/Failure.h"
#include "output/Quoting.h"
#include "output/Report.h"
#include "walk/Trail.h"

#include <nlohmann/json.hpp>

namespace
{

/** The lookup joins all values; a script wants them one by one, with their places. */
void AddEachValue(const Trail& trail, Report& report)
{
    Locations locations;
    for (const TrailStep* const step : trail.StepsWithText())
    {
        report.AddJson({{"location", locations.Of(step->element)},
                        {"line", LineNumberOf(step->element)},
                        {"value", *step->text}});
    }
}

} // namespace

ExitStatus Get(const GetArguments& arguments, Report& report)
{
    const std::unique_ptr<CXMLReader> reader = LoadFile(arguments.file);
    RequireKey(arguments.key, arguments.file, *reader);
    std::string values;
    if (reader->GetValue(arguments.key, values) != 0)
    {
        throw Failure(ExitStatus::NothingFound, "nothing found: no element of " + arguments.file +
                                                    " has a value under " + Quoted(arguments.key));
    }
    if (report.IsJson())
    {
        AddEachValue(RecordLookup(DocumentOf(*reader), arguments.key), report);
    }
    report.AddLine(values);
    return ExitStatus::Done;
}
