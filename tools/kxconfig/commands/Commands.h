#ifndef KX_TOOLS_COMMANDS_H
#define KX_TOOLS_COMMANDS_H

#include "output/ExitStatus.h"

#include <string>
#include <vector>

/** kxconfig get: prints the value or values under @p key in @p file, one on a line. */
ExitStatus Get(const std::string& file, const std::string& key);

/** kxconfig find: prints each node that @p expression selects, or the value that it has. */
ExitStatus Find(const std::string& file, const std::string& expression);

/** kxconfig keys: prints every key path under which @p file holds a value, with that value. */
ExitStatus Keys(const std::string& file);

/**
 * kxconfig explain: tells level by level what a lookup of @p key does in @p file, or an update;
 * changes nothing.
 *
 * @return what get, or set, would end with.
 */
ExitStatus Explain(const std::string& file, const std::string& key, bool update);

/** kxconfig check: warns of what surprises people, about @p keys or, without any, the file's own.
 */
ExitStatus Check(const std::string& file, const std::vector<std::string>& keys);

struct SetArguments
{
    std::string file;
    std::string key;
    std::string value;
    std::string output;  ///< where to save; empty: over the file
    bool dryRun = false; ///< show what would change, and save nothing
};

/** kxconfig set: replaces text by key, prints each element that changed, and saves. */
ExitStatus Set(const SetArguments& arguments);

#endif
