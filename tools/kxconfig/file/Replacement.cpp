#include "file/Replacement.h"

#include "file/Debris.h"

#include <fcntl.h>
#include <sys/file.h>

namespace
{

const int kMostAttempts = 8;

} // namespace

Replacement::Replacement(const Place& place, mode_t mode) : m_place(place)
{
    bool isMade = MakeUnnamed(mode);
    for (int attempt = 0; !isMade && attempt != kMostAttempts; ++attempt)
    {
        isMade = MakeNamed(mode);
    }
    if (!isMade)
    {
        throw std::system_error(EBUSY, std::generic_category());
    }
}

Replacement::~Replacement()
{
    if (!m_name.empty())
    {
        Unlink();
    }
}

bool Replacement::MakeUnnamed(mode_t mode)
{
    m_file = Descriptor(openat(m_place.Folder(), ".", O_TMPFILE | O_RDWR | O_CLOEXEC, mode));
    // Without /proc it could not be given a name later.
    const bool isMade = m_file && access(m_file.NameInProc().c_str(), F_OK) == 0;
    if (isMade)
    {
        flock(m_file.Get(), LOCK_EX | LOCK_NB);
    }
    return isMade;
}

/** @return false if the file was taken for debris before it was locked. */
bool Replacement::MakeNamed(mode_t mode)
{
    const SignalDelay delay;
    m_name = NameOfReplacement();
    m_file = Descriptor(openat(m_place.Folder(), m_name.c_str(),
                               O_CREAT | O_EXCL | O_RDWR | O_CLOEXEC | O_NOFOLLOW, mode));
    if (!m_file)
    {
        m_name.clear();
        ThrowSystemError();
    }
    m_removal = std::make_unique<RemovalOnSignal>(m_place.Folder(), m_name);
    const bool isBusy = flock(m_file.Get(), LOCK_EX | LOCK_NB) != 0 && errno == EWOULDBLOCK;
    struct stat status = {};
    fstat(m_file.Get(), &status);
    const bool isOurs = !isBusy && status.st_nlink != 0;
    if (!isOurs)
    {
        Unlink();
    }
    return isOurs;
}

void Replacement::Unlink()
{
    const SignalDelay delay;
    unlinkat(m_place.Folder(), m_name.c_str(), 0);
    m_name.clear();
    m_removal.reset();
}

/** A link cannot replace a file, so that for a moment there is a second name. */
void Replacement::Link()
{
    m_name = NameOfReplacement();
    if (linkat(AT_FDCWD, m_file.NameInProc().c_str(), m_place.Folder(), m_name.c_str(),
               AT_SYMLINK_FOLLOW) != 0)
    {
        m_name.clear();
        ThrowSystemError();
    }
}

void Replacement::TakePlace()
{
    if (fsync(m_file.Get()) != 0)
    {
        ThrowSystemError();
    }
    const SignalDelay delay;
    if (m_name.empty())
    {
        Link();
    }
    if (renameat(m_place.Folder(), m_name.c_str(), m_place.Folder(), m_place.Name()) != 0)
    {
        const int reason = errno;
        Unlink();
        throw std::system_error(reason, std::generic_category());
    }
    m_name.clear();
    m_removal.reset();
}
