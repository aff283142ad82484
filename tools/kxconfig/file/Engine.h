#ifndef KX_TOOLS_ENGINE_H
#define KX_TOOLS_ENGINE_H

#include <libxml/xmlerror.h>

#include <string>

// How kxconfig uses the engine, whose settings belong to the thread.

#if LIBXML_VERSION >= 21200
using EngineError = const xmlError*;
#else
using EngineError = xmlErrorPtr;
#endif

/** Receives the engine's errors from construction to destruction, then the former receiver does. */
class EngineErrorReceiver
{
public:
    EngineErrorReceiver(xmlStructuredErrorFunc receive, void* context);
    ~EngineErrorReceiver();
    EngineErrorReceiver(const EngineErrorReceiver&) = delete;
    EngineErrorReceiver& operator=(const EngineErrorReceiver&) = delete;

private:
    const xmlStructuredErrorFunc m_formerReceive;
    void* const m_formerContext;
};

/**
 * The engine as a run of kxconfig needs it: it counts lines and prints nothing. At the end all
 * settings that kxconfig or the library change are as they were.
 */
class EngineSettings
{
public:
    EngineSettings();
    ~EngineSettings();
    EngineSettings(const EngineSettings&) = delete;
    EngineSettings& operator=(const EngineSettings&) = delete;

private:
    const EngineErrorReceiver m_errors;
    const xmlGenericErrorFunc m_formerPrint;
    void* const m_formerContext;
    const int m_formerLineNumbers;
    const int m_formerKeepBlanks;
};

/** @return the version of the engine that runs, such as "2.9.14". */
std::string EngineVersion();

/** Keeps the first error that the engine reports during the object's life. */
class FirstEngineError
{
public:
    FirstEngineError();

    /** @throws std::bad_alloc if the engine ran out of memory, be it after the first error. */
    void RequireMemory() const;

    /** @return whether there was no error.
     * @throws std::bad_alloc if the engine ran out of memory: other errors can follow from that. */
    bool IsNone() const;

    /** @return the engine's number of the error; XML_ERR_OK if there is none. */
    int Code() const { return m_code; }

    /** @return "LINE: reason", or the reason alone if it is on no line; empty if there is none. */
    const std::string& Text() const { return m_text; }

private:
    static void Keep(void* self, EngineError error);
    void KeepText(EngineError error);

    std::string m_text;
    int m_code = XML_ERR_OK;
    bool m_isOutOfMemory = false;
    const EngineErrorReceiver m_receiver;
};

#endif
