#ifndef KX_FUZZ_CLIENTTEXT_H
#define KX_FUZZ_CLIENTTEXT_H

#include "ClientRuns.h"

#include <string>

namespace kxfuzz
{

/** Aborts unless @p text is what the command prints for what is in @p answer, the same in JSON. */
void RequireSameContent(const Arguments& arguments, const std::string& text, const Json& answer);

} // namespace kxfuzz

#endif
