#include "FileCalls.h"

#include <cerrno>
#include <cstdarg>

#include <dlfcn.h>
#include <fcntl.h>
#include <sys/file.h>

namespace
{

int g_lockError = 0;
bool g_refusesUnnamed = false;

template <class Function>
Function Next(const char* name)
{
    return reinterpret_cast<Function>(dlsym(RTLD_NEXT, name));
}

int OpenNext(const char* call, int folder, const char* path, int flags, mode_t mode)
{
    if (g_refusesUnnamed && (flags & O_TMPFILE) == O_TMPFILE)
    {
        errno = EOPNOTSUPP;
        return -1;
    }
    return Next<int (*)(int, const char*, int, ...)>(call)(folder, path, flags, mode);
}

} // namespace

extern "C" int flock(int file, int operation) noexcept
{
    if (g_lockError != 0)
    {
        errno = g_lockError;
        return -1;
    }
    return Next<int (*)(int, int)>("flock")(file, operation);
}

extern "C" int openat(int folder, const char* path, int flags, ...)
{
    va_list arguments;
    va_start(arguments, flags);
    const mode_t mode = (flags & (O_CREAT | O_TMPFILE)) != 0 ? va_arg(arguments, mode_t) : 0;
    va_end(arguments);
    // A 32-bit program calls this name, which is the same function elsewhere.
    return OpenNext("openat64", folder, path, flags, mode);
}

namespace kxtest
{

NoLocks::NoLocks(int error)
{
    g_lockError = error;
}

NoLocks::~NoLocks()
{
    g_lockError = 0;
}

NoUnnamedFiles::NoUnnamedFiles()
{
    g_refusesUnnamed = true;
}

NoUnnamedFiles::~NoUnnamedFiles()
{
    g_refusesUnnamed = false;
}

} // namespace kxtest
