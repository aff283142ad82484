#ifndef KX_TOOLS_REPLACEMENT_H
#define KX_TOOLS_REPLACEMENT_H

#include "file/Place.h"
#include "file/Signals.h"

#include <memory>
#include <string>

/**
 * A new file that takes the place of another as a whole, or vanishes.
 *
 * Where the file system can, it has no name until it takes its place, and vanishes even if the
 * process is killed. Elsewhere it has a name that RemoveDebris() knows, and is removed by the
 * destructor or by a signal that ends the process.
 */
class Replacement
{
public:
    /**
     * Makes the file in the folder of @p place, with the permissions that @p mode, the umask and
     * the folder give.
     *
     * @param place  outlives this object.
     * @throw std::system_error if the folder allows no new file.
     */
    Replacement(const Place& place, mode_t mode);
    ~Replacement();
    Replacement(const Replacement&) = delete;
    Replacement& operator=(const Replacement&) = delete;

    /** @return the new file, open for writing. */
    int File() const { return m_file.Get(); }

    /**
     * Syncs the file and gives it the name in @p place.
     *
     * @throw std::system_error if that fails: the place is as it was.
     */
    void TakePlace();

private:
    bool MakeUnnamed(mode_t mode);
    bool MakeNamed(mode_t mode);
    void Link();
    void Unlink();

    const Place& m_place;
    Descriptor m_file;
    std::string m_name; ///< empty while it has none
    std::unique_ptr<RemovalOnSignal> m_removal;
};

#endif
