// A client of the platform's stand-in, started by the tests: does what its first argument says.

#include "KxLog.h"

#include <cerrno>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>

#include <fcntl.h>
#include <sys/resource.h>
#include <unistd.h>

namespace
{

int PrintMask()
{
    std::printf("0x%08X\n", g_LumLogParams.xmlConfigParserMask);
    return 0;
}

int LogOne(const char* level, const char* text)
{
    KxLog(42, std::atoi(level), "ParseFile", "text: %s", text);
    return 0;
}

int LogLong()
{
    KxLog(1, 9, "Tag", "%s", std::string(100000, 'x').c_str());
    return 0;
}

/** Logs with nobody to read it, in the way @p how says; the process must live on unchanged. */
int LogIntoTheVoid(const std::string& how)
{
    if (how == "closed")
    {
        close(STDERR_FILENO);
    }
    else if (how == "full")
    {
        dup2(open("/dev/full", O_WRONLY), STDERR_FILENO);
    }
    else if (how == "pipe")
    {
        int ends[2];
        if (pipe(ends) != 0)
        {
            return 2;
        }
        close(ends[0]);
        dup2(ends[1], STDERR_FILENO);
    }
    errno = 1234;
    KxLog(1, 9, "Tag", "lost");
    KxLog(1, 9, "Tag", "%s", std::string(1000, 'x').c_str());
    if (errno != 1234)
    {
        return 3;
    }
    sigset_t pending;
    sigpending(&pending);
    sigset_t blocked;
    sigprocmask(SIG_BLOCK, nullptr, &blocked);
    if (sigismember(&pending, SIGPIPE) != 0 || sigismember(&blocked, SIGPIPE) != 0)
    {
        return 4;
    }
    std::puts("alive");
    return 0;
}

} // namespace

int main(int argc, char** argv)
{
    const std::string task = argc > 1 ? argv[1] : "";
    if (task == "mask")
    {
        return PrintMask();
    }
    if (task == "log" && argc == 4)
    {
        return LogOne(argv[2], argv[3]);
    }
    if (task == "long")
    {
        return LogLong();
    }
    if (task == "void" && argc == 3)
    {
        return LogIntoTheVoid(argv[2]);
    }
    return 1;
}
