#ifndef KX_PLATFORM_HOST_LOGMASK_H
#define KX_PLATFORM_HOST_LOGMASK_H

/** What a log mask looks like to a person: level names, and masks written as numbers or names. */

/** @return the name of @p level as a person writes it in a mask ("error"), or null if it has none.
 */
const char* LogLevelName(int level);

/**
 * Reads a mask that a person wrote: a decimal number, a number after "0x", or level names joined by
 * commas ("error,trace"), of which "all" and "none" stand for every bit and no bit.
 *
 * @param text  the mask; zero-terminated.
 * @param mask  receives the mask; unchanged on failure.
 * @return whether @p text is a mask of 32 bits.
 */
bool ParseLogMask(const char* text, unsigned int& mask);

/** What ParseLogMask() accepts, for messages to a person. */
extern const char* const g_LogMaskHelp;

#endif
