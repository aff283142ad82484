#include "file/Place.h"

#include <charconv>
#include <filesystem>

#include <fcntl.h>

namespace fs = std::filesystem;

namespace
{

const int kMostLinks = 40; // as many as the kernel follows

/** @return the path at the end of the symbolic links that @p path leads to. */
fs::path FollowLinks(fs::path path)
{
    std::error_code error;
    for (int links = 0; fs::is_symlink(fs::symlink_status(path, error)); ++links)
    {
        if (links == kMostLinks)
        {
            throw std::system_error(ELOOP, std::generic_category());
        }
        path = path.parent_path() / fs::read_symlink(path);
    }
    return path;
}

/** A folder that may be searched but not read serves as well, except that it cannot be synced. */
Descriptor OpenFolder(const fs::path& path)
{
    const char* const name = path.empty() ? "." : path.c_str();
    Descriptor folder(open(name, O_RDONLY | O_DIRECTORY | O_CLOEXEC));
    return folder ? std::move(folder) : Descriptor(open(name, O_PATH | O_DIRECTORY | O_CLOEXEC));
}

std::optional<int> Number(const std::string& digits)
{
    int number = 0;
    const char* const end = digits.data() + digits.size();
    const auto [stop, error] = std::from_chars(digits.data(), end, number);
    return error == std::errc() && stop == end ? std::optional(number) : std::nullopt;
}

} // namespace

Place::Place(const std::string& path)
{
    const fs::path target = FollowLinks(path);
    m_folder = OpenFolder(target.parent_path());
    m_name = target.filename();
    if (!m_folder)
    {
        ThrowSystemError();
    }
}

std::optional<struct stat> Place::Status() const
{
    struct stat status = {};
    const bool exists = fstatat(Folder(), Name(), &status, AT_SYMLINK_NOFOLLOW) == 0;
    return exists ? std::optional(status) : std::nullopt;
}

bool Place::Has(int file) const
{
    struct stat status = {};
    const std::optional<struct stat> here = Status();
    return here && fstat(file, &status) == 0 && AreSameFile(*here, status);
}

std::error_code Place::SyncFolder() const
{
    // EBADF: opened for searching only. EINVAL: the file system syncs no folders.
    const bool done = fsync(Folder()) == 0 || errno == EBADF || errno == EINVAL;
    return done ? std::error_code() : std::error_code(errno, std::generic_category());
}

std::optional<int> DescriptorNamedBy(const std::string& path)
{
    // The last link, in a folder like /proc/7/fd, leads to an open file and not to a path.
    const fs::path own = "/proc/" + std::to_string(getpid()) + "/fd";
    std::error_code error;
    fs::path name = path;
    for (int links = 0; links != kMostLinks; ++links)
    {
        if (fs::canonical(name.parent_path().empty() ? "." : name.parent_path(), error) == own)
        {
            return Number(name.filename());
        }
        if (!fs::is_symlink(fs::symlink_status(name, error)))
        {
            return std::nullopt;
        }
        name = name.parent_path() / fs::read_symlink(name, error);
    }
    return std::nullopt;
}

bool AreSameFile(const struct stat& left, const struct stat& right)
{
    return left.st_dev == right.st_dev && left.st_ino == right.st_ino;
}
