#ifndef KX_TOOLS_SAVE_H
#define KX_TOOLS_SAVE_H

#include "CXMLWriter.h"

#include <string>

/**
 * Saves the writer's document to the file at @p path so that the file is replaced as a whole or not
 * at all: the writer saves to a file beside it, which then takes its place if it loads again.
 *
 * The file keeps its permissions, and a link to it stays one. What is no regular file, such as a
 * device, is written directly.
 *
 * @return an empty string, or one line that says why nothing was saved.
 */
std::string Save(CXMLWriter& writer, const std::string& path);

#endif
