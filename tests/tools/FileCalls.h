#ifndef KX_TESTS_TOOLS_FILECALLS_H
#define KX_TESTS_TOOLS_FILECALLS_H

#include <functional>
#include <string>

// The test program stands in front of some system calls, to make them fail as other file systems
// do.

namespace kxtest
{

/** Acts before each call of one name, from construction to destruction. */
class BeforeCall
{
public:
    /** @return the error to fail with; 0 to make the call. */
    using Act = std::function<int(int number)>;

    /**
     * @param call  one of those that FileCalls.cpp defines.
     * @param act  gets the number of the call, from 1.
     */
    BeforeCall(const std::string& call, const Act& act);
    ~BeforeCall();
    BeforeCall(const BeforeCall&) = delete;
    BeforeCall& operator=(const BeforeCall&) = delete;

private:
    const std::string m_call;
};

/** Makes a call fail. */
class FailingCall
{
public:
    /** @param only  the number of the call that fails; 0: all do. */
    FailingCall(const std::string& call, int error, int only = 0)
        : m_before(call, [=](int number) { return only == 0 || number == only ? error : 0; })
    {
    }

private:
    const BeforeCall m_before;
};

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
