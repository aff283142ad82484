#include "checks/Kinds.h"

#include <algorithm>
#include <iomanip>
#include <iterator>
#include <sstream>

namespace
{

/** In the order of the enumeration. */
const KindMeaning kKinds[] = {
    {Kind::KeyWithoutValue, Severity::Warning, "key without a value",
     "a lookup of a given key finds nothing"},
    {Kind::AmbiguousKey, Severity::Warning, "ambiguous key",
     "a lookup of a given key finds more than one element"},
    {Kind::WiderUpdate, Severity::Warning, "wider update",
     "an update of a given key changes elements that a lookup does not find"},
    {Kind::NarrowerUpdate, Severity::Warning, "narrower update",
     "an update of a given key does not change all elements that a lookup finds"},
    {Kind::SuspendedCondition, Severity::Warning, "suspended condition",
     "a condition accepts an element that does not fulfill it"},
    {Kind::InvisibleValue, Severity::Warning, "invisible value", "text that no lookup finds"},
    {Kind::UnreachableElement, Severity::Warning, "unreachable element",
     "a name that no key can contain"},
    {Kind::RepeatedAttribute, Severity::Warning, "repeated attribute",
     "elements with identical attributes, whose siblings differ by attributes"},
    {Kind::SeveralValues, Severity::Note, "several values",
     "a key of the file finds more than one element, as in a list"},
    {Kind::ConditionDependsOnOrder, Severity::Note, "condition depends on order",
     "a condition would be suspended if the elements were in another order"},
    {Kind::MixedContent, Severity::Note, "mixed content",
     "text beside elements, as in prose, which no lookup finds"},
    {Kind::ChangedBySaving, Severity::Note, "changed by saving",
     "a save writes the file differently"},
};

} // namespace

const KindMeaning& MeaningOf(Kind kind)
{
    return kKinds[static_cast<size_t>(kind)];
}

const char* NameOf(Severity severity)
{
    return severity == Severity::Warning ? "warning" : "note";
}

std::string WordOf(Kind kind)
{
    std::string word = MeaningOf(kind).name;
    std::replace(word.begin(), word.end(), ' ', '-');
    return word;
}

std::optional<Kind> KindNamed(const std::string& text)
{
    const auto found = std::find_if(std::begin(kKinds), std::end(kKinds),
                                    [&](const KindMeaning& meaning) {
                                        return text == meaning.name || text == WordOf(meaning.kind);
                                    });
    return found == std::end(kKinds) ? std::nullopt : std::optional(found->kind);
}

std::vector<std::string> KindWords()
{
    std::vector<std::string> words;
    for (const KindMeaning& meaning : kKinds)
    {
        words.push_back(WordOf(meaning.kind));
    }
    return words;
}

std::string KindList()
{
    std::ostringstream list;
    list << std::left;
    for (const KindMeaning& meaning : kKinds)
    {
        list << (list.tellp() == 0 ? "" : "\n") << std::setw(26) << WordOf(meaning.kind) << "  "
             << std::setw(7) << NameOf(meaning.severity) << "  " << meaning.meaning;
    }
    return list.str();
}

bool Selection::Includes(Kind kind) const
{
    const bool isAskedFor = only.empty() ? notes || MeaningOf(kind).severity == Severity::Warning
                                         : only.count(kind) != 0;
    return isAskedFor && ignored.count(kind) == 0;
}
