#ifndef KX_FUZZ_CLIENTEDITS_H
#define KX_FUZZ_CLIENTEDITS_H

// What the client reports of a change, compared with what has changed in the file.

#include "ClientRuns.h"

#include <string>

namespace kxfuzz
{

/** @return whether @p arguments are those of a command that changes a file. */
bool IsEdit(const Arguments& arguments);

/**
 * Changes the file f.xml as @p arguments ask for, without options that only concern saving.
 *
 * What is reported is what has changed, --dry-run reports the same and changes nothing, --expect
 * refuses any other number of changes, and a command that fails leaves the file as it is.
 */
void RequireHonestEdit(const Arguments& arguments);

/** `diff` finds the keys whose values differ by `keys`. */
void RequireSameDifferences(const std::string& file, const std::string& other);

} // namespace kxfuzz

#endif
