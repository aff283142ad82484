#include "file/Save.h"

#include "output/Failure.h"

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

Failure CannotSave(const std::string& path, const std::string& reason)
{
    return {ExitStatus::NotSaved, "cannot save " + path + ": " + reason};
}

/** @return why the system refused the last call. */
std::string SystemReason()
{
    return std::strerror(errno);
}

bool Write(CXMLWriter& writer, const std::string& path)
{
    writer.SetPath(path);
    return writer.SaveData() == 0;
}

/** Changes the current folder for the life of the object. */
class InFolder
{
public:
    explicit InFolder(const fs::path& folder) : m_former(open(".", O_PATH | O_CLOEXEC))
    {
        if (m_former < 0 || chdir(folder.c_str()) != 0)
        {
            const int error = errno;
            close(m_former);
            errno = error;
            m_former = -1;
        }
    }

    ~InFolder()
    {
        if (m_former >= 0)
        {
            // It fails only if the folder was closed to the user meanwhile.
            [[maybe_unused]] const int result = fchdir(m_former);
            close(m_former);
        }
    }

    InFolder(const InFolder&) = delete;
    InFolder& operator=(const InFolder&) = delete;

    /** @return whether the folder could be entered; errno tells why not. */
    explicit operator bool() const { return m_former >= 0; }

private:
    int m_former;
};

/**
 * A file beside the one that it is to replace.
 *
 * The engine decodes "%20" and the like in the paths that it saves to, so it is given a plain name
 * in the current folder.
 */
class Replacement
{
public:
    /** @param path  the target as the user named it, for messages. */
    Replacement(const std::string& path, const fs::path& target)
        : m_target(target),
          m_folder(target.has_parent_path() ? target.parent_path() : fs::path("."))
    {
        if (!m_folder)
        {
            throw CannotSave(path, SystemReason());
        }
        const int file = mkstemp(m_name);
        if (file < 0)
        {
            // A user who may write the file would look for the reason there.
            throw CannotSave(path, "cannot create a file in its directory: " + SystemReason());
        }
        close(file);
    }

    ~Replacement() { unlink(m_name); }

    Replacement(const Replacement&) = delete;
    Replacement& operator=(const Replacement&) = delete;

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
    const InFolder m_folder;
    char m_name[32] = ".kxconfig-XXXXXX";
};

void SaveBeside(CXMLWriter& writer, const std::string& path, const fs::path& target,
                const FileState* loaded)
{
    Replacement replacement(path, target);
    if (!Write(writer, replacement.Name()))
    {
        throw CannotSave(path, "the engine could not write it");
    }
    if (loaded != nullptr && loaded->HasChanged(target))
    {
        throw Failure(ExitStatus::NotSaved,
                      "not saved: " + path + " was changed by another program in the meantime");
    }
    if (!replacement.TakePlace())
    {
        throw CannotSave(path, SystemReason());
    }
}

/** Writes what is not a regular file, such as a device. */
void SaveDirectly(CXMLWriter& writer, const std::string& path)
{
    if (!Write(writer, path))
    {
        throw Failure(ExitStatus::NotSaved, "cannot save " + path);
    }
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

void Save(CXMLWriter& writer, const std::string& path, const FileState* loaded)
{
    std::error_code error;
    const fs::path target = FollowLinks(path);
    const fs::file_status status = fs::status(target, error);
    if (fs::is_directory(status))
    {
        throw CannotSave(path, std::strerror(EISDIR));
    }
    if (fs::exists(status) && !fs::is_regular_file(status))
    {
        SaveDirectly(writer, path);
        return;
    }
    if (fs::exists(status) && access(target.c_str(), W_OK) != 0)
    {
        throw CannotSave(path, SystemReason());
    }
    SaveBeside(writer, path, target, loaded);
}
