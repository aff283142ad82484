#include "file/FileLock.h"

#include <algorithm>
#include <thread>

#include <fcntl.h>
#include <sys/file.h>

namespace
{

using Clock = std::chrono::steady_clock;

// Two updates of a small file fit between two looks.
const std::chrono::milliseconds kBetweenLooks(5);

/** @return the result of the attempt to lock @p file at once. */
FileLock::State Lock(int file)
{
    if (flock(file, LOCK_EX | LOCK_NB) == 0)
    {
        return FileLock::State::Held;
    }
    const bool isBusy = errno == EWOULDBLOCK || errno == EINTR;
    return isBusy ? FileLock::State::Busy : FileLock::State::Unsupported;
}

} // namespace

FileLock::FileLock(const Place& place, std::chrono::milliseconds wait)
{
    const Clock::time_point end = Clock::now() + wait;
    Try(place);
    while (m_state == State::Busy && Clock::now() < end)
    {
        std::this_thread::sleep_for(std::min<Clock::duration>(kBetweenLooks, end - Clock::now()));
        Try(place);
    }
}

void FileLock::Try(const Place& place)
{
    // For writing: over NFS an exclusive lock needs that.
    m_file = Descriptor(openat(place.Folder(), place.Name(),
                               O_RDWR | O_CLOEXEC | O_NOFOLLOW | O_NONBLOCK | O_NOCTTY));
    m_state = m_file ? Lock(m_file.Get()) : State::NotOpened;
    m_error = std::error_code(errno, std::generic_category());
    if (m_state == State::Held && !place.Has(m_file.Get()))
    {
        m_state = State::Busy; // replaced meanwhile: what has the name now is not locked yet
    }
}
