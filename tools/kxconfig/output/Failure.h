#ifndef KX_TOOLS_FAILURE_H
#define KX_TOOLS_FAILURE_H

#include "output/ExitStatus.h"

#include <exception>
#include <string>
#include <utility>

/** Ends a command: the status that kxconfig exits with, and why, in one line. */
class Failure : public std::exception
{
public:
    Failure(ExitStatus status, std::string message)
        : m_status(status), m_message(std::move(message))
    {
    }

    ExitStatus Status() const { return m_status; }
    const std::string& Message() const { return m_message; }
    const char* what() const noexcept override { return m_message.c_str(); }

private:
    ExitStatus m_status;
    std::string m_message;
};

#endif
