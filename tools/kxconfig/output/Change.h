#ifndef KX_TOOLS_CHANGE_H
#define KX_TOOLS_CHANGE_H

#include "output/Report.h"

#include <optional>
#include <string>

/** A node of a document that a command changed, added or removed. */
struct Change
{
    std::string location;              ///< such as /cfg/net[2]/ip
    std::optional<std::string> before; ///< null if the node is new
    std::optional<std::string> after;  ///< null if the node is removed

    std::string Line() const;
    Json InJson() const;
};

#endif
