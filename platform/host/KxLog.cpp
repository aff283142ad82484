#include "KxLog.h"

#include "LogMask.h"

#include <errno.h>
#include <pthread.h>
#include <signal.h>
#include <stdarg.h>
#include <stddef.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>
#include <sys/time.h>
#include <time.h>
#include <unistd.h>

#include <exception>
#include <string>

// The mask word's place is part of the platform's binary interface.
typedef char
    MaskWordOffsetIsPublished[offsetof(LumLogParams, xmlConfigParserMask) == 0x2F14 ? 1 : -1];

// Warnings and errors are enabled by default.
LumLogParams g_LumLogParams = {{0}, (1u << 8) | (1u << 9), {0}};

namespace
{

/** Keeps a write to a closed pipe from raising SIGPIPE in the process that logs. */
class BrokenPipeGuard
{
public:
    BrokenPipeGuard() : m_broken(false)
    {
        sigemptyset(&m_pipe);
        sigaddset(&m_pipe, SIGPIPE);
        sigset_t pending;
        sigpending(&pending);
        m_wasPending = sigismember(&pending, SIGPIPE) == 1;
        pthread_sigmask(SIG_BLOCK, &m_pipe, &m_before);
    }

    ~BrokenPipeGuard()
    {
        if (m_broken && !m_wasPending)
        {
            const struct timespec atOnce = {0, 0};
            sigtimedwait(&m_pipe, 0, &atOnce);
        }
        pthread_sigmask(SIG_SETMASK, &m_before, 0);
    }

    /** Called after a write that failed with EPIPE: the destructor discards its signal. */
    void Broken() { m_broken = true; }

private:
    BrokenPipeGuard(const BrokenPipeGuard&);
    BrokenPipeGuard& operator=(const BrokenPipeGuard&);

    sigset_t m_pipe;
    sigset_t m_before;
    bool m_wasPending;
    bool m_broken;
};

/** Writes to standard error, and drops what cannot be written. */
void WriteToStandardError(const char* data, size_t size)
{
    BrokenPipeGuard guard;
    while (size != 0)
    {
        const ssize_t written = write(STDERR_FILENO, data, size);
        if (written > 0)
        {
            data += written;
            size -= static_cast<size_t>(written);
        }
        else if (written == 0 || errno != EINTR)
        {
            if (errno == EPIPE)
            {
                guard.Broken();
            }
            return;
        }
    }
}

std::string TimeOfDay()
{
    struct timeval now;
    gettimeofday(&now, 0);
    struct tm local;
    memset(&local, 0, sizeof local);
    localtime_r(&now.tv_sec, &local);
    char date[32];
    strftime(date, sizeof date, "%Y-%m-%dT%H:%M:%S", &local);
    char text[48];
    snprintf(text, sizeof text, "%s.%03d", date, static_cast<int>(now.tv_usec / 1000));
    return text;
}

std::string LevelText(int level)
{
    const char* const name = LogLevelName(level);
    if (name != 0)
    {
        return name;
    }
    char number[32];
    snprintf(number, sizeof number, "level%d", level);
    return number;
}

/** Appends @p text so that it stays on its line: control characters are written as escapes. */
void AppendOnOneLine(std::string& line, const std::string& text)
{
    for (size_t i = 0; i != text.size(); ++i)
    {
        const unsigned char byte = static_cast<unsigned char>(text[i]);
        if (byte == '\n')
        {
            line += "\\n";
        }
        else if (byte < 0x20 || byte == 0x7F)
        {
            char escape[8];
            snprintf(escape, sizeof escape, "\\x%02X", static_cast<unsigned int>(byte));
            line += escape;
        }
        else
        {
            line += text[i];
        }
    }
}

void WriteRecord(int line, int level, const char* tag, const std::string& text)
{
    char number[16];
    snprintf(number, sizeof number, ":%d ", line);
    std::string record = TimeOfDay() + ' ' + LevelText(level) + ' ' + tag + number;
    AppendOnOneLine(record, text);
    record += '\n';
    WriteToStandardError(record.data(), record.size());
}

// Clients test their mask word without calling the platform, so the environment is read when this
// library is loaded.
__attribute__((constructor)) void TakeMaskFromEnvironment()
{
    const char* const text = getenv("KX_LOG_MASK");
    if (text == 0 || *text == '\0' || ParseLogMask(text, g_LumLogParams.xmlConfigParserMask))
    {
        return;
    }
    try
    {
        std::string complaint = "KX_LOG_MASK: \"";
        AppendOnOneLine(complaint, text);
        complaint = complaint + "\" is not a log mask; expected " + g_LogMaskHelp + '\n';
        WriteToStandardError(complaint.data(), complaint.size());
    }
    catch (const std::exception&)
    {
        // Out of memory: the mask stays as it was, without a message.
    }
}

} // namespace

extern "C" int KxLog(int line, int level, const char* tag, const char* format, ...)
{
    const int callersErrno = errno;
    va_list arguments;
    try
    {
        std::string text(256, '\0');
        va_start(arguments, format);
        const int length = vsnprintf(&text[0], text.size(), format, arguments);
        va_end(arguments);
        const size_t needed = length < 0 ? 0 : static_cast<size_t>(length);
        if (needed >= text.size())
        {
            text.resize(needed + 1);
            va_start(arguments, format);
            vsnprintf(&text[0], text.size(), format, arguments);
            va_end(arguments);
        }
        text.resize(needed);
        WriteRecord(line, level, tag, text);
    }
    catch (const std::exception&) // not the unwinding of a thread that is cancelled
    {
        // Out of memory: the record is lost, the caller goes on.
    }
    errno = callersErrno;
    return 0;
}
