#include "commands/ValueArgument.h"

#include "file/Input.h"
#include "output/Failure.h"
#include "output/Quoting.h"

#include <libxml/chvalid.h>
#include <libxml/entities.h>
#include <libxml/xmlstring.h>

#include <algorithm>
#include <charconv>
#include <fstream>
#include <iterator>
#include <system_error>

namespace
{

/** @throw std::system_error if it cannot be read to its end. */
std::string ReadAll(std::istream& stream)
{
    return {std::istreambuf_iterator<char>(stream), std::istreambuf_iterator<char>()};
}

std::string ReadFile(const std::string& path)
{
    const Input input(path);
    std::ifstream stream(input.Path(), std::ios::binary);
    return ReadAll(stream);
}

/** As the shell does with what a command prints, but for one line end only. */
std::string WithoutLineEnd(std::string text)
{
    for (const char end : {'\n', '\r'})
    {
        if (!text.empty() && text.back() == end)
        {
            text.pop_back();
        }
    }
    return text;
}

/** Requires that @p digits, a number of @p base, refer to a character. */
void RequireCharacter(const std::string& digits, int base)
{
    unsigned int code = 0;
    const char* const end = digits.data() + digits.size();
    const auto [stop, error] = std::from_chars(digits.data(), end, code, base);
    if (stop != end || error == std::errc::invalid_argument)
    {
        RefuseValue(kBareAmpersand);
    }
    // The engine drops &#0; and stores less of the value than was given.
    if (error != std::errc() || !xmlIsCharQ(code))
    {
        RefuseValue("it refers to a character that XML does not allow");
    }
}

/** Requires that @p text, found between "&" and ";", is a reference. */
void RequireReference(const std::string& text)
{
    if (text.compare(0, 1, "#") == 0)
    {
        const bool isHexadecimal = text.compare(1, 1, "x") == 0;
        RequireCharacter(text.substr(isHexadecimal ? 2 : 1), isHexadecimal ? 16 : 10);
    }
    else if (text.empty() || text.find_first_of("&< \t\r\n") != std::string::npos)
    {
        RefuseValue(kBareAmpersand);
    }
}

/** Calls @p check with each text between "&" and ";" in @p value. */
template <class Check>
void ForEachReference(const std::string& value, Check check)
{
    for (size_t at = value.find('&'); at != std::string::npos;)
    {
        const size_t end = value.find(';', at);
        if (end == std::string::npos)
        {
            RefuseValue(kBareAmpersand);
        }
        check(value.substr(at + 1, end - at - 1));
        at = value.find('&', end);
    }
}

bool HasExternalDtd(const xmlDoc* document)
{
    return document->intSubset != nullptr && document->intSubset->SystemID != nullptr;
}

/** @return whether @p value is UTF-8 without the control characters that XML does not have. */
bool HasOnlyXmlCharacters(const std::string& value)
{
    const auto isForbidden = [](unsigned char byte)
    { return byte < ' ' && byte != '\t' && byte != '\n' && byte != '\r'; };
    return xmlCheckUTF8(reinterpret_cast<const xmlChar*>(value.c_str())) != 0 &&
           std::none_of(value.begin(), value.end(), isForbidden);
}

/** @return whether @p value, which is UTF-8, contains U+FFFE or U+FFFF. */
bool HasNoncharacters(const std::string& value)
{
    return value.find("\xEF\xBF\xBE") != std::string::npos ||
           value.find("\xEF\xBF\xBF") != std::string::npos;
}

} // namespace

const char* const kBareAmpersand = "write & as &amp;";

void RefuseValue(const std::string& why)
{
    throw Failure(ExitStatus::BadUsage, "the new text is not XML text: " + why);
}

void RequireXmlText(const std::string& value)
{
    // Only older engines report a bare "&"; newer ones take the text around it, and replace
    // characters that they cannot save.
    if (!HasOnlyXmlCharacters(value))
    {
        RefuseValue("it contains control characters, or bytes that are not UTF-8");
    }
    if (HasNoncharacters(value))
    {
        RefuseValue("it contains U+FFFE or U+FFFF, which are not characters");
    }
    ForEachReference(value, RequireReference);
}

void RequireDeclaredEntities(const std::string& value, const xmlDoc* document)
{
    if (HasExternalDtd(document))
    {
        return;
    }
    ForEachReference(value,
                     [&](const std::string& name)
                     {
                         const auto* const entity = reinterpret_cast<const xmlChar*>(name.c_str());
                         if (name[0] != '#' &&
                             xmlGetDocEntity(const_cast<xmlDoc*>(document), entity) == nullptr)
                         {
                             RefuseValue("the file declares no entity " + Quoted(name));
                         }
                     });
}

std::string ReadValue(const std::string& file, std::istream& input)
{
    try
    {
        return WithoutLineEnd(file == "-" ? ReadAll(input) : ReadFile(file));
    }
    catch (const std::system_error& error)
    {
        throw Failure(ExitStatus::BadFile,
                      "cannot read " + Quoted(file) + ": " + error.code().message());
    }
}
