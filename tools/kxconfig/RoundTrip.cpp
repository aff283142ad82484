#include "RoundTrip.h"

#include "Document.h"
#include "Output.h"

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <sstream>

#include <stdlib.h>
#include <unistd.h>

namespace
{

const size_t kShownText = 40;

std::string BytesOf(const std::string& path)
{
    std::ostringstream bytes;
    bytes << std::ifstream(path, std::ios::binary).rdbuf();
    return bytes.str();
}

/** A file that is gone when the object is. */
class ScratchFile
{
public:
    ScratchFile() : m_path(std::filesystem::temp_directory_path() / "kxconfig-XXXXXX")
    {
        const int file = mkstemp(m_path.data());
        m_failed = file < 0 || close(file) != 0;
    }

    ~ScratchFile() { unlink(m_path.c_str()); }
    ScratchFile(const ScratchFile&) = delete;
    ScratchFile& operator=(const ScratchFile&) = delete;

    bool Failed() const { return m_failed; }
    const std::string& Path() const { return m_path; }

private:
    std::string m_path;
    bool m_failed;
};

/** A file's bytes, taken apart where saving treats them in different ways. */
struct Parts
{
    explicit Parts(const std::string& bytes) : rest(bytes)
    {
        hasMark = Take("\xEF\xBB\xBF");
        if (rest.compare(0, 6, "<?xml ") == 0)
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
    bool Take(const std::string& start)
    {
        const bool there = rest.compare(0, start.size(), start) == 0;
        rest.erase(0, there ? start.size() : 0);
        return there;
    }
};

std::string Shown(const std::string& text, size_t position)
{
    const std::string line = text.substr(position, text.find('\n', position) - position);
    return line.size() > kShownText ? Quoted(line.substr(0, kShownText)) + "..." : Quoted(line);
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
        return "how a character is written";
    }
    if (before.compare(position, 2, "\"/") == 0 || after.compare(position, 2, "/>") == 0 ||
        before.compare(position, 2, "/>") == 0)
    {
        return "how an empty element is written";
    }
    return IsInTag(before, position) ? "white space or quotes in a tag" : "the text";
}

/** @return what one text has and the other, which is the beginning of it, has not. */
std::string DifferenceAtTheEnd(const std::string& before, const std::string& after)
{
    const bool isAdded = before.size() < after.size();
    const std::string& longer = isAdded ? after : before;
    const std::string end = longer.substr(std::min(before.size(), after.size()));
    const bool fits = end.size() <= kShownText;
    return "the end of the file: " + Quoted(end.substr(0, kShownText)) + (fits ? "" : "...") +
           (isAdded ? " is added" : " is lost");
}

Difference FirstDifference(const std::string& before, const std::string& after, long line)
{
    const auto length = static_cast<std::ptrdiff_t>(std::min(before.size(), after.size()));
    const auto end = std::mismatch(before.begin(), before.begin() + length, after.begin()).first;
    const auto position = static_cast<size_t>(end - before.begin());
    line += std::count(before.begin(), end, '\n');
    if (position == before.size() || position == after.size())
    {
        return {line, DifferenceAtTheEnd(before, after)};
    }
    return {line, KindOfDifference(before, after, position) + ": " + Shown(before, position) +
                      " becomes " + Shown(after, position)};
}

/** @return what is said of a file that bytes cannot be compared of; empty if they can. */
std::string WhyNotCompared(const std::string& bytes)
{
    const std::string start = bytes.substr(0, 2);
    if (start == "\xFE\xFF" || start == "\xFF\xFE")
    {
        return "every character: UTF-16 becomes UTF-8";
    }
    return start == "\x1F\x8B" ? "the whole file, which is compressed: it is saved as plain text"
                               : "";
}

std::vector<Difference> Compare(const Parts& before, const Parts& after)
{
    std::vector<Difference> differences;
    if (before.hasMark)
    {
        differences.push_back({1, "the byte order mark, which is lost"});
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
    const ScratchFile saved;
    GuestWriter writer(reader);
    writer.Get().SetPath(saved.Path());
    if (saved.Failed() || writer.Get().SaveData() != 0)
    {
        return {{1, "the whole file: it could not be saved to try"}};
    }
    const std::string bytes = BytesOf(file);
    const std::string reason = WhyNotCompared(bytes);
    if (!reason.empty())
    {
        return {{1, reason}};
    }
    return Compare(Parts(bytes), Parts(BytesOf(saved.Path())));
}
