#ifndef KX_TOOLS_TRAILEVENTS_H
#define KX_TOOLS_TRAILEVENTS_H

#include "file/Locations.h"
#include "output/Report.h"
#include "walk/Trail.h"

#include <string>

// The results of explain: what a walk did, each as a line and as JSON.

/** Whose steps are explained: those of a lookup or of an update. */
enum class Walk
{
    Lookup,
    Update
};

/** What all events of one walk share. */
struct Narration
{
    Walk walk;
    const Report& report; ///< paints verdicts
    Locations locations;

    /** @return the last step of the node's path, with "/" if it is the root: a line that repeated
     * the whole path would be as long as the document is deep. */
    std::string StepOf(const xmlNode* node);

    /** @return the node's whole path, or null if it is very long. */
    Json LocationInJson(const xmlNode* node);
};

/** The walk starts with the elements below a node. */
struct LevelEvent
{
    const TrailLevel& level;
    int depth;
    Narration& narration;

    std::string Line() const;
    Json InJson() const;
};

/** The walk compares an element with a segment. */
struct StepEvent
{
    const TrailStep& step;
    const xmlNode* suspender; ///< the element that suspended the condition, if one did
    int depth;
    Narration& narration;

    std::string Line() const;
    Json InJson() const;

private:
    std::string DescribeVerdict() const;
    std::string DescribeOtherName() const;
    std::string DescribeAcceptance() const;
    std::string DescribeSuspension() const;
    std::string DescribeValue() const;
};

/** More steps with the same outcome. */
struct MoreEvent
{
    size_t count;
    std::string what;
    int depth;

    std::string Line() const;
    Json InJson() const;
};

#endif
