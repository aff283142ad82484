#include "Output.h"

#include <cstdlib>
#include <cstring>
#include <iostream>

#include <unistd.h>

namespace
{

bool g_inJson = false;
Json g_answer = {{"file", nullptr},
                 {"verb", nullptr},
                 {"status", 0},
                 {"results", Json::array()},
                 {"messages", Json::array()}};

bool IsSet(const char* variable)
{
    const char* const value = std::getenv(variable);
    return value != nullptr && *value != 0;
}

bool ShowsColours(int stream)
{
    const char* const terminal = std::getenv("TERM");
    const bool dumb = terminal == nullptr || std::strcmp(terminal, "dumb") == 0;
    return !g_inJson && isatty(stream) == 1 && !dumb && !IsSet("NO_COLOR");
}

const char* StartOf(Colour colour)
{
    switch (colour)
    {
    case Colour::Good:
        return "\x1B[32m";
    case Colour::Bad:
        return "\x1B[31m";
    default:
        return "\x1B[2m";
    }
}

std::string Coloured(Colour colour, const std::string& text)
{
    return StartOf(colour) + text + "\x1B[0m";
}

/** Bytes that are no UTF-8 become U+FFFD, so that any parser takes the object. */
std::string Written(const Json& json)
{
    return json.dump(2, ' ', false, Json::error_handler_t::replace);
}

std::string Escaped(unsigned char byte)
{
    const char* const digits = "0123456789abcdef";
    return {'\\', 'x', digits[byte >> 4], digits[byte & 0xF]};
}

/** @return whether one of U+0080 to U+009F stands at @p position: terminals obey them too. */
bool IsControlOfTwoBytes(const std::string& text, size_t position)
{
    if (text[position] != '\xC2' || position + 1 == text.size())
    {
        return false;
    }
    const auto second = static_cast<unsigned char>(text[position + 1]);
    return second >= 0x80 && second <= 0x9F;
}

} // namespace

void AnswerInJson()
{
    g_inJson = true;
}

bool AnswersInJson()
{
    return g_inJson;
}

void AnswerFor(const std::string& verb, const std::string& file)
{
    g_answer["file"] = file;
    g_answer["verb"] = verb;
}

void Print(const std::string& line, const Json& result)
{
    PrintLine(line);
    PrintResult(result);
}

void PrintLine(const std::string& line)
{
    if (!g_inJson)
    {
        std::cout << line << '\n';
    }
}

void PrintResult(const Json& result)
{
    if (g_inJson)
    {
        g_answer["results"].push_back(result);
    }
}

void Complain(const std::string& message)
{
    if (g_inJson)
    {
        g_answer["messages"].push_back(message);
        return;
    }
    const std::string name = "kxconfig:";
    std::cerr << (ShowsColours(STDERR_FILENO) ? Coloured(Colour::Bad, name) : name) + " " +
                     OnOneLine(message) + "\n";
}

ExitStatus Finish(ExitStatus status)
{
    if (g_inJson)
    {
        g_answer["status"] = static_cast<int>(status);
        std::cout << Written(g_answer) << '\n';
    }
    if (std::cout.flush())
    {
        return status;
    }
    g_inJson = false; // there is nobody to read it
    Complain("cannot write to standard output");
    return ExitStatus::NotSaved;
}

std::string Painted(Colour colour, const std::string& text)
{
    return ShowsColours(STDOUT_FILENO) ? Coloured(colour, text) : text;
}

std::string OnOneLine(const std::string& text)
{
    std::string line;
    for (size_t i = 0; i != text.size(); ++i)
    {
        const auto byte = static_cast<unsigned char>(text[i]);
        if (text[i] == '\n')
        {
            line += "\\n";
        }
        else if (byte < 0x20 || byte == 0x7F)
        {
            line += Escaped(byte);
        }
        else if (IsControlOfTwoBytes(text, i))
        {
            line += Escaped(byte) + Escaped(static_cast<unsigned char>(text[++i]));
        }
        else
        {
            line += text[i];
        }
    }
    return line;
}

std::string Quoted(const std::string& text)
{
    std::string quoted = "\"";
    for (const char c : text)
    {
        quoted += c == '"' || c == '\\' ? "\\" : "";
        quoted += c;
    }
    return OnOneLine(quoted + '"');
}
