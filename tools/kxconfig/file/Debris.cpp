#include "file/Debris.h"

#include <memory>
#include <random>

#include <dirent.h>
#include <fcntl.h>
#include <sys/file.h>

namespace
{

const std::string kNameStart = ".kxconfig-";
const std::string kNameEnd = ".tmp";
const char* const kDigits = "0123456789abcdef";
const size_t kDigitCount = 16;

bool IsNameOfReplacement(const std::string& name)
{
    const size_t size = kNameStart.size() + kDigitCount + kNameEnd.size();
    return name.size() == size && name.compare(0, kNameStart.size(), kNameStart) == 0 &&
           name.find_first_not_of(kDigits, kNameStart.size()) == size - kNameEnd.size() &&
           name.compare(size - kNameEnd.size(), kNameEnd.size(), kNameEnd) == 0;
}

bool IsRegular(int folder, const char* name)
{
    struct stat status = {};
    return fstatat(folder, name, &status, AT_SYMLINK_NOFOLLOW) == 0 && S_ISREG(status.st_mode);
}

/**
 * A save holds the lock on its file until the file has its place or is removed. A second name of
 * the file that is to be replaced belongs to no other save: the caller has the lock on it.
 */
bool IsStale(const Place& place, int file)
{
    return flock(file, LOCK_EX | LOCK_NB) == 0 || (errno == EWOULDBLOCK && place.Has(file));
}

void RemoveIfStale(const Place& place, const char* name)
{
    if (!IsRegular(place.Folder(), name))
    {
        return;
    }
    const Descriptor file(
        openat(place.Folder(), name, O_RDWR | O_CLOEXEC | O_NOFOLLOW | O_NONBLOCK));
    if (file && IsStale(place, file.Get()))
    {
        unlinkat(place.Folder(), name, 0);
    }
}

} // namespace

std::string NameOfReplacement()
{
    std::random_device random;
    std::uniform_int_distribution<size_t> digit(0, 15);
    std::string name = kNameStart;
    for (size_t i = 0; i != kDigitCount; ++i)
    {
        name += kDigits[digit(random)];
    }
    return name + kNameEnd;
}

void RemoveDebris(const Place& place)
{
    const int list = openat(place.Folder(), ".", O_RDONLY | O_DIRECTORY | O_CLOEXEC);
    const std::unique_ptr<DIR, int (*)(DIR*)> entries(list < 0 ? nullptr : fdopendir(list),
                                                      closedir);
    while (const dirent* const entry = entries ? readdir(entries.get()) : nullptr)
    {
        if (IsNameOfReplacement(entry->d_name))
        {
            RemoveIfStale(place, entry->d_name);
        }
    }
}
