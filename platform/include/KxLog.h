#ifndef KX_LOG_H
#define KX_LOG_H

/// @file KxLog.h
/// The platform's log call, and its configuration object with one mask word for each library.
///
/// A library calls KxLog() for a level only if bit (1 << level) of its mask word is set.

#pragma GCC visibility push(default)
extern "C"
{

    /// The platform's log configuration, shared by all libraries of a process. The byte offset of
    /// the member, 0x2F14, belongs to the platform's published layout; the rest belongs to others.
    struct LumLogParams
    {
        unsigned char reservedHead[0x2F14]; ///< belongs to other libraries
        unsigned int xmlConfigParserMask;   ///< mask word of libKX_XMLConfigParser
        unsigned char reservedTail[0xE8];   ///< belongs to other libraries
    };

    /// The log configuration of the process. Written by the platform or the program only; libraries
    /// read it.
    extern struct LumLogParams g_LumLogParams;

    /// Writes one log record. line is the source line of the call, level is 0 to 31, tag is the
    /// bare name of the reporting operation, format is a printf format. The result has no meaning.
    /// A record that cannot be written never fails the caller.
    int KxLog(int line, int level, const char* tag, const char* format, ...)
        __attribute__((format(printf, 4, 5)));
}
#pragma GCC visibility pop

#endif
