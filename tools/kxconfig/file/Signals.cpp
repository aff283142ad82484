#include "file/Signals.h"

#include <cerrno>

#include <fcntl.h>
#include <unistd.h>

namespace
{

const int kSignals[] = {SIGINT, SIGTERM, SIGHUP, SIGQUIT, SIGXCPU, SIGXFSZ};
const int kSignalCount = sizeof kSignals / sizeof *kSignals;

// A signal handler reads them: set before it is installed, and left alone while it is.
int g_folder;
char g_name[256];
struct sigaction g_before[kSignalCount];

extern "C" void RemoveAndPassOn(int signal)
{
    const int error = errno;
    unlinkat(g_folder, g_name, 0);
    for (int i = 0; i != kSignalCount; ++i)
    {
        if (kSignals[i] == signal)
        {
            sigaction(signal, &g_before[i], nullptr);
        }
    }
    raise(signal); // arrives when this handler returns
    errno = error;
}

} // namespace

SignalDelay::SignalDelay()
{
    sigset_t delayed;
    sigemptyset(&delayed);
    for (const int signal : kSignals)
    {
        sigaddset(&delayed, signal);
    }
    pthread_sigmask(SIG_BLOCK, &delayed, &m_before);
}

SignalDelay::~SignalDelay()
{
    pthread_sigmask(SIG_SETMASK, &m_before, nullptr);
}

RemovalOnSignal::RemovalOnSignal(int folder, const std::string& name)
{
    g_folder = folder;
    g_name[name.copy(g_name, sizeof g_name - 1)] = '\0';
    struct sigaction removal = {};
    removal.sa_handler = RemoveAndPassOn;
    for (int i = 0; i != kSignalCount; ++i)
    {
        sigaction(kSignals[i], nullptr, &g_before[i]);
        if (g_before[i].sa_handler != SIG_IGN)
        {
            sigaction(kSignals[i], &removal, nullptr);
        }
    }
}

RemovalOnSignal::~RemovalOnSignal()
{
    for (int i = 0; i != kSignalCount; ++i)
    {
        sigaction(kSignals[i], &g_before[i], nullptr);
    }
}
