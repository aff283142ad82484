#include "commands/Set.h"

#include "commands/KeyArgument.h"
#include "commands/ValueArgument.h"
#include "file/Destination.h"
#include "file/Engine.h"
#include "file/Load.h"
#include "file/RoundTrip.h"
#include "file/Texts.h"
#include "output/Failure.h"
#include "output/Quoting.h"
#include "output/Report.h"

#include "diag/Status.h"

#include <nlohmann/json.hpp>

#include <chrono>

namespace
{

void Update(CXMLWriter& writer, const SetArguments& arguments)
{
    const FirstEngineError error;
    const int status = writer.SetValue(arguments.key, arguments.value);
    if (!error.IsNone())
    {
        RefuseValue(g_bareAmpersand);
    }
    if (status == kx::StatusNotFound)
    {
        throw Failure(ExitStatus::NothingFound, "nothing found: no element of " + arguments.file +
                                                    " has text that can be replaced under " +
                                                    Quoted(arguments.key));
    }
    if (status != kx::StatusOk)
    {
        throw Failure(ExitStatus::BadUsage,
                      "malformed key " + Quoted(arguments.key) + ": it ends in \".\"");
    }
}

/** Of an entity that contains itself, or multiplies, no text can be compared: the file would not
 * load. */
void RequireTexts(CXMLReader& reader, const SetArguments& arguments, const Destination& destination)
{
    if (arguments.value.find('&') != std::string::npos)
    {
        RequireLoadsAgain(SavedBytes(reader), destination.Path());
    }
}

struct Change
{
    const ChangedText& text;

    std::string Line() const
    {
        return text.location + ": " + Quoted(text.before) + " -> " + Quoted(text.after);
    }

    Json InJson() const
    {
        return {{"location", text.location}, {"before", text.before}, {"after", text.after}};
    }
};

void AddChanges(const std::vector<ChangedText>& changes, Report& report)
{
    for (const ChangedText& change : changes)
    {
        report.Add(Change{change});
    }
    if (changes.empty())
    {
        report.AddLine("nothing changed: the text is already the same");
    }
}

bool SavesElsewhere(const SetArguments& arguments)
{
    return !arguments.output.empty();
}

Destination DestinationOf(const SetArguments& arguments)
{
    const bool elsewhere = SavesElsewhere(arguments);
    return Destination(elsewhere ? arguments.output : arguments.file,
                       elsewhere ? Destination::Role::OtherFile : Destination::Role::LoadedFile,
                       std::chrono::seconds(arguments.waitSeconds));
}

void Warn(const std::string& warning, Report& report)
{
    if (!warning.empty())
    {
        report.Complain(warning);
    }
}

ExitStatus Save(CXMLReader& reader, Destination& destination, const SetArguments& arguments,
                Report& report)
{
    const std::string bytes = SavedBytes(reader);
    RequireLoadsAgain(bytes, destination.Path());
    destination.Save(bytes, {arguments.dropAttributes, arguments.dryRun});
    if (!arguments.dryRun)
    {
        report.NoteSaved();
    }
    Warn(destination.SyncWarning(), report);
    return destination.SyncWarning().empty() ? ExitStatus::Done : ExitStatus::NotReported;
}

} // namespace

ExitStatus Set(const SetArguments& arguments, Report& report)
{
    Destination destination = DestinationOf(arguments);
    if (destination.IsStandardOutput())
    {
        destination.SetStream(report.GiveOutput());
    }
    Warn(destination.LockWarning(), report);
    const std::unique_ptr<CXMLReader> reader = LoadFile(arguments.file);
    RequireKey(arguments.key, arguments.file, *reader);
    const Texts texts(reader->GetDataPtr());
    GuestWriter writer(*reader);
    RequireXmlText(arguments.value);
    RequireDeclaredEntities(arguments.value, DocumentOf(*reader));
    Update(writer.Get(), arguments);
    RequireTexts(*reader, arguments, destination);
    const std::vector<ChangedText> changes = texts.Changes();
    const bool isSaved = !changes.empty() || SavesElsewhere(arguments);
    const ExitStatus status =
        isSaved ? Save(*reader, destination, arguments, report) : ExitStatus::Done;
    AddChanges(changes, report);
    return status;
}
