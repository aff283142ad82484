#include "support/Engine.h"

#include "support/EngineTranscript.h"
#include "support/Log.h"
#include "support/Memory.h"
#include "support/Signature.h"

#include <libxml/parser.h>
#include <libxml/xmlerror.h>

#include <algorithm>
#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <optional>

namespace
{

bool g_noting = false;
std::vector<const void*> g_freed;
std::vector<std::string> g_parsed;
std::vector<std::string> g_properties;
std::vector<std::string> g_formatSaves;
std::vector<int> g_blanksDefaults;
std::size_t g_cleanups = 0;
long g_contexts = 0;
bool g_makingContext = false; // newer engines free by the same function what they could not make
std::string g_engineErrors;
bool g_showing = false;
bool g_answerSaves = false;
int g_saveResult = 0;

std::optional<int> g_formatSaveAnswer;
std::optional<xmlXPathObjectPtr> g_xpathAnswer;
std::optional<xmlDocPtr> g_parseAnswer;
xmlXPathObjectPtr g_lastXPath = nullptr;
bool g_refuseContext = false;
bool g_refuseSibling = false;
const char* g_version = nullptr;
unsigned long g_stepLimit = 0;
unsigned long g_loweredLimit = 0;

void Show(const char* call)
{
    if (g_showing)
    {
        kxtest::LogRecorder::Note(kxtest::Engine(call));
    }
}

void CollectError(void*, const char* format, ...)
{
    if (kxtest::EngineMemory::Failed())
    {
        return; // short of memory, the engine complains with text that it has freed
    }
    char text[1024];
    va_list arguments;
    va_start(arguments, format);
    std::vsnprintf(text, sizeof text, format, arguments);
    va_end(arguments);
    g_engineErrors += text;
}

#if LIBXML_VERSION >= 20910
void NoteStepLimit(xmlXPathContext& context)
{
    // The records of an older engine end before the limit.
    g_stepLimit = kxtest::EngineVersion() >= 20910 ? context.opLimit : 0;
    if (g_stepLimit != 0 && g_loweredLimit != 0)
    {
        context.opLimit = g_loweredLimit;
    }
}
#else
void NoteStepLimit(const xmlXPathContext&)
{
}
#endif

} // namespace

using kxtest::Answer;
using kxtest::FirstOf;
using kxtest::Forward;

extern "C" void xmlFreeDoc(xmlDocPtr document)
{
    if (g_noting)
    {
        g_freed.push_back(document);
        Show("xmlFreeDoc");
    }
    Forward<&xmlFreeDoc>("xmlFreeDoc", document);
}

extern "C" xmlDocPtr xmlParseFile(const char* path)
{
    if (g_noting)
    {
        g_parsed.push_back(path);
        Show("xmlParseFile");
    }
    if (g_parseAnswer)
    {
        const xmlDocPtr answer = *g_parseAnswer;
        g_parseAnswer.reset();
        return Answer("xmlParseFile", answer, path);
    }
    return Forward<&xmlParseFile>("xmlParseFile", path);
}

extern "C" xmlChar* xmlGetProp(FirstOf<decltype(xmlGetProp)> node, const xmlChar* name)
{
    if (g_noting)
    {
        g_properties.push_back(reinterpret_cast<const char*>(name));
    }
    return Forward<&xmlGetProp>("xmlGetProp", node, name);
}

extern "C" int xmlSaveFileEnc(const char* path, xmlDocPtr document, const char* encoding)
{
    Show("xmlSaveFileEnc");
    return g_answerSaves ? Answer("xmlSaveFileEnc", g_saveResult, path, document, encoding)
                         : Forward<&xmlSaveFileEnc>("xmlSaveFileEnc", path, document, encoding);
}

extern "C" int xmlSaveFormatFileEnc(const char* path, xmlDocPtr document, const char* encoding,
                                    int format)
{
    if (g_noting)
    {
        g_formatSaves.push_back(path + std::string(" ") + encoding + " " + std::to_string(format));
    }
    if (g_formatSaveAnswer)
    {
        const int answer = *g_formatSaveAnswer;
        g_formatSaveAnswer.reset();
        return Answer("xmlSaveFormatFileEnc", answer, path, document, encoding, format);
    }
    return Forward<&xmlSaveFormatFileEnc>("xmlSaveFormatFileEnc", path, document, encoding, format);
}

extern "C" int xmlKeepBlanksDefault(int value)
{
    if (g_noting)
    {
        g_blanksDefaults.push_back(value);
        Show("xmlKeepBlanksDefault");
    }
    return Forward<&xmlKeepBlanksDefault>("xmlKeepBlanksDefault", value);
}

extern "C" void xmlCleanupParser()
{
    g_cleanups += g_noting;
    Show("xmlCleanupParser");
    Forward<&xmlCleanupParser>("xmlCleanupParser");
}

extern "C" xmlXPathContextPtr xmlXPathNewContext(xmlDocPtr document)
{
    g_makingContext = true;
    const xmlXPathContextPtr context =
        g_refuseContext ? Answer("xmlXPathNewContext", xmlXPathContextPtr(), document)
                        : Forward<&xmlXPathNewContext>("xmlXPathNewContext", document);
    g_refuseContext = false;
    g_makingContext = false;
    g_contexts += context != nullptr;
    return context;
}

extern "C" void xmlXPathFreeContext(xmlXPathContextPtr context)
{
    g_contexts -= context != nullptr && !g_makingContext;
    Forward<&xmlXPathFreeContext>("xmlXPathFreeContext", context);
}

extern "C" xmlXPathObjectPtr xmlXPathEvalExpression(const xmlChar* text, xmlXPathContextPtr context)
{
    if (g_xpathAnswer)
    {
        g_lastXPath = *g_xpathAnswer;
        g_xpathAnswer.reset();
        return Answer("xmlXPathEvalExpression", g_lastXPath, text, context);
    }
    NoteStepLimit(*context);
    g_lastXPath = Forward<&xmlXPathEvalExpression>("xmlXPathEvalExpression", text, context);
    return g_lastXPath;
}

extern "C" xmlNodePtr xmlAddSibling(xmlNodePtr node, xmlNodePtr sibling)
{
    if (g_refuseSibling)
    {
        g_refuseSibling = false;
        return Answer("xmlAddSibling", xmlNodePtr(), node, sibling);
    }
    return Forward<&xmlAddSibling>("xmlAddSibling", node, sibling);
}

#if LIBXML_VERSION < 21400
using VersionAddress = decltype(__xmlParserVersion());

extern "C" VersionAddress __xmlParserVersion()
{
    static const auto engine =
        reinterpret_cast<VersionAddress (*)()>(dlsym(RTLD_NEXT, "__xmlParserVersion"));
    return g_version != nullptr ? &g_version : engine();
}
#endif

namespace kxtest
{

EngineCalls::EngineCalls()
{
    g_formatSaves.clear();
    g_blanksDefaults.clear();
    g_cleanups = 0;
    g_contexts = 0;
    g_freed.clear();
    g_parsed.clear();
    g_properties.clear();
    g_noting = true;
}

EngineCalls::~EngineCalls()
{
    g_noting = false;
    g_answerSaves = false;
    g_showing = false;
}

void EngineCalls::ShowAmongRecords()
{
    g_showing = true;
}

std::size_t EngineCalls::Freed(const void* document) const
{
    return static_cast<std::size_t>(std::count(g_freed.begin(), g_freed.end(), document));
}

std::size_t EngineCalls::Frees() const
{
    return g_freed.size();
}
const std::vector<std::string>& EngineCalls::Parsed() const
{
    return g_parsed;
}
const std::vector<std::string>& EngineCalls::PropertiesRead() const
{
    return g_properties;
}
const std::vector<std::string>& EngineCalls::FormatSaves() const
{
    return g_formatSaves;
}
const std::vector<int>& EngineCalls::BlanksDefaults() const
{
    return g_blanksDefaults;
}
std::size_t EngineCalls::Cleanups() const
{
    return g_cleanups;
}
long EngineCalls::LiveContexts() const
{
    return g_contexts;
}

int EngineVersion()
{
    // The variable itself: headers up to 2.11 define a macro of this name.
    static const void* const variable = dlsym(RTLD_DEFAULT, "xmlParserVersion");
    return std::atoi(*static_cast<const char* const*>(variable));
}

void AnswerVersion(const char* version)
{
    g_version = version;
}

unsigned long LastStepLimit()
{
    return g_stepLimit;
}
void LowerStepLimits(unsigned long steps)
{
    g_loweredLimit = steps;
}
void AnswerNextFormatSave(int result)
{
    g_formatSaveAnswer = result;
}
void RefuseNextXPathContext()
{
    g_refuseContext = true;
}
void AnswerNextXPath(xmlXPathObjectPtr result)
{
    g_xpathAnswer = result;
}
void AnswerNextParse(xmlDocPtr document)
{
    g_parseAnswer = document;
}
xmlXPathObjectPtr LastXPath()
{
    return g_lastXPath;
}
void RefuseNextSibling()
{
    g_refuseSibling = true;
}

void EngineCalls::AnswerSavesWith(int result)
{
    g_answerSaves = true;
    g_saveResult = result;
}

xmlDocPtr ParseText(const std::string& xml)
{
    return xmlReadMemory(xml.data(), static_cast<int>(xml.size()), "memory.xml", nullptr,
                         XML_PARSE_HUGE | XML_PARSE_NOERROR | XML_PARSE_NOWARNING);
}

std::string Serialized(xmlDocPtr document)
{
    xmlChar* text = nullptr;
    int size = 0;
    xmlDocDumpMemoryEnc(document, &text, &size, "UTF-8");
    std::string result(reinterpret_cast<const char*>(text), static_cast<std::size_t>(size));
    xmlFree(text);
    return result;
}

std::string TakeEngineErrors()
{
    std::string taken;
    taken.swap(g_engineErrors);
    return taken;
}

void CollectEngineErrors()
{
    xmlSetGenericErrorFunc(nullptr, CollectError);
}

} // namespace kxtest
