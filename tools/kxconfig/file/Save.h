#ifndef KX_TOOLS_SAVE_H
#define KX_TOOLS_SAVE_H

#include "CXMLWriter.h"

#include <string>

/** What tells whether somebody else has changed a file since. */
class FileState
{
public:
    /** Notes the state of the file at @p path, which may be missing. */
    explicit FileState(const std::string& path);

    /** @return whether the file at @p path is another one now, or has other content. */
    bool HasChanged(const std::string& path) const;

private:
    bool m_exists;
    unsigned long long m_numbers[5]; ///< device, inode, size, time of change (seconds, nanoseconds)
};

/**
 * Saves the writer's document to the file at @p path so that the file is replaced as a whole or not
 * at all: the writer saves to a file beside it, which then takes its place.
 *
 * The file keeps its group and permissions, and its owner where the system allows that; a symbolic
 * link to it stays one. Another name of the same file (a hard link) keeps the old content. What is
 * no regular file, such as a device, is written directly.
 *
 * @param loaded  the state of the file at @p path when the document was loaded from it: a change
 *                by somebody else is not overwritten. Null if the document came from elsewhere.
 * @throws Failure if nothing was saved.
 */
void Save(CXMLWriter& writer, const std::string& path, const FileState* loaded);

#endif
