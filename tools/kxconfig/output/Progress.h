#ifndef KX_TOOLS_PROGRESS_H
#define KX_TOOLS_PROGRESS_H

#include <signal.h>

/**
 * Shows on standard error that a run takes longer than a second, and for how many seconds. The
 * line is cleared before anything else is printed.
 *
 * There is one at a time. It uses SIGALRM, and leaves the signal alone if the caller handles it.
 */
class Progress
{
public:
    /** Only where standard error is a terminal, and shows nothing else. */
    Progress();
    ~Progress();
    Progress(const Progress&) = delete;
    Progress& operator=(const Progress&) = delete;

    /** Clears the line for good, if one is shown. */
    static void End();

private:
    struct sigaction m_former;
    bool m_handles = false;
};

#endif
