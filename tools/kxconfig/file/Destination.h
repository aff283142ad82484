#ifndef KX_TOOLS_DESTINATION_H
#define KX_TOOLS_DESTINATION_H

#include "file/FileLock.h"
#include "file/Place.h"
#include "output/Failure.h"

#include <chrono>
#include <iosfwd>
#include <memory>
#include <optional>
#include <string>

#include <unistd.h>

class Replacement;

/**
 * Where an update is saved. A regular file, or one that does not exist yet, is replaced as a whole
 * or not at all; a pipe, a device and what else is no regular file is written as a stream.
 *
 * The file is locked from construction until it is replaced. It keeps its owner, group,
 * permissions, ACL and extended attributes, and a symbolic link to it stays one. Another name of
 * the same file (a hard link) keeps the old content.
 */
class Destination
{
public:
    enum class Role
    {
        LoadedFile, ///< the file that is loaded after construction: not saved if it changed since
        OtherFile
    };

    /**
     * @throws Failure if the file stays locked for longer than @p wait, or if the loaded file could
     *         only be written as a stream. All else that keeps it from being saved is left to
     *         Save().
     */
    Destination(const std::string& path, Role role, std::chrono::seconds wait);

    /** @return why the file is not locked, as a message; empty if it is, or is none to lock. */
    std::string LockWarning() const;

    const std::string& Path() const { return m_path; }

    /** @return whether the path is "-" or another name of standard output. */
    bool IsStandardOutput() const { return m_descriptor == STDOUT_FILENO; }

    /** Makes Save() write to @p stream, which outlives this object. */
    void SetStream(std::ostream& stream) { m_stream = &stream; }

    struct Options
    {
        bool dropAttributes = false; ///< save even if not all attributes can be kept
        bool dryRun = false;         ///< do everything but replace the file
        std::string backupSuffix;    ///< of the name that keeps what is replaced; empty: none does
    };

    /** Saves @p bytes. @throws Failure if they are not saved, and all is as it was. */
    void Save(const std::string& bytes, const Options& options);

    /** @return why the saved file may not survive a power failure, as a message; or nothing. */
    std::string SyncWarning() const;

private:
    void Lock(std::chrono::seconds wait);
    Failure CannotSave(const std::string& reason) const;
    void WriteStream(const std::string& bytes) const;
    void Replace(const std::string& bytes, const Options& options);
    void RequireWritable() const;
    std::unique_ptr<Replacement> MakeReplacement() const;
    void KeepAttributes(int file, const Options& options) const;
    void RequireUnchanged() const;
    void KeepBackup(const std::string& suffix) const;

    std::string m_path;
    Role m_role;
    std::optional<int> m_descriptor;
    bool m_isStream = false;
    std::ostream* m_stream = nullptr;    ///< for a stream; none: the descriptor, or the path
    std::optional<struct stat> m_status; ///< of what the path leads to, since it is locked
    std::optional<Place> m_place;
    std::optional<FileLock> m_lock;
    std::error_code m_error; ///< why there is no place
    std::error_code m_syncError;
};

#endif
