#ifndef KX_DIAG_LOG_H
#define KX_DIAG_LOG_H

#include "KxLog.h"

/**
 * @file Log.h
 * The log gate: every record of the library passes through one of the macros below.
 *
 * A gate calls KxLog() only if the level's bit is set in the library's log mask word. Otherwise it
 * costs a load, a test and a branch that is not taken, and evaluates no argument. Each gate reads
 * the word again, because the platform can change it at any time.
 *
 * The tag of a record is the bare name of the operation: that of the function that contains the
 * gate. Functions that work on behalf of an operation use KX_LOG, KX_LOG_OF and KX_TRACE with its
 * name.
 *
 * An operation that traces begins with KX_ENTER() and ends with KX_LEAVE() on each return path. No
 * destructor logs the "-": it is missing after an exception, and it precedes the destruction of
 * the operation's locals.
 *
 * Text from outside (a key, a path, a value) is always an argument, never the format.
 */

namespace kx
{

/** Levels of the library's records. */
enum LogLevel
{
    LogLevelWarning = 8, ///< a feature that is not available on this platform
    LogLevelError = 9,   ///< a missing document, root or node; a failed parse, save or creation
    LogLevelTrace = 11,  ///< "+" on entry and "-" on return, and the records in place of them
    LogLevelValue = 29,  ///< keys to look up and values found
    LogLevelXPath = 31   ///< XPath and node-set diagnostics of the document queries
};

/** Byte offset of the library's mask word in g_LumLogParams, from the platform's published layout.
 */
const unsigned int kLogMaskOffset = 0x2F14;

/**
 * The address of the library's log mask word, which does not depend on how the platform declares
 * the object.
 *
 * For ARM, where the offset is too large for one instruction: the loader computes the address once,
 * and a gate is a load, a test and a branch there too.
 */
extern const unsigned int* const kLogMaskWord __attribute__((visibility("hidden")));

// Always inline: a compiler that optimizes for size would call the gate.

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

/** @return whether records of @p level are enabled; the mask is unsigned because of level 31. */
__attribute__((always_inline)) inline bool LogEnabled(LogLevel level)
{
    return __builtin_expect((LogMask() & (1u << level)) != 0, false);
}

/** @return whether records of either level are enabled, in a single test. */
__attribute__((always_inline)) inline bool LogEnabled(LogLevel one, LogLevel other)
{
    return __builtin_expect((LogMask() & ((1u << one) | (1u << other))) != 0, false);
}

/**
 * The records of nearly every operation. Out of line, because they are rarely enabled: a gate then
 * passes two arguments instead of four.
 */
__attribute__((noinline)) inline void LogEntry(int line, const char* tag)
{
    KxLog(line, LogLevelTrace, tag, "+");
}

__attribute__((noinline)) inline void LogReturn(int line, const char* tag)
{
    KxLog(line, LogLevelTrace, tag, "-");
}

/** Both records of an operation without other records in between; the first one is enabled. */
__attribute__((noinline)) inline void LogEntryAndReturn(int line, const char* tag)
{
    KxLog(line, LogLevelTrace, tag, "+");
    if (LogEnabled(LogLevelTrace))
    {
        KxLog(line, LogLevelTrace, tag, "-");
    }
}

} // namespace kx

/** One record. @p text and @p format are literals; @p tag is the operation's name. */
#define KX_LOG(level, tag, text)                                                                   \
    do                                                                                             \
    {                                                                                              \
        if (kx::LogEnabled(level))                                                                 \
        {                                                                                          \
            KxLog(__LINE__, level, tag, text);                                                     \
        }                                                                                          \
    } while (false)

/** One record, with the single argument of its format. */
#define KX_LOG_OF(level, tag, format, argument)                                                    \
    do                                                                                             \
    {                                                                                              \
        if (kx::LogEnabled(level))                                                                 \
        {                                                                                          \
            KxLog(__LINE__, level, tag, format, argument);                                         \
        }                                                                                          \
    } while (false)

/** Precedes a block of gates of two levels: with both bits clear the block costs one test. */
#define KX_LOG_EITHER(one, other) if (kx::LogEnabled(one, other))

/** "+": the operation begins. */
#define KX_ENTER() KX_TRACE(LogEntry, __FUNCTION__)

/** "-": the operation returns. */
#define KX_LEAVE() KX_TRACE(LogReturn, __FUNCTION__)

/** "+" and "-" of an operation without visible work in between: one test for both. */
#define KX_ENTER_AND_LEAVE() KX_TRACE(LogEntryAndReturn, __FUNCTION__)

/** "+" by LogEntry, "-" by LogReturn or both by LogEntryAndReturn. */
#define KX_TRACE(function, tag)                                                                    \
    do                                                                                             \
    {                                                                                              \
        if (kx::LogEnabled(kx::LogLevelTrace))                                                     \
        {                                                                                          \
            kx::function(__LINE__, tag);                                                           \
        }                                                                                          \
    } while (false)

/** The operation cannot do its work. */
#define KX_ERROR(text) KX_LOG(kx::LogLevelError, __FUNCTION__, text)
#define KX_ERROR_OF(format, argument) KX_LOG_OF(kx::LogLevelError, __FUNCTION__, format, argument)

/** A key that was requested, or a value that was found. */
#define KX_VALUE(format, argument) KX_LOG_OF(kx::LogLevelValue, __FUNCTION__, format, argument)

#endif
