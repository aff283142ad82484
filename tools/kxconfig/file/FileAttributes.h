#ifndef KX_TOOLS_FILEATTRIBUTES_H
#define KX_TOOLS_FILEATTRIBUTES_H

#include <map>
#include <string>
#include <vector>

#include <sys/stat.h>

/** The owner, group, permissions and extended attributes of a file; one of these is its ACL. */
class Attributes
{
public:
    /** @throw std::system_error if the system does not give them. */
    explicit Attributes(int file);

    /**
     * Gives @p file the same, as far as the system allows. Where it does not, rights are only
     * reduced: a group that is not kept has none, special bits go with the owner, and
     * without the ACL the group has what the ACL gave it.
     */
    void ApplyTo(int file) const;

    /** @return what @p other has not, or has differently, in words for a message. */
    std::vector<std::string> MissingFrom(const Attributes& other) const;

private:
    bool GiveOwner(int file) const;
    bool GiveExtended(int file) const;
    mode_t ModeWithoutAcl() const;

    struct stat m_status = {};
    std::map<std::string, std::string> m_extended;
    std::vector<std::string> m_unreadable;
};

#endif
