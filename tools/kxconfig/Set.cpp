#include "Commands.h"
#include "Document.h"
#include "Output.h"
#include "Save.h"
#include "Texts.h"

#include <libxml/xmlstring.h>

#include <algorithm>

namespace
{

/** Whether @p text, which stands between "&" and ";", can name a character or an entity. */
bool IsReference(const std::string& text)
{
    if (text.compare(0, 2, "#x") == 0)
    {
        return text.size() > 2 && text.find_first_not_of("0123456789abcdefABCDEF", 2) == text.npos;
    }
    if (text.compare(0, 1, "#") == 0)
    {
        return text.size() > 1 && text.find_first_not_of("0123456789", 1) == text.npos;
    }
    return !text.empty() && text.find_first_of("&< \t\r\n") == text.npos;
}

/** Whether @p value is UTF-8 without the control characters that XML does not have. */
bool HasOnlyXmlCharacters(const std::string& value)
{
    const auto isForbidden = [](unsigned char byte)
    { return byte < ' ' && byte != '\t' && byte != '\n' && byte != '\r'; };
    return xmlCheckUTF8(reinterpret_cast<const xmlChar*>(value.c_str())) != 0 &&
           std::none_of(value.begin(), value.end(), isForbidden);
}

/** Whether each "&" of @p value begins a reference. */
bool HasOnlyWholeReferences(const std::string& value)
{
    std::string::size_type at = value.find('&');
    while (at != value.npos)
    {
        const std::string::size_type end = value.find(';', at);
        if (end == value.npos || !IsReference(value.substr(at + 1, end - at - 1)))
        {
            return false;
        }
        at = value.find('&', end);
    }
    return true;
}

ExitStatus RefuseValue(const std::string& why)
{
    Complain("VALUE is not XML text: " + why);
    return ExitStatus::BadUsage;
}

const char* const kBareAmpersand = "write & as &amp;";

ExitStatus Update(CXMLWriter& writer, const SetArguments& arguments)
{
    // Of a bare "&" only older engines complain; newer ones take the text around it, and save other
    // characters than those that they cannot.
    if (!HasOnlyXmlCharacters(arguments.value))
    {
        return RefuseValue("it has control characters, or bytes that are no UTF-8");
    }
    if (!HasOnlyWholeReferences(arguments.value))
    {
        return RefuseValue(kBareAmpersand);
    }
    const int status = writer.SetValue(arguments.key, arguments.value);
    if (!FirstComplaint("").empty())
    {
        return RefuseValue(kBareAmpersand);
    }
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

/** @return an empty string, or why nothing was saved, or, in a dry run, would be. */
std::string SaveChanges(CXMLReader& reader, CXMLWriter& writer, const SetArguments& arguments,
                        const FileState& loaded)
{
    const bool elsewhere = !arguments.output.empty();
    const std::string& target = elsewhere ? arguments.output : arguments.file;
    const std::string reason = WhyNotLoadedAgain(reader);
    if (!reason.empty())
    {
        return "not saved: " + target + " would not load any more, line " + reason;
    }
    return arguments.dryRun ? "" : Save(writer, target, elsewhere ? nullptr : &loaded);
}

} // namespace

ExitStatus Set(const SetArguments& arguments)
{
    const FileState loaded(arguments.file);
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
    if (!changes.empty() || !arguments.output.empty())
    {
        const std::string complaint = SaveChanges(*reader, writer.Get(), arguments, loaded);
        if (!complaint.empty())
        {
            Complain(complaint);
            return ExitStatus::NotSaved;
        }
    }
    PrintChanges(changes);
    return ExitStatus::Done;
}
