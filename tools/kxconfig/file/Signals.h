#ifndef KX_TOOLS_SIGNALS_H
#define KX_TOOLS_SIGNALS_H

#include <string>

#include <signal.h>

// The signals that end a process on request or at a limit: INT, TERM, HUP, QUIT, XCPU and XFSZ.

/** Delays these signals from construction to destruction. */
class SignalDelay
{
public:
    SignalDelay();
    ~SignalDelay();
    SignalDelay(const SignalDelay&) = delete;
    SignalDelay& operator=(const SignalDelay&) = delete;

private:
    sigset_t m_before;
};

/**
 * Removes a file when one of these signals arrives, and then lets the signal do what it did before.
 * From construction to destruction; there is one such object at a time. An ignored signal stays
 * ignored.
 */
class RemovalOnSignal
{
public:
    /** @param folder  an open one that outlives this object. */
    RemovalOnSignal(int folder, const std::string& name);
    ~RemovalOnSignal();
    RemovalOnSignal(const RemovalOnSignal&) = delete;
    RemovalOnSignal& operator=(const RemovalOnSignal&) = delete;
};

#endif
