#include "model/Case.h"

#include <cstdio>
#include <cstdlib>

namespace kxmodel
{

namespace
{

const char* const kCalls[] = {"get",    "get-into", "get-in-place", "collect",
                              "append", "set",      "update"};
constexpr std::size_t kMostOperations = 64;

std::string Escaped(const std::string& text)
{
    std::string escaped;
    for (const char byte : text)
    {
        if (byte == '\\' || byte < ' ' || byte > '~')
        {
            char code[5];
            std::snprintf(code, sizeof code, "\\x%02x", static_cast<unsigned char>(byte));
            escaped += code;
        }
        else
        {
            escaped += byte;
        }
    }
    return escaped;
}

std::string Unescaped(const std::string& text)
{
    std::string plain;
    for (std::size_t i = 0; i < text.size(); ++i)
    {
        if (text.compare(i, 2, "\\x") == 0)
        {
            const std::string code = text.substr(i + 2, 2);
            plain += static_cast<char>(std::strtoul(code.c_str(), nullptr, 16));
            i += 1 + code.size();
        }
        else
        {
            plain += text[i];
        }
    }
    return plain;
}

/** Takes the bytes up to @p end (or the rest) off @p text, the end as well. */
std::string TakeUntil(char end, std::string& text)
{
    const auto position = text.find(end);
    const std::string taken = text.substr(0, position);
    text.erase(0, position == std::string::npos ? position : position + 1);
    return taken;
}

Call CallNamed(const std::string& name)
{
    for (std::size_t i = 0; i != std::size(kCalls); ++i)
    {
        if (name == kCalls[i])
        {
            return static_cast<Call>(i);
        }
    }
    return static_cast<Call>(name.size() % std::size(kCalls));
}

} // namespace

std::string ToText(const Case& subject)
{
    std::string text;
    for (const Operation& operation : subject.operations)
    {
        char numbers[32];
        std::snprintf(numbers, sizeof numbers, "\t%x\t%u\t", operation.mask, operation.node);
        text += kCalls[static_cast<std::size_t>(operation.call)];
        text += numbers + Escaped(operation.key) + '\t' + Escaped(operation.value) + '\n';
    }
    return text + '\n' + subject.document;
}

Case FromText(const std::string& text)
{
    Case subject;
    subject.document = text;
    while (subject.operations.size() != kMostOperations)
    {
        std::string line = TakeUntil('\n', subject.document);
        if (line.empty())
        {
            break;
        }
        Operation operation;
        operation.call = CallNamed(TakeUntil('\t', line));
        operation.mask =
            static_cast<unsigned>(std::strtoul(TakeUntil('\t', line).c_str(), nullptr, 16));
        operation.node =
            static_cast<unsigned>(std::strtoul(TakeUntil('\t', line).c_str(), nullptr, 10));
        operation.key = Unescaped(TakeUntil('\t', line));
        operation.value = Unescaped(line);
        subject.operations.push_back(operation);
    }
    return subject;
}

} // namespace kxmodel
