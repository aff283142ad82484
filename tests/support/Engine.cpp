#include "support/Engine.h"

#include "support/Log.h"
#include "support/Memory.h"

#include <libxml/parser.h>
#include <libxml/xmlerror.h>

#include <dlfcn.h>

#include <algorithm>
#include <cstdarg>
#include <cstdio>

namespace
{

bool g_noting = false;
std::vector<const void*> g_freed;
std::vector<std::string> g_parsed;
std::vector<std::string> g_properties;
std::string g_engineErrors;
bool g_showing = false;
bool g_answerSaves = false;
int g_saveResult = 0;

template <class Function>
Function* Next(Function*, const char* name)
{
    return reinterpret_cast<Function*>(dlsym(RTLD_NEXT, name));
}

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

} // namespace

extern "C" void xmlFreeDoc(xmlDocPtr document)
{
    static const auto engine = Next(&xmlFreeDoc, "xmlFreeDoc");
    if (g_noting)
    {
        g_freed.push_back(document);
        Show("xmlFreeDoc");
    }
    engine(document);
}

extern "C" xmlDocPtr xmlParseFile(const char* path)
{
    static const auto engine = Next(&xmlParseFile, "xmlParseFile");
    if (g_noting)
    {
        g_parsed.push_back(path);
        Show("xmlParseFile");
    }
    return engine(path);
}

extern "C" xmlChar* xmlGetProp(const xmlNode* node, const xmlChar* name)
{
    static const auto engine = Next(&xmlGetProp, "xmlGetProp");
    if (g_noting)
    {
        g_properties.push_back(reinterpret_cast<const char*>(name));
    }
    return engine(node, name);
}

extern "C" int xmlSaveFileEnc(const char* path, xmlDocPtr document, const char* encoding)
{
    static const auto engine = Next(&xmlSaveFileEnc, "xmlSaveFileEnc");
    Show("xmlSaveFileEnc");
    return g_answerSaves ? g_saveResult : engine(path, document, encoding);
}

namespace kxtest
{

EngineCalls::EngineCalls()
{
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
