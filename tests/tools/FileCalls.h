#ifndef KX_TESTS_TOOLS_FILECALLS_H
#define KX_TESTS_TOOLS_FILECALLS_H

// The test program stands in front of some system calls, to make them fail as other file systems
// do.

namespace kxtest
{

/** Makes flock() fail with @p error from construction to destruction. */
class NoLocks
{
public:
    explicit NoLocks(int error);
    ~NoLocks();
    NoLocks(const NoLocks&) = delete;
    NoLocks& operator=(const NoLocks&) = delete;
};

/** Makes openat() refuse files without a name (O_TMPFILE) from construction to destruction. */
class NoUnnamedFiles
{
public:
    NoUnnamedFiles();
    ~NoUnnamedFiles();
    NoUnnamedFiles(const NoUnnamedFiles&) = delete;
    NoUnnamedFiles& operator=(const NoUnnamedFiles&) = delete;
};

} // namespace kxtest

#endif
