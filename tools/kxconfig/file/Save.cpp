#include "file/Save.h"

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <filesystem>

#include <fcntl.h>
#include <stdlib.h>
#include <sys/stat.h>
#include <unistd.h>

namespace fs = std::filesystem;

namespace
{

/** @return why the system refused the last call. */
std::string SystemReason()
{
    return std::strerror(errno);
}

std::string SaveDirectly(CXMLWriter& writer, const std::string& path)
{
    writer.SetPath(path);
    return writer.SaveData() == 0 ? "" : "cannot save " + path;
}

/**
 * A file beside the one that it is to replace.
 *
 * The engine decodes "%20" and the like in the paths that it saves to, so it is given a plain name
 * in the current folder.
 */
class Replacement
{
public:
    explicit Replacement(const fs::path& target) : m_target(target)
    {
        const fs::path folder = target.parent_path();
        if (chdir(folder.empty() ? "." : folder.c_str()) != 0)
        {
            m_failure = SystemReason();
            return;
        }
        const int file = mkstemp(m_name);
        if (file < 0)
        {
            // Whoever may write the file looks for the reason in the file.
            m_failure = "no new file can be made in its folder: " + SystemReason();
            return;
        }
        close(file);
    }

    ~Replacement()
    {
        if (m_failure.empty())
        {
            unlink(m_name);
        }
    }

    Replacement(const Replacement&) = delete;
    Replacement& operator=(const Replacement&) = delete;

    /** @return why there is no such file; empty if there is. */
    const std::string& Failure() const { return m_failure; }

    const char* Name() const { return m_name; }

    /** Gives it the target's owner and permissions, or those of a new file, and its name. */
    bool TakePlace()
    {
        const int file = open(m_name, O_RDONLY | O_CLOEXEC);
        const bool done = file >= 0 && TakeOwnership(file) && fsync(file) == 0 &&
                          rename(m_name, m_target.filename().c_str()) == 0;
        if (file >= 0)
        {
            close(file);
        }
        return done;
    }

private:
    bool TakeOwnership(int file) const
    {
        struct stat status = {};
        if (stat(m_target.filename().c_str(), &status) != 0)
        {
            const mode_t mask = umask(0);
            umask(mask);
            return fchmod(file, 0666 & ~mask) == 0;
        }
        // Who may write the file without owning it becomes its owner; those who share it by its
        // group must not lose it.
        if (fchown(file, status.st_uid, status.st_gid) != 0)
        {
            status.st_mode &= 0777;
            if (fchown(file, static_cast<uid_t>(-1), status.st_gid) != 0)
            {
                return false;
            }
        }
        return fchmod(file, status.st_mode & 07777) == 0;
    }

    const fs::path m_target;
    char m_name[32] = ".kxconfig-XXXXXX";
    std::string m_failure;
};

std::string SaveBeside(CXMLWriter& writer, const std::string& path, const fs::path& target,
                       const FileState* loaded)
{
    Replacement replacement(target);
    if (!replacement.Failure().empty())
    {
        return "cannot save " + path + ": " + replacement.Failure();
    }
    if (!SaveDirectly(writer, replacement.Name()).empty())
    {
        return "cannot save " + path + ": the engine could not write it";
    }
    if (loaded != nullptr && loaded->HasChanged(target))
    {
        return "not saved: " + path + " was changed by somebody else meanwhile";
    }
    return replacement.TakePlace() ? "" : "cannot save " + path + ": " + SystemReason();
}

/** @return the file that @p path leads to by symbolic links; it need not exist. */
fs::path FollowLinks(const std::string& path)
{
    std::error_code error;
    fs::path target = path;
    for (int links = 0; links != 40 && fs::is_symlink(fs::symlink_status(target, error)); ++links)
    {
        target = target.parent_path() / fs::read_symlink(target, error);
    }
    const fs::path resolved = fs::weakly_canonical(target, error);
    return error ? target : resolved;
}

} // namespace

FileState::FileState(const std::string& path) : m_numbers()
{
    struct stat status = {};
    m_exists = stat(path.c_str(), &status) == 0;
    if (m_exists)
    {
        m_numbers[0] = static_cast<unsigned long long>(status.st_dev);
        m_numbers[1] = static_cast<unsigned long long>(status.st_ino);
        m_numbers[2] = static_cast<unsigned long long>(status.st_size);
        m_numbers[3] = static_cast<unsigned long long>(status.st_mtim.tv_sec);
        m_numbers[4] = static_cast<unsigned long long>(status.st_mtim.tv_nsec);
    }
}

bool FileState::HasChanged(const std::string& path) const
{
    const FileState now(path);
    return now.m_exists != m_exists || !std::equal(m_numbers, m_numbers + 5, now.m_numbers);
}

std::string Save(CXMLWriter& writer, const std::string& path, const FileState* loaded)
{
    std::error_code error;
    const fs::path target = FollowLinks(path);
    const fs::file_status status = fs::status(target, error);
    if (fs::is_directory(status))
    {
        return "cannot save " + path + ": " + std::strerror(EISDIR);
    }
    if (fs::exists(status) && !fs::is_regular_file(status))
    {
        return SaveDirectly(writer, path);
    }
    if (fs::exists(status) && access(target.c_str(), W_OK) != 0)
    {
        return "cannot save " + path + ": " + SystemReason();
    }
    return SaveBeside(writer, path, target, loaded);
}
