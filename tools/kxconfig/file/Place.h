#ifndef KX_TOOLS_PLACE_H
#define KX_TOOLS_PLACE_H

#include "file/Descriptor.h"

#include <optional>
#include <string>

#include <sys/stat.h>

/**
 * A name in a folder that is held open: it stays the same place if the folder is renamed, and
 * nothing depends on the current folder. The file may be missing.
 */
class Place
{
public:
    /**
     * Follows symbolic links, also one to a file that does not exist yet.
     *
     * @throw std::system_error if there is no such folder, or the links lead in a circle.
     */
    explicit Place(const std::string& path);

    int Folder() const { return m_folder.Get(); }
    const char* Name() const { return m_name.c_str(); }

    /** @return the state of the file that has the name now; nothing if there is none. */
    std::optional<struct stat> Status() const;

    /** @return whether @p file, an open one, has the name now. */
    bool Has(int file) const;

    /** Syncs the folder, where the file system and the folder's permissions allow that. */
    std::error_code SyncFolder() const;

private:
    Descriptor m_folder;
    std::string m_name;
};

/**
 * @return the descriptor of this process that @p path is a name of, such as 1 for /dev/stdout;
 *         nothing if it is none.
 */
std::optional<int> DescriptorNamedBy(const std::string& path);

/** @return whether two states are of the same file. */
bool AreSameFile(const struct stat& left, const struct stat& right);

#endif
