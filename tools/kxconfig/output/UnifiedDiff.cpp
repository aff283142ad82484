#include "output/UnifiedDiff.h"

#include <algorithm>
#include <cstddef>
#include <string_view>
#include <unordered_map>
#include <vector>

namespace
{

/** Lines with their line ends. */
using Lines = std::vector<std::string_view>;
using Numbers = std::vector<size_t>;

const size_t kContext = 3;

/** More edits than these are not searched for one by one. */
const std::ptrdiff_t kMostEdits = 200;

/** How often a part without few edits is divided by lines that occur once in it. */
const int kMostDivisions = 16;

Lines Split(std::string_view text)
{
    Lines lines;
    while (!text.empty())
    {
        const size_t end = std::min(text.find('\n'), text.size() - 1) + 1;
        lines.push_back(text.substr(0, end));
        text.remove_prefix(end);
    }
    return lines;
}

/** Lines of both texts from a begin to an end; equal lines, or one text's replacement of the
 * other's. */
struct Part
{
    size_t beforeBegin;
    size_t beforeEnd;
    size_t afterBegin;
    size_t afterEnd;

    bool IsOneSided() const { return beforeBegin == beforeEnd || afterBegin == afterEnd; }
};

/** Finds the parts that differ. */
class LineComparison
{
public:
    LineComparison(const Lines& before, const Lines& after)
    {
        std::unordered_map<std::string_view, size_t> numbers;
        m_before = Numbered(before, numbers);
        m_after = Numbered(after, numbers);
        m_places.resize(numbers.size());
        Compare({0, before.size(), 0, after.size()}, 0);
    }

    /** @return them in their order. */
    const std::vector<Part>& Differences() const { return m_differences; }

private:
    /** Where a line occurs in a part. */
    struct Place
    {
        size_t countBefore = 0;
        size_t countAfter = 0;
        size_t before = 0;
    };

    static Numbers Numbered(const Lines& lines,
                            std::unordered_map<std::string_view, size_t>& numbers)
    {
        Numbers numbered;
        numbered.reserve(lines.size());
        for (const std::string_view line : lines)
        {
            numbered.push_back(numbers.emplace(line, numbers.size()).first->second);
        }
        return numbered;
    }

    bool AreEqual(size_t before, size_t after) const { return m_before[before] == m_after[after]; }

    void Compare(Part part, int divisions)
    {
        Trim(part);
        if (part.beforeBegin == part.beforeEnd && part.afterBegin == part.afterEnd)
        {
            return;
        }
        if (part.IsOneSided() ||
            (!FindFewEdits(part) && !CompareInPlace(part) && !Divide(part, divisions)))
        {
            m_differences.push_back(part);
        }
    }

    void Trim(Part& part) const
    {
        while (!part.IsOneSided() && AreEqual(part.beforeBegin, part.afterBegin))
        {
            ++part.beforeBegin;
            ++part.afterBegin;
        }
        while (!part.IsOneSided() && AreEqual(part.beforeEnd - 1, part.afterEnd - 1))
        {
            --part.beforeEnd;
            --part.afterEnd;
        }
    }

    /** The greedy algorithm of Myers: the furthest that each number of edits leads on each
     * diagonal.
     * @return whether few edits are enough; then their parts are added. */
    bool FindFewEdits(const Part& part)
    {
        const auto width = static_cast<std::ptrdiff_t>(part.beforeEnd - part.beforeBegin);
        const auto height = static_cast<std::ptrdiff_t>(part.afterEnd - part.afterBegin);
        std::vector<std::vector<std::ptrdiff_t>> reached;
        for (std::ptrdiff_t edits = 0; edits <= kMostEdits; ++edits)
        {
            std::vector<std::ptrdiff_t> furthest(static_cast<size_t>(2 * edits + 1), -1);
            for (std::ptrdiff_t diagonal = -edits; diagonal <= edits; diagonal += 2)
            {
                std::ptrdiff_t x = Start(reached, edits, diagonal);
                while (x >= 0 && x < width && x - diagonal < height && x - diagonal >= 0 &&
                       AreEqual(part.beforeBegin + static_cast<size_t>(x),
                                part.afterBegin + static_cast<size_t>(x - diagonal)))
                {
                    ++x;
                }
                furthest[static_cast<size_t>(diagonal + edits)] = x;
            }
            reached.push_back(std::move(furthest));
            if (Furthest(reached, edits, width - height) >= width)
            {
                AddEdits(part, reached);
                return true;
            }
        }
        return false;
    }

    /** @return how far @p edits lead on @p diagonal; negative if they do not lead there. */
    static std::ptrdiff_t Furthest(const std::vector<std::vector<std::ptrdiff_t>>& reached,
                                   std::ptrdiff_t edits, std::ptrdiff_t diagonal)
    {
        const bool isThere = edits >= 0 && diagonal >= -edits && diagonal <= edits;
        return isThere ? reached[static_cast<size_t>(edits)][static_cast<size_t>(diagonal + edits)]
                       : -1;
    }

    /** @return where the last of @p edits leads on @p diagonal. */
    static std::ptrdiff_t Start(const std::vector<std::vector<std::ptrdiff_t>>& reached,
                                std::ptrdiff_t edits, std::ptrdiff_t diagonal)
    {
        if (edits == 0)
        {
            return 0;
        }
        const std::ptrdiff_t removal = Furthest(reached, edits - 1, diagonal - 1);
        const std::ptrdiff_t addition = Furthest(reached, edits - 1, diagonal + 1);
        return std::max(removal < 0 ? -1 : removal + 1, addition);
    }

    /** Follows the edits back from the end of @p part. */
    void AddEdits(const Part& part, const std::vector<std::vector<std::ptrdiff_t>>& reached)
    {
        std::vector<Part> edits;
        auto diagonal = static_cast<std::ptrdiff_t>(part.beforeEnd - part.beforeBegin) -
                        static_cast<std::ptrdiff_t>(part.afterEnd - part.afterBegin);
        for (auto count = static_cast<std::ptrdiff_t>(reached.size()) - 1; count > 0; --count)
        {
            const std::ptrdiff_t end = Start(reached, count, diagonal);
            const bool isAddition = Furthest(reached, count - 1, diagonal + 1) == end;
            const size_t before =
                part.beforeBegin + static_cast<size_t>(end - (isAddition ? 0 : 1));
            const size_t after =
                part.afterBegin + static_cast<size_t>(end - diagonal - (isAddition ? 1 : 0));
            edits.push_back(
                {before, before + (isAddition ? 0 : 1), after, after + (isAddition ? 1 : 0)});
            diagonal += isAddition ? 1 : -1;
        }
        m_differences.insert(m_differences.end(), edits.rbegin(), edits.rend());
    }

    /** Compares line by line, as most updates replace a line by a line.
     * @return false if that leaves fewer than half of the lines equal. */
    bool CompareInPlace(const Part& part)
    {
        const size_t count = part.beforeEnd - part.beforeBegin;
        std::vector<Part> different;
        for (size_t i = 0; i != count && count == part.afterEnd - part.afterBegin; ++i)
        {
            const size_t before = part.beforeBegin + i;
            const size_t after = part.afterBegin + i;
            if (!AreEqual(before, after))
            {
                different.push_back({before, before + 1, after, after + 1});
            }
        }
        const bool isUsed = !different.empty() && different.size() <= count / 2;
        if (isUsed)
        {
            m_differences.insert(m_differences.end(), different.begin(), different.end());
        }
        return isUsed;
    }

    /** Compares what is between the lines that occur once in both texts, in an order that both
     * have.
     * @return false if there are none. */
    bool Divide(const Part& part, int divisions)
    {
        const std::vector<Part> common =
            divisions < kMostDivisions ? CommonLines(part) : std::vector<Part>();
        Part between = part;
        for (const Part& line : common)
        {
            between.beforeEnd = line.beforeBegin;
            between.afterEnd = line.afterBegin;
            Compare(between, divisions + 1);
            between.beforeBegin = line.beforeEnd;
            between.afterBegin = line.afterEnd;
        }
        between.beforeEnd = part.beforeEnd;
        between.afterEnd = part.afterEnd;
        if (!common.empty())
        {
            Compare(between, divisions + 1);
        }
        return !common.empty();
    }

    void Count(const Part& part)
    {
        for (size_t i = part.beforeBegin; i != part.beforeEnd; ++i)
        {
            m_places[m_before[i]] = Place();
        }
        for (size_t i = part.afterBegin; i != part.afterEnd; ++i)
        {
            m_places[m_after[i]] = Place();
        }
        for (size_t i = part.beforeBegin; i != part.beforeEnd; ++i)
        {
            ++m_places[m_before[i]].countBefore;
            m_places[m_before[i]].before = i;
        }
        for (size_t i = part.afterBegin; i != part.afterEnd; ++i)
        {
            ++m_places[m_after[i]].countAfter;
        }
    }

    /** @return the longest sequence of lines that occur once in both texts: patience sorting. */
    std::vector<Part> CommonLines(const Part& part)
    {
        Count(part);
        std::vector<Part> lines;
        std::vector<size_t> previous;
        std::vector<size_t> piles; // the last lines of the best sequences of each length
        for (size_t i = part.afterBegin; i != part.afterEnd; ++i)
        {
            const Place& place = m_places[m_after[i]];
            if (place.countBefore == 1 && place.countAfter == 1)
            {
                const auto pile = std::lower_bound(piles.begin(), piles.end(), place.before,
                                                   [&lines](size_t line, size_t before)
                                                   { return lines[line].beforeBegin < before; });
                previous.push_back(pile == piles.begin() ? lines.size() : *std::prev(pile));
                const size_t index = static_cast<size_t>(pile - piles.begin());
                piles.resize(std::max(piles.size(), index + 1));
                piles[index] = lines.size();
                lines.push_back({place.before, place.before + 1, i, i + 1});
            }
        }
        return Sequence(lines, previous, piles);
    }

    static std::vector<Part> Sequence(const std::vector<Part>& lines,
                                      const std::vector<size_t>& previous,
                                      const std::vector<size_t>& piles)
    {
        std::vector<Part> sequence;
        for (size_t length = piles.size(), line = piles.empty() ? 0 : piles.back(); length != 0;
             --length, line = previous[line])
        {
            sequence.push_back(lines[line]);
        }
        std::reverse(sequence.begin(), sequence.end());
        return sequence;
    }

    Numbers m_before;
    Numbers m_after;
    std::vector<Place> m_places; ///< by the lines' numbers
    std::vector<Part> m_differences;
};

void AppendLine(std::string& diff, char mark, std::string_view line)
{
    diff += mark;
    diff += line;
    if (line.back() != '\n')
    {
        diff += "\n\\ No newline at end of file\n";
    }
}

std::string Range(size_t begin, size_t end)
{
    const size_t count = end - begin;
    const size_t first = begin + (count == 0 ? 0 : 1); // of none, the line before is named
    return std::to_string(first) + (count == 1 ? "" : "," + std::to_string(count));
}

using PartIterator = std::vector<Part>::const_iterator;

/** Appends the differences from @p first to @p last as one hunk, with the lines around them. */
void AppendHunk(std::string& diff, const Lines& before, const Lines& after, PartIterator first,
                PartIterator last)
{
    const size_t leading = std::min(kContext, first->beforeBegin);
    const Part& end = *std::prev(last);
    const size_t trailing = std::min(kContext, before.size() - end.beforeEnd);
    diff += "@@ -" + Range(first->beforeBegin - leading, end.beforeEnd + trailing) + " +" +
            Range(first->afterBegin - leading, end.afterEnd + trailing) + " @@\n";
    size_t line = first->beforeBegin - leading;
    const auto appendCommon = [&](size_t until)
    {
        for (; line != until; ++line)
        {
            AppendLine(diff, ' ', before[line]);
        }
    };
    for (; first != last; ++first)
    {
        appendCommon(first->beforeBegin);
        for (; line != first->beforeEnd; ++line)
        {
            AppendLine(diff, '-', before[line]);
        }
        for (size_t i = first->afterBegin; i != first->afterEnd; ++i)
        {
            AppendLine(diff, '+', after[i]);
        }
    }
    appendCommon(end.beforeEnd + trailing);
}

/** Edits of neighboring lines become one difference, so that what is removed comes first. */
std::vector<Part> Joined(const std::vector<Part>& parts)
{
    std::vector<Part> joined;
    for (const Part& part : parts)
    {
        if (!joined.empty() && joined.back().beforeEnd == part.beforeBegin &&
            joined.back().afterEnd == part.afterBegin)
        {
            joined.back().beforeEnd = part.beforeEnd;
            joined.back().afterEnd = part.afterEnd;
        }
        else
        {
            joined.push_back(part);
        }
    }
    return joined;
}

} // namespace

std::string UnifiedDiff(const NamedText& before, const NamedText& after)
{
    const Lines linesBefore = Split(before.text);
    const Lines linesAfter = Split(after.text);
    const std::vector<Part> parts = Joined(LineComparison(linesBefore, linesAfter).Differences());
    std::string diff = parts.empty() ? "" : "--- " + before.name + "\n+++ " + after.name + "\n";
    for (auto first = parts.begin(); first != parts.end();)
    {
        auto last = std::next(first);
        while (last != parts.end() &&
               last->beforeBegin - std::prev(last)->beforeEnd <= 2 * kContext)
        {
            ++last;
        }
        AppendHunk(diff, linesBefore, linesAfter, first, last);
        first = last;
    }
    return diff;
}
