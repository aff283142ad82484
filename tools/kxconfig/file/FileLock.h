#ifndef KX_TOOLS_FILELOCK_H
#define KX_TOOLS_FILELOCK_H

#include "file/Place.h"

#include <chrono>

/**
 * The advisory lock on the file that is to be replaced, from construction to destruction.
 *
 * It is a lock of flock(): it belongs to the open file, so that closing another descriptor of the
 * file does not give it up, as it would one of fcntl(); and a shell script can take part with
 * flock(1). The file itself is locked, so that no lock file is left behind. A file that is replaced
 * while its lock is awaited is another file then, and the new one is locked.
 */
class FileLock
{
public:
    enum class State
    {
        Held,
        Busy,        ///< another process kept it until the wait was over
        Unsupported, ///< the file system has no locks; the file is open all the same
        NotOpened    ///< there is no such file, or it cannot be opened for writing: see Error()
    };

    FileLock(const Place& place, std::chrono::milliseconds wait);

    State GetState() const { return m_state; }

    /** @return why the file could not be opened or locked. */
    std::error_code Error() const { return m_error; }

    /** @return the file, open for reading and writing, unless it could not be opened. */
    int File() const { return m_file.Get(); }

private:
    void Try(const Place& place);

    Descriptor m_file;
    State m_state = State::NotOpened;
    std::error_code m_error;
};

#endif
