#ifndef KX_DIAG_LOG_H
#define KX_DIAG_LOG_H

#include "KxLog.h"

/**
 * @file Log.h
 * The log gate: every record of the library passes through one of the macros below.
 *
 * A gate tests the level's bit in the library's log mask word and calls KxLog() only if it is set.
 * With the bit clear it costs a load, a test and a branch that is not taken: no call is made and no
 * argument is evaluated. The word is read anew at each gate, since the platform may change it at
 * any time.
 *
 * The operation's bare name is the record's tag. A gate takes it from the function that it stands
 * in; a function that works on behalf of another operation uses the _AS form, which is given the
 * tag. The _OF form takes the one argument that its format asks for.
 *
 * An operation that traces logs KX_TRACE("+") first and KX_TRACE("-") last on each return path. "-"
 * is written out instead of left to a destructor because a call that an exception leaves logs none,
 * and because it precedes the destruction of the operation's own locals.
 *
 * Text that comes from outside (a key, a path, a value) is always an argument, never the format.
 */

namespace kx
{

/** Levels of the library's records. */
enum LogLevel
{
    LogLevelWarning = 8, ///< a feature that is not available on this platform
    LogLevelError = 9,   ///< a missing document, root or node; a failed parse, save or creation
    LogLevelTrace = 11,  ///< "+" on entry and "-" on return, and the lines that stand in for them
    LogLevelValue = 29,  ///< keys requested and values parsed
    LogLevelXPath = 31   ///< XPath and node-set diagnostics of the document queries
};

/** Byte offset of the library's mask word in g_LumLogParams, from the platform's published layout.
 */
const unsigned int kLogMaskOffset = 0x2F14;

/**
 * Where the library's log mask word is, however the platform declares the object.
 *
 * For ARM, where an instruction cannot reach so far into the object: with the address, which the
 * loader computes once, a gate there is a load, a test and a branch as well.
 */
extern const unsigned int* const kLogMaskWord __attribute__((visibility("hidden")));

// The gate is inline in the smallest of builds as well, where the compiler would rather call it.

/** The library's log mask word. */
__attribute__((always_inline)) inline unsigned int LogMask()
{
#ifdef __arm__
    return *kLogMaskWord;
#else
    return *reinterpret_cast<const unsigned int*>(reinterpret_cast<const char*>(&g_LumLogParams) +
                                                  kLogMaskOffset);
#endif
}

/** @return whether records of @p level are wanted; the mask is unsigned, so that 31 is a level. */
__attribute__((always_inline)) inline bool LogEnabled(LogLevel level)
{
    return __builtin_expect((LogMask() & (1u << level)) != 0, false);
}

/** @return whether records of either level are wanted; a single test, as that of one level. */
__attribute__((always_inline)) inline bool LogEnabled(LogLevel one, LogLevel other)
{
    return __builtin_expect((LogMask() & ((1u << one) | (1u << other))) != 0, false);
}

/**
 * The two records of nearly every operation.
 *
 * Out of line, as the part of a gate that is rarely run: a gate then passes two arguments instead
 * of four, of which text and level would be the same everywhere.
 */
__attribute__((noinline)) inline void LogEntry(int line, const char* tag)
{
    KxLog(line, LogLevelTrace, tag, "+");
}

__attribute__((noinline)) inline void LogReturn(int line, const char* tag)
{
    KxLog(line, LogLevelTrace, tag, "-");
}

/** Both records of an operation that has nothing to tell in between; the first one is wanted. */
__attribute__((noinline)) inline void LogEntryAndReturn(int line, const char* tag)
{
    KxLog(line, LogLevelTrace, tag, "+");
    if (LogEnabled(LogLevelTrace))
    {
        KxLog(line, LogLevelTrace, tag, "-");
    }
}

} // namespace kx

/** Logs @p text, which is a literal, as is @p level: only one of the calls is compiled. */
#define KX_LOG_TEXT(level, tag, text)                                                              \
    ((level) != kx::LogLevelTrace       ? static_cast<void>(KxLog(__LINE__, level, tag, text))     \
     : __builtin_strcmp(text, "+") == 0 ? kx::LogEntry(__LINE__, tag)                              \
     : __builtin_strcmp(text, "-") == 0 ? kx::LogReturn(__LINE__, tag)                             \
                                        : static_cast<void>(KxLog(__LINE__, level, tag, text)))

#define KX_LOG_RECORD(level, tag, text)                                                            \
    do                                                                                             \
    {                                                                                              \
        if (kx::LogEnabled(level))                                                                 \
        {                                                                                          \
            KX_LOG_TEXT(level, tag, text);                                                         \
        }                                                                                          \
    } while (false)

#define KX_LOG_RECORD_OF(level, tag, format, argument)                                             \
    do                                                                                             \
    {                                                                                              \
        if (kx::LogEnabled(level))                                                                 \
        {                                                                                          \
            KxLog(__LINE__, level, tag, format, argument);                                         \
        }                                                                                          \
    } while (false)

/** Stands before a block of gates of two levels: with both bits clear they cost one test in all. */
#define KX_LOG_EITHER(one, other) if (kx::LogEnabled(one, other))

/** "+" and "-" of an operation whose work nobody can see in between: one test for both. */
#define KX_TRACE_BOTH()                                                                            \
    do                                                                                             \
    {                                                                                              \
        if (kx::LogEnabled(kx::LogLevelTrace))                                                     \
        {                                                                                          \
            kx::LogEntryAndReturn(__LINE__, __FUNCTION__);                                         \
        }                                                                                          \
    } while (false)

#define KX_TRACE(text) KX_LOG_RECORD(kx::LogLevelTrace, __FUNCTION__, text)
#define KX_TRACE_AS(tag, text) KX_LOG_RECORD(kx::LogLevelTrace, tag, text)
#define KX_TRACE_OF(format, argument)                                                              \
    KX_LOG_RECORD_OF(kx::LogLevelTrace, __FUNCTION__, format, argument)
#define KX_ERROR(text) KX_LOG_RECORD(kx::LogLevelError, __FUNCTION__, text)
#define KX_ERROR_AS(tag, text) KX_LOG_RECORD(kx::LogLevelError, tag, text)
#define KX_ERROR_OF(format, argument)                                                              \
    KX_LOG_RECORD_OF(kx::LogLevelError, __FUNCTION__, format, argument)
#define KX_WARNING(text) KX_LOG_RECORD(kx::LogLevelWarning, __FUNCTION__, text)
#define KX_VALUE_OF(format, argument)                                                              \
    KX_LOG_RECORD_OF(kx::LogLevelValue, __FUNCTION__, format, argument)
#define KX_VALUE_AS(tag, format, argument)                                                         \
    KX_LOG_RECORD_OF(kx::LogLevelValue, tag, format, argument)
#define KX_XPATH(text) KX_LOG_RECORD(kx::LogLevelXPath, __FUNCTION__, text)
#define KX_XPATH_AS(tag, text) KX_LOG_RECORD(kx::LogLevelXPath, tag, text)
#define KX_XPATH_OF(format, argument)                                                              \
    KX_LOG_RECORD_OF(kx::LogLevelXPath, __FUNCTION__, format, argument)

#endif
