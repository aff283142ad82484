#ifndef KX_TOOLS_STEPTEXT_H
#define KX_TOOLS_STEPTEXT_H

#include "walk/Trail.h"

#include <nlohmann/json_fwd.hpp>

#include <string>

// What explain prints of the segments and terms that a walk compared elements with.

using Json = nlohmann::ordered_json;

/** @return the segment that the step compared with, as it is written in a key, quoted. */
std::string DescribeSegment(const TrailStep& step);
Json SegmentInJson(const TrailStep& step);

/** @return what each tested term of the condition found in the element. */
std::string DescribeTerms(const TrailStep& step);
Json TermsInJson(const TrailStep& step);

#endif
