#ifndef KX_TOOLS_KINDS_H
#define KX_TOOLS_KINDS_H

#include <optional>
#include <set>
#include <string>
#include <vector>

/** What `check` reports. */
enum class Kind
{
    KeyWithoutValue,
    AmbiguousKey,
    WiderUpdate,
    NarrowerUpdate,
    SuspendedCondition,
    InvisibleValue,
    UnreachableElement,
    RepeatedAttribute,
    SeveralValues,
    ConditionDependsOnOrder,
    MixedContent,
    ChangedBySaving
};

/** A warning marks a problem for lookups or updates; anything else is a note. */
enum class Severity
{
    Warning,
    Note
};

struct KindMeaning
{
    Kind kind;
    Severity severity;
    const char* name; ///< in JSON; on a command line it may have dashes instead of spaces
    const char* meaning;
};

const KindMeaning& MeaningOf(Kind kind);

/** @return the word for @p severity in a line. */
const char* NameOf(Severity severity);

/** @return the name of @p kind as one word, which is shown in lines. */
std::string WordOf(Kind kind);

/** @return the kind of the name or word @p text, if there is one. */
std::optional<Kind> KindNamed(const std::string& text);

/** @return the words of all kinds. */
std::vector<std::string> KindWords();

/** @return a line for each kind. */
std::string KindList();

/** The kinds that the user asked for. */
struct Selection
{
    bool notes = false;
    std::set<Kind> only; ///< if not empty, exactly these, be they warnings or notes
    std::set<Kind> ignored;

    bool Includes(Kind kind) const;
};

#endif
