// A client of the platform's stand-in, started by the tests: does what its first argument says.

#include "KxLog.h"

#include <atomic>
#include <cerrno>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <new>
#include <string>

#include <fcntl.h>
#include <pthread.h>
#include <sys/time.h>
#include <sys/wait.h>
#include <unistd.h>

static bool g_failNew = false;

void* operator new(std::size_t size)
{
    void* const memory = g_failNew ? nullptr : std::malloc(size);
    if (memory == nullptr)
    {
        throw std::bad_alloc();
    }
    return memory;
}

void operator delete(void* memory) noexcept
{
    std::free(memory);
}

void operator delete(void* memory, std::size_t) noexcept
{
    std::free(memory);
}

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

int LogLong(const char* length)
{
    KxLog(1, 9, "Tag", "%s", std::string(std::strtoul(length, nullptr, 10), 'x').c_str());
    return 0;
}

/** Logs while operator new fails: the record may be lost, the process goes on. */
int LogWithoutMemory()
{
    const std::string text(1000, 'x');
    g_failNew = true;
    KxLog(1, 9, "Tag", "%s", text.c_str());
    g_failNew = false;
    std::puts("alive");
    return 0;
}

/** Logs into a broken pipe while a SIGPIPE from another source is pending: that one stays. */
int LogWithPendingSignal()
{
    sigset_t pipeSignal;
    sigemptyset(&pipeSignal);
    sigaddset(&pipeSignal, SIGPIPE);
    sigprocmask(SIG_BLOCK, &pipeSignal, nullptr);
    raise(SIGPIPE);
    int ends[2];
    if (pipe(ends) != 0)
    {
        return 2;
    }
    close(ends[0]);
    dup2(ends[1], STDERR_FILENO);
    KxLog(1, 9, "Tag", "lost");
    sigset_t pending;
    sigpending(&pending);
    return sigismember(&pending, SIGPIPE) == 1 ? 0 : 3;
}

/** Cancels a thread that then logs: it ends in the write, and nothing but the thread does. */
int LogWhenCancelled()
{
    std::atomic<bool> cancelled(false);
    pthread_t thread;
    const auto run = [](void* go) -> void*
    {
        while (!static_cast<std::atomic<bool>*>(go)->load())
        {
        }
        KxLog(1, 9, "Tag", "lost");
        return nullptr;
    };
    if (pthread_create(&thread, nullptr, run, &cancelled) != 0)
    {
        return 2;
    }
    pthread_cancel(thread);
    cancelled = true;
    void* ending = nullptr;
    pthread_join(thread, &ending);
    return ending == PTHREAD_CANCELED ? 0 : 3;
}

void Nothing(int)
{
}

/** Logs a long record into a pipe whose reader is slow, interrupted by signals all the while. */
int LogPiecemeal()
{
    int ends[2];
    if (pipe(ends) != 0)
    {
        return 2;
    }
    const pid_t reader = fork();
    if (reader == 0)
    {
        close(ends[1]);
        usleep(100000);
        char piece[1000];
        for (ssize_t size = 0; (size = read(ends[0], piece, sizeof piece)) > 0;)
        {
            std::fwrite(piece, 1, static_cast<size_t>(size), stdout);
        }
        std::fflush(stdout);
        _exit(0);
    }
    close(ends[0]);
    dup2(ends[1], STDERR_FILENO);
    close(ends[1]);
    struct sigaction action = {};
    action.sa_handler = Nothing; // without SA_RESTART: a blocked write is interrupted
    sigaction(SIGALRM, &action, nullptr);
    const struct itimerval often = {{0, 5000}, {0, 5000}};
    setitimer(ITIMER_REAL, &often, nullptr);
    LogLong("300000");
    const struct itimerval never = {{0, 0}, {0, 0}};
    setitimer(ITIMER_REAL, &never, nullptr);
    close(STDERR_FILENO);
    waitpid(reader, nullptr, 0);
    return 0;
}

/** Logs without a reader, in the way that @p how names; the process must live on unchanged. */
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
    if (task == "long" && argc == 3)
    {
        return LogLong(argv[2]);
    }
    if (task == "memory")
    {
        return LogWithoutMemory();
    }
    if (task == "cancel")
    {
        return LogWhenCancelled();
    }
    if (task == "pending")
    {
        return LogWithPendingSignal();
    }
    if (task == "piecemeal")
    {
        return LogPiecemeal();
    }
    if (task == "void" && argc == 3)
    {
        return LogIntoTheVoid(argv[2]);
    }
    return 1;
}
