#include "commands/Set.h"

#include "commands/KeyArgument.h"
#include "commands/ValueArgument.h"
#include "file/Engine.h"
#include "file/Load.h"
#include "file/RoundTrip.h"
#include "file/Save.h"
#include "file/Texts.h"
#include "output/Failure.h"
#include "output/Quoting.h"
#include "output/Report.h"

#include "diag/Status.h"

#include <nlohmann/json.hpp>

namespace
{

void Update(CXMLWriter& writer, const SetArguments& arguments)
{
    RequireXmlText(arguments.value);
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

void SaveChanges(CXMLReader& reader, CXMLWriter& writer, const SetArguments& arguments,
                 const FileState& loaded)
{
    const bool elsewhere = !arguments.output.empty();
    const std::string& target = elsewhere ? arguments.output : arguments.file;
    RequireLoadsAgain(reader, target);
    if (!arguments.dryRun)
    {
        Save(writer, target, elsewhere ? nullptr : &loaded);
    }
}

} // namespace

ExitStatus Set(const SetArguments& arguments, Report& report)
{
    const FileState loaded(arguments.file);
    const std::unique_ptr<CXMLReader> reader = LoadFile(arguments.file);
    RequireKey(arguments.key, arguments.file, *reader);
    const Texts texts(reader->GetDataPtr());
    GuestWriter writer(*reader);
    Update(writer.Get(), arguments);
    const std::vector<ChangedText> changes = texts.Changes();
    if (!changes.empty() || !arguments.output.empty())
    {
        SaveChanges(*reader, writer.Get(), arguments, loaded);
    }
    AddChanges(changes, report);
    return ExitStatus::Done;
}
