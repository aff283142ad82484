#include "cli/LogMaskChoice.h"

#include "KxLog.h"
#include "LogMask.h"

#include <cstdlib>

namespace
{

/** @return the mask that @p text describes; 0 without a valid one. */
unsigned int Parsed(const char* text)
{
    unsigned int mask = 0;
    return text != nullptr && ParseLogMask(text, mask) ? mask : 0;
}

} // namespace

std::string LogMaskError(const std::string& text)
{
    unsigned int mask = 0;
    return ParseLogMask(text.c_str(), mask)
               ? std::string()
               : "\"" + text + "\" is not a log mask; expected " + g_LogMaskHelp;
}

LogMaskChoice::LogMaskChoice(const std::string& mask) : m_former(g_LumLogParams.xmlConfigParserMask)
{
    g_LumLogParams.xmlConfigParserMask =
        Parsed(mask.empty() ? std::getenv("KX_LOG_MASK") : mask.c_str());
}

LogMaskChoice::~LogMaskChoice()
{
    g_LumLogParams.xmlConfigParserMask = m_former;
}

bool LogMaskChoice::IsAny() const
{
    return g_LumLogParams.xmlConfigParserMask != 0;
}
