#include "Save.h"

#include "Document.h"

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
        m_failed = chdir(folder.empty() ? "." : folder.c_str()) != 0;
        const int file = m_failed ? -1 : mkstemp(m_name);
        m_failed = file < 0;
        if (!m_failed)
        {
            close(file);
        }
    }

    ~Replacement()
    {
        if (!m_failed)
        {
            unlink(m_name);
        }
    }

    Replacement(const Replacement&) = delete;
    Replacement& operator=(const Replacement&) = delete;

    bool Failed() const { return m_failed; }
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
        // Who may write the file but does not own it makes it his own, as most editors do.
        if (fchown(file, status.st_uid, status.st_gid) != 0)
        {
            status.st_mode &= 0777;
        }
        return fchmod(file, status.st_mode & 07777) == 0;
    }

    const fs::path m_target;
    char m_name[32] = ".kxconfig-XXXXXX";
    bool m_failed;
};

std::string SaveBeside(CXMLWriter& writer, const std::string& path, const fs::path& target)
{
    Replacement replacement(target);
    if (replacement.Failed())
    {
        return "cannot save " + path + ": " + SystemReason();
    }
    std::string complaint = SaveDirectly(writer, replacement.Name());
    if (!complaint.empty())
    {
        return "cannot save " + path + ": the engine could not write it";
    }
    if (LoadFile(replacement.Name(), complaint) == nullptr)
    {
        const std::string line = complaint.substr(std::strlen(replacement.Name()) + 1);
        return "not saved: " + path + " would not load any more, line " + line;
    }
    return replacement.TakePlace() ? "" : "cannot save " + path + ": " + SystemReason();
}

} // namespace

std::string Save(CXMLWriter& writer, const std::string& path)
{
    std::error_code error;
    const fs::path resolved = fs::weakly_canonical(path, error); // follows links
    const fs::path target = error ? fs::path(path) : resolved;
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
    return SaveBeside(writer, path, target);
}
