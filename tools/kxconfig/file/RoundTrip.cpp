#include "file/RoundTrip.h"

#include "file/Engine.h"
#include "file/Load.h"
#include "output/Failure.h"
#include "output/Quoting.h"

#include <libxml/parser.h>

#include <algorithm>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <memory>
#include <new>
#include <optional>
#include <utility>

namespace
{

/** @return the bytes of the file at @p path; none of what cannot be read a second time: the engine
 * has read a pipe to its end. */
std::optional<std::string> BytesOf(const std::string& path)
{
    std::error_code error;
    if (!std::filesystem::is_regular_file(path, error))
    {
        return std::nullopt;
    }
    const auto size = std::filesystem::file_size(path, error);
    std::string bytes;
    if (error || size > bytes.max_size())
    {
        return std::nullopt;
    }
    bytes.resize(static_cast<size_t>(size));
    std::ifstream file(path, std::ios::binary);
    const bool isRead =
        static_cast<bool>(file.read(bytes.data(), static_cast<std::streamsize>(bytes.size())));
    return isRead ? std::optional(std::move(bytes)) : std::nullopt;
}

/** A file's bytes, taken apart where saving treats them in different ways. */
struct Parts
{
    explicit Parts(const std::string& bytes) : rest(bytes)
    {
        hasMark = Take("\xEF\xBB\xBF");
        if (StartsWithDeclaration())
        {
            const size_t end = std::min(rest.find("?>"), rest.size() - 2) + 2;
            declaration = rest.substr(0, end);
            rest.erase(0, end);
            Take("\n");
        }
    }

    bool hasMark; ///< of the byte order
    std::string declaration;
    std::string rest;

private:
    bool StartsWithDeclaration() const
    {
        const std::string name = "<?xml"; // "<?xml-stylesheet" starts like it
        return rest.compare(0, name.size(), name) == 0 && rest.size() > name.size() &&
               std::strchr(" \t\r\n", rest[name.size()]) != nullptr;
    }

    bool Take(const std::string& start)
    {
        const bool there = rest.compare(0, start.size(), start) == 0;
        rest.erase(0, there ? start.size() : 0);
        return there;
    }
};

std::string Shown(const std::string& text, size_t position)
{
    return QuotedStart(text.substr(position, text.find('\n', position) - position));
}

/** @return whether @p position of @p text lies between "<" and ">". */
bool IsInTag(const std::string& text, size_t position)
{
    const size_t open = text.rfind('<', position);
    const size_t close = position == 0 ? std::string::npos : text.rfind('>', position - 1);
    return open != std::string::npos && (close == std::string::npos || open > close);
}

/** @return what it probably is that differs first, at @p position. */
std::string KindOfDifference(const std::string& before, const std::string& after, size_t position)
{
    if (before[position] == '\r')
    {
        return "line ends (carriage returns)";
    }
    if (before[position] == '&' || after[position] == '&')
    {
        return "the notation of a character";
    }
    if (before.compare(position, 2, "\"/") == 0 || after.compare(position, 2, "/>") == 0 ||
        before.compare(position, 2, "/>") == 0)
    {
        return "the notation of an empty element";
    }
    return IsInTag(before, position) ? "white space or quotes in a tag" : "the text";
}

/** @return what one text has and the other, which is the beginning of it, has not. */
std::string DifferenceAtTheEnd(const std::string& before, const std::string& after)
{
    const bool isAdded = before.size() < after.size();
    const std::string& longer = isAdded ? after : before;
    const std::string end = longer.substr(std::min(before.size(), after.size()));
    return "the end of the file: " + QuotedStart(end) + (isAdded ? " is added" : " is removed");
}

Difference FirstDifference(const std::string& before, const std::string& after, long line)
{
    const auto length = static_cast<std::ptrdiff_t>(std::min(before.size(), after.size()));
    const auto end = std::mismatch(before.begin(), before.begin() + length, after.begin()).first;
    // What is saved is UTF-8, whatever the file is, and is not to be shown from within a character.
    const size_t position = StartOfCharacter(after, static_cast<size_t>(end - before.begin()));
    line += std::count(before.begin(), end, '\n');
    if (position == before.size() || position == after.size())
    {
        return {line, DifferenceAtTheEnd(before, after)};
    }
    return {line, KindOfDifference(before, after, position) + ": " + Shown(before, position) +
                      " becomes " + Shown(after, position)};
}

/** @return what saving changes in a file whose bytes cannot be compared, if it is one. */
std::optional<std::string> WholeChange(const std::string& bytes)
{
    const std::string start = bytes.substr(0, 2);
    if (start == "\xFE\xFF" || start == "\xFF\xFE")
    {
        return "every character: UTF-16 becomes UTF-8";
    }
    if (start == "\x1F\x8B")
    {
        return "the whole file: it is compressed, and is saved uncompressed";
    }
    return std::nullopt;
}

std::vector<Difference> Compare(const Parts& before, const Parts& after)
{
    std::vector<Difference> differences;
    if (before.hasMark)
    {
        differences.push_back({1, "the byte order mark, which is removed"});
    }
    if (before.declaration != after.declaration)
    {
        const std::string was = before.declaration.empty() ? "none" : Quoted(before.declaration);
        differences.push_back(
            {1, "the XML declaration: " + was + " becomes " + Quoted(after.declaration)});
    }
    if (before.rest != after.rest)
    {
        const auto lines = std::count(before.declaration.begin(), before.declaration.end(), '\n');
        const long first = lines + (before.declaration.empty() ? 1 : 2);
        differences.push_back(FirstDifference(before.rest, after.rest, first));
    }
    return differences;
}

} // namespace

std::vector<Difference> WhatSavingChanges(CXMLReader& reader, const std::string& file)
{
    const std::optional<std::string> bytes = BytesOf(file);
    if (!bytes)
    {
        return {};
    }
    const std::optional<std::string> change = WholeChange(*bytes);
    if (change)
    {
        return {{1, *change}};
    }
    return Compare(Parts(*bytes), Parts(SavedBytes(reader)));
}

// The engine has two calls for the same bytes: the writer uses the one that opens a file by its
// name, and does not report why that failed.
std::string SavedBytes(CXMLReader& reader)
{
    xmlChar* bytes = nullptr;
    int size = 0;
    xmlDocDumpMemoryEnc(DocumentOf(reader), &bytes, &size, "UTF-8");
    if (bytes == nullptr)
    {
        throw std::bad_alloc();
    }
    const auto release = [](xmlChar* owned) { xmlFree(owned); };
    const std::unique_ptr<xmlChar, decltype(release)> owner(bytes, release);
    return {reinterpret_cast<const char*>(bytes), static_cast<size_t>(size)};
}

void RequireLoadsAgain(const std::string& bytes, const std::string& target)
{
    const FirstEngineError error;
    xmlDoc* const again =
        xmlReadMemory(bytes.data(), static_cast<int>(bytes.size()), nullptr, nullptr, 0);
    xmlFreeDoc(again);
    if (again == nullptr)
    {
        throw Failure(ExitStatus::NotSaved,
                      "not saved: " + target + " would no longer load, line " + error.Text());
    }
}
