#ifndef KX_TOOLS_LOGMASKCHOICE_H
#define KX_TOOLS_LOGMASKCHOICE_H

#include <string>

/** @return what is wrong with @p text as a log mask; empty if nothing is. */
std::string LogMaskError(const std::string& text);

/** The log mask of one run, from construction to destruction: no records unless asked for. */
class LogMaskChoice
{
public:
    /** @param mask  a valid log mask; if empty, that of the environment applies. */
    explicit LogMaskChoice(const std::string& mask);
    ~LogMaskChoice();
    LogMaskChoice(const LogMaskChoice&) = delete;
    LogMaskChoice& operator=(const LogMaskChoice&) = delete;

    /** @return whether the mask selects any records. */
    bool IsAny() const;

private:
    const unsigned int m_former;
};

#endif
