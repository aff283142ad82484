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

/** The library's log mask word, found by its offset however the platform declares the object. */
inline unsigned int LogMask()
{
    return *reinterpret_cast<const unsigned int*>(reinterpret_cast<const char*>(&g_LumLogParams) +
                                                  kLogMaskOffset);
}

/** @return whether records of @p level are wanted; the mask is unsigned, so that 31 is a level. */
inline bool LogEnabled(LogLevel level)
{
    return __builtin_expect((LogMask() & (1u << level)) != 0, false);
}

/** @return whether records of either level are wanted; a single test, as that of one level. */
inline bool LogEnabled(LogLevel one, LogLevel other)
{
    return __builtin_expect((LogMask() & ((1u << one) | (1u << other))) != 0, false);
}

} // namespace kx

#define KX_LOG_RECORD(level, tag, text)                                                            \
    do                                                                                             \
    {                                                                                              \
        if (kx::LogEnabled(level))                                                                 \
        {                                                                                          \
            KxLog(__LINE__, level, tag, text);                                                     \
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
