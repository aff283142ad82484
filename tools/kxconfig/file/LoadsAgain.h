#ifndef KX_TOOLS_LOADSAGAIN_H
#define KX_TOOLS_LOADSAGAIN_H

#include <string>

/**
 * Requires that @p bytes, which are about to be saved, load. They are parsed as a load parses them,
 * but no tree is built.
 *
 * @param target  the file to save to, for the message.
 * @throws Failure with the line and the engine's reason.
 */
void RequireLoadsAgain(const std::string& bytes, const std::string& target);

#endif
