#include "file/Engine.h"

#include <libxml/parser.h>

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <new>

namespace
{

void IgnoreError(void*, EngineError)
{
}

/** Engines up to 2.13 report a text above their limit of 10 MB with the code of a lack of memory.
 */
bool IsLackOfMemory(EngineError error)
{
    const bool isLimit =
        error->message != nullptr && std::strstr(error->message, "huge text node") != nullptr;
    return error->code == XML_ERR_NO_MEMORY && !isLimit;
}

void PrintNothing(void*, const char*, ...)
{
}

#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wdeprecated-declarations" // newer engines always count lines

int CountLines(int whether)
{
    return xmlLineNumbersDefault(whether);
}

#pragma GCC diagnostic pop

} // namespace

EngineErrorReceiver::EngineErrorReceiver(xmlStructuredErrorFunc receive, void* context)
    : m_formerReceive(xmlStructuredError), m_formerContext(xmlStructuredErrorContext)
{
    xmlSetStructuredErrorFunc(context, receive);
}

EngineErrorReceiver::~EngineErrorReceiver()
{
    xmlSetStructuredErrorFunc(m_formerContext, m_formerReceive);
}

EngineSettings::EngineSettings()
    : m_errors(IgnoreError, nullptr),
      m_formerPrint(xmlGenericError),
      m_formerContext(xmlGenericErrorContext),
      m_formerLineNumbers(CountLines(1)),
      m_formerKeepBlanks(xmlKeepBlanksDefault(1))
{
    xmlSetGenericErrorFunc(nullptr, PrintNothing); // some XPath errors are reported there, too
}

EngineSettings::~EngineSettings()
{
    xmlKeepBlanksDefault(m_formerKeepBlanks);
    CountLines(m_formerLineNumbers);
    xmlSetGenericErrorFunc(m_formerContext, m_formerPrint);
    xmlResetLastError();
}

FirstEngineError::FirstEngineError() : m_receiver(Keep, this)
{
}

void FirstEngineError::RequireMemory() const
{
    if (m_isOutOfMemory)
    {
        throw std::bad_alloc();
    }
}

bool FirstEngineError::IsNone() const
{
    RequireMemory();
    return m_text.empty();
}

void FirstEngineError::Keep(void* self, EngineError error)
{
    FirstEngineError& errors = *static_cast<FirstEngineError*>(self);
    try
    {
        errors.m_isOutOfMemory = errors.m_isOutOfMemory || IsLackOfMemory(error);
        errors.KeepText(error);
    }
    catch (const std::bad_alloc&)
    {
        errors.m_isOutOfMemory = true; // no exception passes through the engine
    }
}

void FirstEngineError::KeepText(EngineError error)
{
    // A prefix that is not declared is reported, but does not end a parse: what does is wanted.
    if (!m_text.empty() || error->level < XML_ERR_ERROR || error->message == nullptr ||
        error->domain == XML_FROM_NAMESPACE)
    {
        return;
    }
    m_code = error->code;
    m_text = error->message;
    m_text.erase(std::min(m_text.find_first_of("\r\n"), m_text.size()));
    if (error->line > 0)
    {
        m_text = std::to_string(error->line) + ": " + m_text;
    }
}

std::string EngineVersion()
{
    const long number = std::strtol(xmlParserVersion, nullptr, 10); // 20914 is 2.9.14
    return std::to_string(number / 10000) + "." + std::to_string(number / 100 % 100) + "." +
           std::to_string(number % 100);
}
