#include "Commands.h"
#include "Document.h"
#include "Output.h"
#include "Save.h"
#include "Texts.h"

namespace
{

ExitStatus Update(CXMLWriter& writer, const SetArguments& arguments)
{
    const int status = writer.SetValue(arguments.key, arguments.value);
    if (status == 0)
    {
        return ExitStatus::Done;
    }
    if (status == -2)
    {
        Complain("nothing found: no element of " + arguments.file +
                 " has text that can be replaced under " + Quoted(arguments.key));
        return ExitStatus::NothingFound;
    }
    Complain("malformed key " + Quoted(arguments.key) + ": it ends in \".\"");
    return ExitStatus::BadUsage;
}

void PrintChanges(const std::vector<ChangedText>& changes)
{
    for (const ChangedText& change : changes)
    {
        Print(change.location + ": " + Quoted(change.before) + " -> " + Quoted(change.after),
              {{"location", change.location}, {"before", change.before}, {"after", change.after}});
    }
    if (changes.empty())
    {
        PrintLine("nothing changed: the text is the same already");
    }
}

ExitStatus SaveUnlessAsked(CXMLWriter& writer, const SetArguments& arguments, bool changed)
{
    const bool elsewhere = !arguments.output.empty();
    if (arguments.dryRun || (!changed && !elsewhere))
    {
        return ExitStatus::Done;
    }
    const std::string complaint = Save(writer, elsewhere ? arguments.output : arguments.file);
    if (!complaint.empty())
    {
        Complain(complaint);
        return ExitStatus::NotSaved;
    }
    return ExitStatus::Done;
}

} // namespace

ExitStatus Set(const SetArguments& arguments)
{
    const std::unique_ptr<CXMLReader> reader = LoadFile(arguments.file);
    if (reader == nullptr)
    {
        return ExitStatus::BadFile;
    }
    ExitStatus status = CheckKey(arguments.file, arguments.key, *reader);
    if (status != ExitStatus::Done)
    {
        return status;
    }
    const Texts texts(reader->GetDataPtr());
    GuestWriter writer(*reader);
    status = Update(writer.Get(), arguments);
    if (status != ExitStatus::Done)
    {
        return status;
    }
    const std::vector<ChangedText> changes = texts.Changes();
    status = SaveUnlessAsked(writer.Get(), arguments, !changes.empty());
    if (status == ExitStatus::Done)
    {
        PrintChanges(changes);
    }
    return status;
}
