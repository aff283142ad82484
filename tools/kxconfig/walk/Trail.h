#ifndef KX_TOOLS_TRAIL_H
#define KX_TOOLS_TRAIL_H

#include <libxml/tree.h>

#include <deque>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

// What a lookup or an update does, recorded step by step along the library's own walks.

/** A term of a condition, and whether the element's attribute fulfilled it. */
struct TestedTerm
{
    std::string_view attribute; ///< empty for a term without "="
    std::string_view expected;
    bool endsWithOr;
    bool holds;
};

enum class Verdict
{
    OtherName,
    Rejected, ///< by the condition
    Accepted
};

struct TrailLevel;

/** An element that the walk met, and what came of it. */
struct TrailStep
{
    const xmlNode* element;
    std::string_view name;      ///< what its name was compared with
    std::string_view condition; ///< of the segment that it was compared with
    Verdict verdict = Verdict::OtherName;
    bool suspended = false;            ///< accepted by its name alone, regardless of the condition
    const char* text = nullptr;        ///< that can be read or replaced; null if there is none
    bool keyEnds = false;              ///< the key ends in ".": nothing is wanted below
    std::unique_ptr<TrailLevel> below; ///< null if the walk did not go on below
};

/**
 * @return the terms of the condition that the step tested, up to the one that decided; none if the
 *         condition was not in force. They are tested again: few of many steps are described.
 */
std::vector<TestedTerm> TermsOf(const TrailStep& step);

/** The children of one element. */
struct TrailLevel
{
    const xmlNode* parent;
    bool keyEnds = false;
    std::deque<TrailStep> steps; // many, which are never moved
};

/**
 * The views in it are of the key that was walked, the texts are the document's: both must outlive
 * it.
 */
struct Trail
{
    std::unique_ptr<TrailLevel> top; ///< null if nothing was walked

    /** @return the elements that gave or lost their text, in document order. */
    std::vector<const TrailStep*> StepsWithText() const;
};

inline xmlNode* RootOf(const xmlDoc* document)
{
    // Headers before 2.9.8 declare it without const.
    return xmlDocGetRootElement(const_cast<xmlDoc*>(document));
}

/** @return whether @p key has a "." and starts with the name of the root. */
bool StartsAtRoot(const xmlDoc* document, const std::string& key);

/** What happens when @p key is looked up; no log records are written. */
Trail RecordLookup(const xmlDoc* document, const std::string& key);

/** What happens when the text under @p key is replaced; it is not. No log records are written. */
Trail RecordUpdate(const xmlDoc* document, const std::string& key);

/** @return whether @p element fulfills @p condition, by the library's own evaluation. */
bool Fulfills(const xmlNode* element, std::string_view condition);

#endif
