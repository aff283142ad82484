#include "file/Destination.h"

#include "file/Backup.h"
#include "file/Debris.h"
#include "file/FileAttributes.h"
#include "file/Replacement.h"

#include <ostream>

#include <fcntl.h>

namespace
{

std::optional<struct stat> StatusOf(const std::string& path)
{
    struct stat status = {};
    return stat(path.c_str(), &status) == 0 ? std::optional(status) : std::nullopt;
}

bool IsSameContent(const struct stat& left, const struct stat& right)
{
    return AreSameFile(left, right) && left.st_size == right.st_size &&
           left.st_mtim.tv_sec == right.st_mtim.tv_sec &&
           left.st_mtim.tv_nsec == right.st_mtim.tv_nsec;
}

std::string List(const std::vector<std::string>& words)
{
    std::string list;
    for (const std::string& word : words)
    {
        list += (list.empty() ? "" : ", ") + word;
    }
    return list;
}

Descriptor OpenStream(const std::string& path)
{
    Descriptor stream(open(path.c_str(), O_WRONLY | O_CLOEXEC | O_NOCTTY));
    if (!stream)
    {
        ThrowSystemError();
    }
    return stream;
}

} // namespace

Destination::Destination(const std::string& path, Role role, std::chrono::seconds wait)
    : m_path(path), m_role(role)
{
    m_status = StatusOf(path);
    if (role == Role::OtherFile)
    {
        m_descriptor = path == "-" ? STDOUT_FILENO : DescriptorNamedBy(path);
    }
    m_isStream = m_descriptor || (m_status && !S_ISREG(m_status->st_mode));
    if (m_status && S_ISDIR(m_status->st_mode))
    {
        m_error = std::make_error_code(std::errc::is_a_directory);
    }
    else if (!m_isStream)
    {
        Lock(wait);
    }
    else if (role == Role::LoadedFile)
    {
        throw CannotSave("it is not a regular file; --output names another one");
    }
}

void Destination::Lock(std::chrono::seconds wait)
{
    try
    {
        m_place.emplace(m_path);
    }
    catch (const std::system_error& error)
    {
        m_error = error.code();
        return;
    }
    m_lock.emplace(*m_place, wait);
    m_status = m_place->Status();
    if (m_lock->GetState() == FileLock::State::Busy)
    {
        throw Failure(ExitStatus::NotSaved, "not saved: " + m_path +
                                                " is locked by another process, for longer than " +
                                                std::to_string(wait.count()) + " s");
    }
}

Failure Destination::CannotSave(const std::string& reason) const
{
    return {ExitStatus::NotSaved, "cannot save " + m_path + ": " + reason};
}

std::string Destination::LockWarning() const
{
    const bool isMissing = m_lock && m_lock->GetState() == FileLock::State::Unsupported;
    return isMissing ? m_path + " is not locked: its file system does not support locks: " +
                           m_lock->Error().message()
                     : "";
}

std::string Destination::SyncWarning() const
{
    return m_syncError
               ? m_path + " is saved, but may not survive a power failure: " + m_syncError.message()
               : "";
}

void Destination::Save(const std::string& bytes, const Options& options)
{
    try
    {
        if (m_error)
        {
            throw std::system_error(m_error);
        }
        if (!m_isStream)
        {
            Replace(bytes, options);
        }
        else if (!options.dryRun)
        {
            WriteStream(bytes);
        }
    }
    catch (const std::system_error& error)
    {
        throw CannotSave(error.code().message());
    }
}

void Destination::WriteStream(const std::string& bytes) const
{
    if (m_stream != nullptr)
    {
        errno = EIO; // unless the system gives a better reason
        if (!m_stream->write(bytes.data(), static_cast<std::streamsize>(bytes.size())).flush())
        {
            ThrowSystemError();
        }
        return;
    }
    const Descriptor stream = m_descriptor ? Descriptor() : OpenStream(m_path);
    WriteAll(m_descriptor.value_or(stream.Get()), bytes);
}

void Destination::Replace(const std::string& bytes, const Options& options)
{
    RequireWritable();
    if (!options.dryRun)
    {
        RemoveDebris(*m_place);
    }
    const std::unique_ptr<Replacement> replacement = MakeReplacement();
    WriteAll(replacement->File(), bytes);
    KeepAttributes(replacement->File(), options);
    RequireUnchanged();
    if (!options.dryRun)
    {
        KeepBackup(options.backupSuffix);
        replacement->TakePlace();
        m_syncError = m_place->SyncFolder();
    }
}

void Destination::RequireWritable() const
{
    if (m_lock->GetState() == FileLock::State::NotOpened && m_status)
    {
        throw std::system_error(m_lock->Error());
    }
}

/** A user who may write the file looks for the reason in the file, not in its directory. */
std::unique_ptr<Replacement> Destination::MakeReplacement() const
{
    const mode_t onlyOwner = 0600; // until the attributes of the old file are known to be kept
    const mode_t asUsual = 0666;
    try
    {
        return std::make_unique<Replacement>(*m_place, m_status ? onlyOwner : asUsual);
    }
    catch (const std::system_error& error)
    {
        throw CannotSave("cannot create a file in its directory: " + error.code().message());
    }
}

void Destination::KeepAttributes(int file, const Options& options) const
{
    if (m_lock->GetState() == FileLock::State::NotOpened)
    {
        return; // a new file
    }
    const Attributes before(m_lock->File());
    before.ApplyTo(file);
    const std::vector<std::string> missing = before.MissingFrom(Attributes(file));
    if (!missing.empty() && !options.dropAttributes)
    {
        throw CannotSave("it would lose " + List(missing) + " (--drop-attributes saves it anyway)");
    }
}

void Destination::RequireUnchanged() const
{
    const std::optional<struct stat> now = m_place->Status();
    const bool isSame = now && m_status && IsSameContent(*now, *m_status);
    if (m_role == Role::LoadedFile && !isSame)
    {
        throw Failure(ExitStatus::NotSaved,
                      "not saved: " + m_path + " was changed by another program in the meantime");
    }
}

void Destination::KeepBackup(const std::string& suffix) const
{
    try
    {
        if (!suffix.empty() && m_status)
        {
            ::KeepBackup(*m_place, suffix);
        }
    }
    catch (const std::system_error& error)
    {
        throw CannotSave("cannot keep " + m_path + suffix + ": " + error.code().message());
    }
}
