#ifndef KX_PLATFORM_HOST_LOGMASK_H
#define KX_PLATFORM_HOST_LOGMASK_H

/** Log masks as text: names of levels, and masks written as numbers or names. */

/** @return the name of @p level ("error"), or null if it has none. */
const char* LogLevelName(int level);

/**
 * Parses a mask: a decimal number, a hexadecimal number after "0x", or names of levels joined by
 * commas ("error,trace"). The names "all" and "none" stand for every bit and no bit.
 *
 * @param text  the mask; zero-terminated.
 * @param mask  receives the mask; unchanged on failure.
 * @return whether @p text is a mask of 32 bits.
 */
bool ParseLogMask(const char* text, unsigned int& mask);

/** What ParseLogMask() accepts, for error messages. */
extern const char* const g_LogMaskHelp;

#endif
