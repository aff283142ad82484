#include "output/Progress.h"

#include "output/Terminal.h"

#include <algorithm>
#include <cerrno>
#include <cstring>

#include <sys/time.h>
#include <unistd.h>

namespace
{

const char kClear[] = "\r\x1B[K";
const char kStart[] = "\r\x1B[Kkxconfig: working... ";

bool g_isActive = false;
volatile sig_atomic_t g_isShown = 0;
volatile sig_atomic_t g_seconds = 0;

void Print(const char* text, size_t length)
{
    const ssize_t written = write(STDERR_FILENO, text, length);
    static_cast<void>(written); // there is no other place to report a failure to
}

/** Appends @p number to @p text, which has place for it. @return the new length. */
size_t AppendNumber(char* text, size_t length, int number)
{
    char digits[12];
    size_t count = 0;
    do
    {
        digits[count++] = static_cast<char>('0' + number % 10);
        number /= 10;
    } while (number != 0);
    std::reverse_copy(digits, digits + count, text + length);
    return length + count;
}

/** The handler of the signal, which must not request memory. */
void ShowSeconds(int)
{
    const int error = errno;
    g_seconds = g_seconds + 1;
    g_isShown = 1;
    char line[sizeof(kStart) + 16];
    std::memcpy(line, kStart, sizeof(kStart) - 1);
    size_t length = AppendNumber(line, sizeof(kStart) - 1, g_seconds);
    line[length++] = 's';
    Print(line, length);
    errno = error;
}

void Every(time_t seconds)
{
    const itimerval timer = {{seconds, 0}, {seconds, 0}};
    setitimer(ITIMER_REAL, &timer, nullptr);
}

} // namespace

Progress::Progress()
{
    sigaction(SIGALRM, nullptr, &m_former);
    m_handles = !IsDumbTerminal() && m_former.sa_handler == SIG_DFL;
    g_isActive = m_handles;
    if (m_handles)
    {
        g_seconds = 0;
        struct sigaction show = {};
        show.sa_handler = ShowSeconds;
        show.sa_flags = SA_RESTART;
        sigaction(SIGALRM, &show, nullptr);
        Every(1);
    }
}

Progress::~Progress()
{
    if (m_handles)
    {
        End();
        sigaction(SIGALRM, &m_former, nullptr);
    }
}

void Progress::End()
{
    if (g_isActive)
    {
        g_isActive = false;
        Every(0);
        if (g_isShown != 0)
        {
            Print(kClear, sizeof(kClear) - 1);
            g_isShown = 0;
        }
    }
}
