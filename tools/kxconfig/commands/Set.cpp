#include "commands/Commands.h"
#include "file/Document.h"
#include "file/Save.h"
#include "file/Texts.h"
#include "output/Output.h"

#include <libxml/chvalid.h>
#include <libxml/xmlstring.h>

#include <algorithm>
#include <charconv>

namespace
{

const char* const kBareAmpersand = "write & as &amp;";

/** @return why @p digits, a number of @p base, refer to no character; empty if they do. */
std::string WhyNoCharacter(const std::string& digits, int base)
{
    unsigned int code = 0;
    const char* const end = digits.data() + digits.size();
    const auto [stop, error] = std::from_chars(digits.data(), end, code, base);
    if (stop != end || error == std::errc::invalid_argument)
    {
        return kBareAmpersand;
    }
    // Of &#0; the engine makes nothing, and of a value that holds it less than was given.
    const bool exists = error == std::errc() && xmlIsCharQ(code);
    return exists ? "" : "it refers to a character that XML does not have";
}

/** @return why @p text, which stands between "&" and ";", is no reference; empty if it is one. */
std::string WhyNoReference(const std::string& text)
{
    if (text.compare(0, 1, "#") == 0)
    {
        const bool inHexadecimal = text.compare(1, 1, "x") == 0;
        return WhyNoCharacter(text.substr(inHexadecimal ? 2 : 1), inHexadecimal ? 16 : 10);
    }
    const bool namesEntity = !text.empty() && text.find_first_of("&< \t\r\n") == text.npos;
    return namesEntity ? "" : kBareAmpersand;
}

/** Whether @p value is UTF-8 without the control characters that XML does not have. */
bool HasOnlyXmlCharacters(const std::string& value)
{
    const auto isForbidden = [](unsigned char byte)
    { return byte < ' ' && byte != '\t' && byte != '\n' && byte != '\r'; };
    return xmlCheckUTF8(reinterpret_cast<const xmlChar*>(value.c_str())) != 0 &&
           std::none_of(value.begin(), value.end(), isForbidden);
}

/** @return what is wrong with the first "&" of @p value that begins no reference; or nothing. */
std::string WhyNotOnlyReferences(const std::string& value)
{
    std::string::size_type at = value.find('&');
    while (at != value.npos)
    {
        const std::string::size_type end = value.find(';', at);
        const std::string reason =
            end == value.npos ? kBareAmpersand : WhyNoReference(value.substr(at + 1, end - at - 1));
        if (!reason.empty())
        {
            return reason;
        }
        at = value.find('&', end);
    }
    return "";
}

ExitStatus RefuseValue(const std::string& why)
{
    Complain("VALUE is not XML text: " + why);
    return ExitStatus::BadUsage;
}

ExitStatus Update(CXMLWriter& writer, const SetArguments& arguments)
{
    // Of a bare "&" only older engines complain; newer ones take the text around it, and save other
    // characters than those that they cannot.
    if (!HasOnlyXmlCharacters(arguments.value))
    {
        return RefuseValue("it has control characters, or bytes that are no UTF-8");
    }
    const std::string reason = WhyNotOnlyReferences(arguments.value);
    if (!reason.empty())
    {
        return RefuseValue(reason);
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
