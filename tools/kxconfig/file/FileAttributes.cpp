#include "file/FileAttributes.h"

#include "file/Descriptor.h"

#include <algorithm>
#include <cstdint>
#include <optional>

#include <sys/xattr.h>

namespace
{

const char* const kAcl = "system.posix_acl_access";

/** Whether an attribute is a checksum of the content or of the inode: copied, it would be wrong. */
bool IsChecksum(const std::string& name)
{
    return name == "security.ima" || name == "security.evm";
}

/** @return what @p read puts into a buffer that is large enough; nothing if it fails. */
template <class Read>
std::optional<std::string> ReadWhole(const Read& read)
{
    std::string bytes;
    ssize_t size = read(nullptr, 0);
    while (size > 0)
    {
        bytes.resize(static_cast<size_t>(size));
        size = read(bytes.data(), bytes.size());
        if (size >= 0)
        {
            bytes.resize(static_cast<size_t>(size));
            return bytes;
        }
        size = errno == ERANGE ? read(nullptr, 0) : -1; // it has grown meanwhile
    }
    return size == 0 ? std::optional(std::string()) : std::nullopt;
}

/** @return the names of the extended attributes, none where the file system has none. */
std::vector<std::string> NamesOf(int file)
{
    const auto list =
        ReadWhole([=](char* buffer, size_t size) { return flistxattr(file, buffer, size); });
    if (!list && errno != ENOTSUP && errno != ENOSYS)
    {
        ThrowSystemError();
    }
    std::vector<std::string> names;
    const std::string text = list.value_or("");
    for (size_t begin = 0; begin < text.size(); begin += names.back().size() + 1)
    {
        names.emplace_back(text.c_str() + begin);
    }
    return names;
}

std::optional<std::string> ValueOf(int file, const std::string& name)
{
    return ReadWhole([&](char* buffer, size_t size)
                     { return fgetxattr(file, name.c_str(), buffer, size); });
}

std::string InWords(const std::string& name)
{
    return name == kAcl ? "its ACL" : "the attribute " + name;
}

unsigned TwoBytes(const std::string& bytes, size_t position)
{
    return static_cast<unsigned char>(bytes[position]) |
           static_cast<unsigned>(static_cast<unsigned char>(bytes[position + 1])) << 8;
}

/** @return the rights that @p acl, in the system's encoding, gives in its first entry of @p tag. */
mode_t RightsIn(const std::string& acl, unsigned tag)
{
    const size_t header = 4; // the version; then entries of a tag, rights and an ID
    const size_t entry = 8;
    for (size_t at = header; at + entry <= acl.size(); at += entry)
    {
        if (TwoBytes(acl, at) == tag)
        {
            return TwoBytes(acl, at + 2) & 07U;
        }
    }
    return 0;
}

} // namespace

Attributes::Attributes(int file)
{
    if (fstat(file, &m_status) != 0)
    {
        ThrowSystemError();
    }
    for (const std::string& name : NamesOf(file))
    {
        const std::optional<std::string> value = ValueOf(file, name);
        if (value)
        {
            m_extended.emplace(name, *value);
        }
        else
        {
            m_unreadable.push_back(name);
        }
    }
}

bool Attributes::GiveOwner(int file) const
{
    return fchown(file, m_status.st_uid, m_status.st_gid) == 0 ||
           fchown(file, static_cast<uid_t>(-1), m_status.st_gid) == 0;
}

/** @return whether the ACL is kept, or there is none. */
bool Attributes::GiveExtended(int file) const
{
    for (const std::string& name : NamesOf(file))
    {
        if (m_extended.count(name) == 0 || name == kAcl)
        {
            fremovexattr(file, name.c_str()); // the ACL is one that the folder gives to new files
        }
    }
    bool hasAcl = m_extended.count(kAcl) == 0;
    for (const auto& [name, value] : m_extended)
    {
        const bool done =
            !IsChecksum(name) && fsetxattr(file, name.c_str(), value.data(), value.size(), 0) == 0;
        hasAcl = hasAcl || (done && name == kAcl);
    }
    return hasAcl;
}

/** Beside an ACL the group's bits of the mode are the most that any entry of it can give. */
mode_t Attributes::ModeWithoutAcl() const
{
    const unsigned groupTag = 4;
    const mode_t most = (m_status.st_mode & 070U) >> 3;
    const mode_t group = RightsIn(m_extended.at(kAcl), groupTag) & most;
    return (m_status.st_mode & 0707U) | group << 3;
}

void Attributes::ApplyTo(int file) const
{
    const bool hasGroup = GiveOwner(file);
    const bool hasAcl = GiveExtended(file);
    struct stat now = {};
    fstat(file, &now);
    mode_t mode = hasAcl ? m_status.st_mode & 07777U : ModeWithoutAcl();
    if (now.st_uid != m_status.st_uid)
    {
        mode &= 0777U;
    }
    if (!hasGroup)
    {
        mode &= 0707U; // with an ACL these are its mask: it gives nothing then
    }
    fchmod(file, mode);
}

std::vector<std::string> Attributes::MissingFrom(const Attributes& other) const
{
    std::vector<std::string> missing;
    const auto add = [&](bool isMissing, const std::string& what)
    {
        if (isMissing)
        {
            missing.push_back(what);
        }
    };
    add(other.m_status.st_uid != m_status.st_uid, "its owner");
    add(other.m_status.st_gid != m_status.st_gid, "its group");
    const bool hasNewAcl = other.m_extended.count(kAcl) > m_extended.count(kAcl);
    const bool differs = other.m_status.st_mode != m_status.st_mode || hasNewAcl;
    add(missing.empty() && differs, "its permissions");
    for (const auto& [name, value] : m_extended)
    {
        const auto kept = other.m_extended.find(name);
        add(kept == other.m_extended.end() || kept->second != value, InWords(name));
    }
    for (const std::string& name : m_unreadable)
    {
        add(true, InWords(name));
    }
    return missing;
}
