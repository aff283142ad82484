#include "FileCalls.h"

#include <cerrno>
#include <cstdarg>

#include <map>
#include <utility>

#include <dlfcn.h>
#include <fcntl.h>
#include <sys/file.h>
#include <sys/mman.h>
#include <sys/xattr.h>
#include <unistd.h>

namespace
{

int g_lockError = 0;
bool g_refusesUnnamed = false;

template <class Function>
Function Next(const char* name)
{
    return reinterpret_cast<Function>(dlsym(RTLD_NEXT, name));
}

struct Acting
{
    kxtest::BeforeCall::Act act;
    int calls = 0;
};

std::map<std::string, Acting> g_acting;

/** @return whether @p call is to fail, with errno as it is then. */
bool Fails(const char* call)
{
    const auto found = g_acting.find(call);
    const int error = found == g_acting.end() ? 0 : found->second.act(++found->second.calls);
    errno = error != 0 ? error : errno;
    return error != 0;
}

/** Makes the @p call of the type @p Function, unless it is to fail. */
template <class Function, class... Arguments>
auto Call(const char* call, Arguments... arguments)
{
    using Result = decltype(std::declval<Function>()(arguments...));
    return Fails(call) ? static_cast<Result>(-1) : Next<Function>(call)(arguments...);
}

int OpenNext(const char* call, int folder, const char* path, int flags, mode_t mode)
{
    if (g_refusesUnnamed && (flags & O_TMPFILE) == O_TMPFILE)
    {
        errno = EOPNOTSUPP;
        return -1;
    }
    return Fails("openat")
               ? -1
               : Next<int (*)(int, const char*, int, ...)>(call)(folder, path, flags, mode);
}

} // namespace

extern "C" int flock(int file, int operation) noexcept
{
    if (g_lockError != 0)
    {
        errno = g_lockError;
        return -1;
    }
    return Call<int (*)(int, int)>("flock", file, operation);
}

extern "C" int fsync(int file)
{
    return Call<int (*)(int)>("fsync", file);
}

extern "C" ssize_t read(int file, void* buffer, size_t size)
{
    return Call<ssize_t (*)(int, void*, size_t)>("read", file, buffer, size);
}

extern "C" ssize_t write(int file, const void* bytes, size_t size)
{
    return Call<ssize_t (*)(int, const void*, size_t)>("write", file, bytes, size);
}

extern "C" int access(const char* path, int mode) noexcept
{
    return Call<int (*)(const char*, int)>("access", path, mode);
}

extern "C" int linkat(int from, const char* path, int to, const char* name, int flags) noexcept
{
    using Function = int (*)(int, const char*, int, const char*, int);
    return Call<Function>("linkat", from, path, to, name, flags);
}

extern "C" int renameat(int from, const char* path, int to, const char* name) noexcept
{
    return Call<int (*)(int, const char*, int, const char*)>("renameat", from, path, to, name);
}

extern "C" int memfd_create(const char* name, unsigned int flags) noexcept
{
    return Call<int (*)(const char*, unsigned int)>("memfd_create", name, flags);
}

extern "C" int fchown(int file, uid_t owner, gid_t group) noexcept
{
    return Call<int (*)(int, uid_t, gid_t)>("fchown", file, owner, group);
}

extern "C" ssize_t flistxattr(int file, char* list, size_t size) noexcept
{
    return Call<ssize_t (*)(int, char*, size_t)>("flistxattr", file, list, size);
}

extern "C" ssize_t fgetxattr(int file, const char* name, void* value, size_t size) noexcept
{
    using Function = ssize_t (*)(int, const char*, void*, size_t);
    return Call<Function>("fgetxattr", file, name, value, size);
}

extern "C" int fremovexattr(int file, const char* name) noexcept
{
    return Call<int (*)(int, const char*)>("fremovexattr", file, name);
}

extern "C" int fsetxattr(int file, const char* name, const void* value, size_t size,
                         int flags) noexcept
{
    using Function = int (*)(int, const char*, const void*, size_t, int);
    return Call<Function>("fsetxattr", file, name, value, size, flags);
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

BeforeCall::BeforeCall(const std::string& call, const Act& act) : m_call(call)
{
    g_acting[call] = {act, 0};
}

BeforeCall::~BeforeCall()
{
    g_acting.erase(m_call);
}

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
