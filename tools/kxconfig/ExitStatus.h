#ifndef KX_TOOLS_EXITSTATUS_H
#define KX_TOOLS_EXITSTATUS_H

/** What kxconfig's exit status tells; in each case but Done one line stands on standard error. */
enum class ExitStatus
{
    Done = 0,         ///< found; updated
    NothingFound = 1, ///< the key names nothing in the file that has a value
    BadUsage = 2,     ///< an option, an argument or a key that cannot be understood
    BadFile = 3,      ///< the file cannot be read, or is not well-formed XML
    NotSaved = 4      ///< the result could not be saved or printed; the file is as it was
};

#endif
