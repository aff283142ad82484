#ifndef KX_TOOLS_EXPLAIN_H
#define KX_TOOLS_EXPLAIN_H

#include "output/ExitStatus.h"

#include <iosfwd>
#include <string>

class Report;

struct ExplainArguments
{
    std::string file;
    std::istream* input = nullptr; ///< what the file "-" stands for
    std::string key;
    bool isUpdate = false; ///< explain an update, not a lookup
    std::string value;     ///< of the update: ignored; every value reaches the same elements
};

/**
 * kxconfig explain: describes level by level what a lookup or an update does; changes nothing.
 *
 * @return the status that get, or set, would end with.
 */
ExitStatus Explain(const ExplainArguments& arguments, Report& report);

#endif
