#ifndef KX_LOG_H
#define KX_LOG_H

/**
 * @file KxLog.h
 * The platform's logging library, as far as client libraries see it: one log call and one
 * configuration object that holds a log mask word for each client library.
 *
 * A library tests its own mask word first and calls KxLog() only for levels whose bit is set:
 * bit (1 << level) of the word enables the level.
 */

#pragma GCC visibility push(default)
extern "C"
{

    /**
     * The platform's log configuration, one object per process, shared by all libraries.
     *
     * Only the member of the XML configuration library is spelled out. Its byte offset, 0x2F14, is
     * part of the platform's published layout; the bytes around it belong to other libraries.
     */
    struct LumLogParams
    {
        /** Belongs to others. */
        unsigned char reservedHead[0x2F14];
        /** Log mask word of libKX_XMLConfigParser: bit (1 << level) enables a level. */
        unsigned int xmlConfigParserMask;
        /** Belongs to others. */
        unsigned char reservedTail[0xE8];
    };

    /** The process's log configuration. Libraries read it; only the platform or the program writes
     * it. */
    extern struct LumLogParams g_LumLogParams;

    /**
     * Emits one log record.
     *
     * @param line    source line of the call.
     * @param level   level of the record, 0 to 31.
     * @param tag     bare name of the reporting operation, such as "ParseFile"; zero-terminated.
     * @param format  printf-style format of the record's text; zero-terminated.
     * @return a platform-defined number that callers ignore.
     *
     * Never fails the caller, whatever becomes of the record.
     */
    int KxLog(int line, int level, const char* tag, const char* format, ...)
        __attribute__((format(printf, 4, 5)));
}
#pragma GCC visibility pop

#endif
