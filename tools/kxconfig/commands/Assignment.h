#ifndef KX_TOOLS_ASSIGNMENT_H
#define KX_TOOLS_ASSIGNMENT_H

#include <string>

/** A key path or an XPath expression, and the new text under it. */
struct Assignment
{
    std::string key;
    std::string value;
};

#endif
