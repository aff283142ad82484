#ifndef KX_TOOLS_EXITSTATUS_H
#define KX_TOOLS_EXITSTATUS_H

/** The exit status of kxconfig; a line on standard error says more, unless a warning does. */
enum class ExitStatus
{
    Done = 0,
    NothingFound = 1,
    BadUsage = 2,
    BadFile = 3,
    NotSaved = 4,
    NotReported = 5
};

struct ExitStatusMeaning
{
    ExitStatus status;
    const char* meaning;
};

/** The one table of them: --help, the man page and the documentation show it. */
const ExitStatusMeaning kExitStatuses[] = {
    {ExitStatus::Done, "success: found, changed, or no warnings"},
    {ExitStatus::NothingFound,
     "nothing found; check: there are warnings; diff: there are differences"},
    {ExitStatus::BadUsage, "usage error, malformed key or expression"},
    {ExitStatus::BadFile, "the file cannot be read, or is not well-formed XML"},
    {ExitStatus::NotSaved,
     "saving or printing failed, or memory ran out; a file that could not be saved is unchanged"},
    {ExitStatus::NotReported,
     "saved, but the result could not be printed, or may not survive a power failure"},
};

#endif
