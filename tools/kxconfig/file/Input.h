#ifndef KX_TOOLS_INPUT_H
#define KX_TOOLS_INPUT_H

#include "file/Descriptor.h"

#include <iosfwd>
#include <string>

/**
 * A file that is about to be loaded. What can be read only once, a pipe, is opened once and copied
 * to memory, to its end: the library takes a path, and may open it more than once.
 */
class Input
{
public:
    /** The most that is read from a pipe. */
    static const size_t kMostFromPipe = size_t(1) << 30;

    /**
     * Waits for a pipe to end.
     *
     * @throw std::system_error if the file cannot be read; EFBIG if more than @p most bytes come
     *        out of a pipe.
     */
    explicit Input(const std::string& path, size_t most = kMostFromPipe);

    /** The same of a stream, such as standard input. */
    explicit Input(std::istream& stream, size_t most = kMostFromPipe);

    /** @return what the library is to load, valid while this object lives: never a URL. */
    const std::string& Path() const { return m_path; }

private:
    Descriptor m_copy; ///< in memory, of a pipe or a stream
    std::string m_path;
};

#endif
