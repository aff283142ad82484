#include "file/SaveDifferences.h"

#include "file/Load.h"
#include "file/Nodes.h"
#include "output/Quoting.h"

#include <libxml/xmlsave.h>

#include <algorithm>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <new>
#include <optional>

namespace
{

/** Bytes after a difference that are read: more than are shown of a text. */
const size_t kBytesAfter = 64;

/** Bytes before a difference that identify it: of a character, or of a reference. */
const size_t kBytesBefore = 16;

bool IsBlank(char c)
{
    return c != 0 && std::strchr(" \t\r\n", c) != nullptr;
}

/** A place where two texts differ, with what is around it; both are equal before it. */
struct Place
{
    std::string before; ///< of the file
    std::string after;  ///< of what would be saved
    size_t position;    ///< where they differ
    bool isInTag;       ///< between "<" and ">"
};

std::string Shown(const std::string& text, size_t position)
{
    return QuotedStart(text.substr(position, text.find('\n', position) - position));
}

/** @return whether @p position is in a reference, such as &#13; or at its start. */
bool IsInReference(const std::string& text, size_t position)
{
    const size_t start = text.rfind('&', position);
    return start != std::string::npos && text.find(';', start) >= position;
}

/** @return what it probably is that differs. */
std::string KindOfDifference(const Place& place)
{
    const auto& [before, after, position, isInTag] = place;
    if (before[position] == '\r')
    {
        return "line ends (carriage returns)";
    }
    if (static_cast<unsigned char>(before[position]) >= 0x80)
    {
        return "the encoding of a character";
    }
    if (IsInReference(before, position) || IsInReference(after, position))
    {
        return "the notation of a character";
    }
    if (after.compare(position, 2, "/>") == 0 || before.compare(position, 2, "/>") == 0)
    {
        return "the notation of an empty element";
    }
    if (isInTag)
    {
        return "white space or quotes in a tag";
    }
    // The engine keeps all white space in the root.
    return IsBlank(before[position]) || IsBlank(after[position])
               ? "white space outside the root element"
               : "the text";
}

/** @return what one text has at its end and the other one lacks. */
std::string DifferenceAtTheEnd(const Place& place)
{
    const bool isAdded = place.before.size() < place.after.size();
    const std::string end = (isAdded ? place.after : place.before).substr(place.position);
    return "the end of the file: " + QuotedStart(end) + (isAdded ? " is added" : " is removed");
}

std::string Described(Place place)
{
    if (place.position == place.before.size() || place.position == place.after.size())
    {
        return DifferenceAtTheEnd(place);
    }
    // What is saved is UTF-8, whatever the file is, and is not to be shown from within a character.
    place.position = StartOfCharacter(place.after, place.position);
    return KindOfDifference(place) + ": " + Shown(place.before, place.position) + " becomes " +
           Shown(place.after, place.position);
}

/** @return the next bytes of @p file, at most @p size. */
std::string Read(std::istream& file, size_t size)
{
    std::string bytes(size, 0);
    file.read(bytes.data(), static_cast<std::streamsize>(size));
    bytes.resize(static_cast<size_t>(file.gcount()));
    return bytes;
}

/** Takes @p start from @p file, if it starts with it. @return whether it does. */
bool Skip(std::istream& file, const std::string& start)
{
    const std::streampos position = file.tellg();
    const bool isThere = Read(file, start.size()) == start;
    file.clear();
    if (!isThere)
    {
        file.seekg(position);
    }
    return isThere;
}

/** Takes the XML declaration and its line end from @p file. @return it; empty if there is none. */
std::string TakeDeclaration(std::istream& file)
{
    const std::streampos position = file.tellg();
    const std::string start = Read(file, 6);
    file.clear();
    if (start.substr(0, 5) != "<?xml" || !IsBlank(start.back())) // or "<?xml-stylesheet"
    {
        file.seekg(position);
        return "";
    }
    std::string declaration = start;
    for (char c = 0; file.get(c);)
    {
        declaration += c;
        if (declaration.compare(declaration.size() - 2, 2, "?>") == 0)
        {
            break;
        }
    }
    Skip(file, "\n");
    return declaration;
}

/** Compares a file with what the engine writes, while it writes. */
class SavedTextComparison
{
public:
    /** @param file  behind the XML declaration. */
    explicit SavedTextComparison(std::istream& file) : m_file(file) {}

    /** Compares with what @p document would be saved as; throws if memory runs out. */
    void Run(xmlDoc* document)
    {
        xmlOutputBuffer* const buffer =
            xmlOutputBufferCreateIO(Write, nullptr, this, xmlFindCharEncodingHandler("UTF-8"));
        const bool isSaved = buffer != nullptr && xmlSaveFileTo(buffer, document, "UTF-8") >= 0;
        if (!isSaved && !IsDone())
        {
            throw std::bad_alloc();
        }
        if (!m_place && m_file.peek() != std::istream::traits_type::eof())
        {
            Differ("");
        }
    }

    const std::string& Declaration() const { return m_declaration; }
    const std::optional<Place>& FirstDifference() const { return m_place; }

    /** @return the number of line ends before the first difference. */
    long LineEnds() const { return m_lineEnds; }

private:
    static int Write(void* self, const char* bytes, int size)
    {
        try
        {
            static_cast<SavedTextComparison*>(self)->Take({bytes, static_cast<size_t>(size)});
        }
        catch (const std::bad_alloc&)
        {
            return -1; // no exception passes through the engine
        }
        return static_cast<SavedTextComparison*>(self)->IsDone() ? -1
                                                                 : size; // the rest is not needed
    }

    bool IsDone() const { return m_place && m_place->after.size() > kBytesBefore + kBytesAfter; }

    void Take(std::string saved)
    {
        if (!m_isBehindDeclaration)
        {
            m_declaration += saved;
            const size_t end = m_declaration.find("?>\n");
            if (end == std::string::npos)
            {
                return;
            }
            m_isBehindDeclaration = true;
            saved = m_declaration.substr(end + 3);
            m_declaration.erase(end + 2);
        }
        if (m_place)
        {
            m_place->after += saved;
            return;
        }
        Compare(saved);
    }

    void Compare(const std::string& saved)
    {
        const std::string read = Read(m_file, saved.size());
        const auto end = std::mismatch(read.begin(), read.end(), saved.begin()).first;
        const auto equal = static_cast<size_t>(end - read.begin());
        Remember(read.substr(0, equal));
        if (equal != saved.size())
        {
            Differ(read.substr(equal));
            m_place->after += saved.substr(equal);
        }
    }

    /** Takes note of what both have. */
    void Remember(const std::string& equal)
    {
        m_lineEnds += std::count(equal.begin(), equal.end(), '\n');
        const size_t bracket = equal.find_last_of("<>");
        m_isInTag = bracket == std::string::npos ? m_isInTag : equal[bracket] == '<';
        m_equal += equal;
        m_equal.erase(0, m_equal.size() - std::min(m_equal.size(), kBytesBefore));
    }

    /** @param read  what has been read of the file from the difference on. */
    void Differ(const std::string& read)
    {
        m_file.clear();
        m_place =
            Place{m_equal + read + Read(m_file, kBytesAfter), m_equal, m_equal.size(), m_isInTag};
    }

    std::istream& m_file;
    std::string m_declaration;
    bool m_isBehindDeclaration = false;
    std::string m_equal; ///< the last bytes that both have
    bool m_isInTag = false;
    long m_lineEnds = 0;
    std::optional<Place> m_place;
};

/** @return what saving changes in a file whose bytes cannot be compared, if it is one. */
std::optional<std::string> WholeChange(std::istream& file, const xmlDoc* document)
{
    const std::string start = Read(file, 4);
    file.clear();
    file.seekg(0);
    const std::string two = start.substr(0, 2);
    if (two == "\xFE\xFF" || two == "\xFF\xFE" || (two.size() == 2 && (two[0] == 0 || two[1] == 0)))
    {
        const bool isWide = start.substr(2) == std::string(2, 0) || two == std::string(2, 0);
        return std::string("every character: ") + (isWide ? "UTF-32" : "UTF-16") + " becomes UTF-8";
    }
    if (start == "\xEF\xBB\xBF<" || start[0] == '<' || IsBlank(start[0]))
    {
        return std::nullopt;
    }
    if (two == "\x1F\x8B" || start == "\xFD\x37zX" || start.substr(0, 3) == std::string("]\0\0", 3))
    {
        return "the whole file: it is compressed, and is saved uncompressed";
    }
    return "every character: " + Text(document->encoding) + " becomes UTF-8";
}

std::vector<Difference> Compare(std::istream& file, xmlDoc* document)
{
    std::vector<Difference> differences;
    if (Skip(file, "\xEF\xBB\xBF"))
    {
        differences.push_back({1, "the byte order mark, which is removed"});
    }
    const std::string declaration = TakeDeclaration(file);
    SavedTextComparison comparison(file);
    comparison.Run(document);
    if (declaration != comparison.Declaration())
    {
        const std::string was = declaration.empty() ? "none" : Quoted(declaration);
        differences.push_back(
            {1, "the XML declaration: " + was + " becomes " + Quoted(comparison.Declaration())});
    }
    if (comparison.FirstDifference())
    {
        const auto lines = std::count(declaration.begin(), declaration.end(), '\n');
        const long first = lines + (declaration.empty() ? 1 : 2);
        differences.push_back(
            {first + comparison.LineEnds(), Described(*comparison.FirstDifference())});
    }
    return differences;
}

} // namespace

std::vector<Difference> DifferencesAfterSaving(CXMLReader& reader, const std::string& path)
{
    std::error_code error;
    std::ifstream file(path, std::ios::binary);
    if (!std::filesystem::is_regular_file(path, error) || !file)
    {
        return {};
    }
    xmlDoc* const document = DocumentOf(reader);
    const std::optional<std::string> change = WholeChange(file, document);
    return change ? std::vector<Difference>{{1, *change}} : Compare(file, document);
}
