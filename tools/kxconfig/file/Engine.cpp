#include "file/Engine.h"

#include <libxml/parser.h>

#include <algorithm>

namespace
{

void IgnoreError(void*, EngineError)
{
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

void FirstEngineError::Keep(void* self, EngineError error)
{
    std::string& text = static_cast<FirstEngineError*>(self)->m_text;
    // A prefix that is not declared is reported, but does not end a parse: what does is wanted.
    if (!text.empty() || error->level < XML_ERR_ERROR || error->message == nullptr ||
        error->domain == XML_FROM_NAMESPACE)
    {
        return;
    }
    text = error->message;
    text.erase(std::min(text.find_first_of("\r\n"), text.size()));
    if (error->line > 0)
    {
        text = std::to_string(error->line) + ": " + text;
    }
}
