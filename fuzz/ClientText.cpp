#include "ClientText.h"

#include "output/Quoting.h"

#include <algorithm>
#include <map>

namespace kxfuzz
{

namespace
{

std::string String(const Json& value)
{
    return value.get<std::string>();
}

std::string Number(const Json& value)
{
    return std::to_string(value.get<long>());
}

std::string ValueLine(const Json& result)
{
    const std::string value = String(result["value"]);
    return result.contains("key") ? String(result["key"]) + "\t" + Quoted(value) : value;
}

std::string KeyLine(const Json& result)
{
    const std::string left =
        result.contains("more") ? " ... " + Number(result["more"]) + " more" : "";
    return result.contains("value") ? ValueLine(result) + left : String(result["key"]);
}

std::string ChangeLine(const Json& result)
{
    const std::string location = String(result["location"]);
    if (result["before"].is_null())
    {
        return location + ": added " + Quoted(String(result["after"]));
    }
    const std::string before = Quoted(String(result["before"]));
    return result["after"].is_null()
               ? location + ": removed " + before
               : location + ": " + before + " -> " + Quoted(String(result["after"]));
}

std::string DifferenceLine(const Json& result)
{
    const std::string key = String(result["key"]) + "\t";
    if (result["other"].is_null())
    {
        return "- " + key + Quoted(String(result["value"]));
    }
    const std::string other = Quoted(String(result["other"]));
    return result["value"].is_null()
               ? "+ " + key + other
               : "! " + key + Quoted(String(result["value"])) + " -> " + other;
}

/** @return the line without the file's name in front and the kind at the end. */
std::string FindingLine(const Json& result)
{
    if (result.contains("key"))
    {
        return OnOneLine(" " + Quoted(String(result["key"])) + ": lookup " +
                         Number(result["lookup"]) + ", update " + Number(result["update"]));
    }
    return OnOneLine(Number(result["line"]) + ": " + String(result["severity"]) + ": " +
                     String(result["text"]));
}

/** @return the start of the line: attributes are in another order. */
std::string NodeLine(const Json& result)
{
    if (!result.contains("type"))
    {
        return String(result["value"]);
    }
    const Json& location = result["location"];
    const std::string place =
        location.is_null() ? String(result["place"]) : String(result.value("expression", location));
    return place + " " + String(result["type"]);
}

using LineOf = std::string (*)(const Json& result);

LineOf LineFor(const std::string& command)
{
    static const std::map<std::string, LineOf> lines = {
        {"get", ValueLine},     {"keys", KeyLine},      {"set", ChangeLine},
        {"add", ChangeLine},    {"remove", ChangeLine}, {"diff", DifferenceLine},
        {"check", FindingLine}, {"find", NodeLine}};
    const auto found = lines.find(command);
    return found == lines.end() ? nullptr : found->second;
}

bool IsAscii(const std::string& text)
{
    return std::all_of(text.begin(), text.end(),
                       [](char byte) { return static_cast<unsigned char>(byte) < 0x80; });
}

/** @return whether the text has another form, or the JSON replaces bytes that are not UTF-8. */
bool HasOtherOutput(const Arguments& arguments)
{
    const Arguments others = {"-z", "--null", "--quiet", "--diff", "--color", "--output"};
    return std::any_of(arguments.begin(), arguments.end(),
                       [&others](const std::string& argument)
                       {
                           const std::string option = argument.substr(0, argument.find('='));
                           return !IsAscii(argument) ||
                                  std::find(others.begin(), others.end(), option) != others.end();
                       });
}

} // namespace

void RequireSameContent(const Arguments& arguments, const std::string& text, const Json& answer)
{
    const LineOf lineOf = LineFor(arguments.front());
    if (lineOf == nullptr || answer["verb"] != arguments.front() || HasOtherOutput(arguments))
    {
        return;
    }
    std::size_t at = 0;
    for (const Json& result : answer["results"])
    {
        const std::string line = lineOf(result);
        const std::size_t found = text.find(line, at);
        const bool isNext =
            found != text.npos && text.substr(at, found - at).find('\n') == text.npos;
        Require(isNext, "text and JSON differ", line);
        at = std::min(text.find('\n', found + line.size()), text.size() - 1) + 1;
    }
    Require(answer["results"].empty() || at == text.size(), "the text has more than the JSON",
            text.substr(at));
}

} // namespace kxfuzz
