#include "support/EngineTranscript.h"

#include "support/Signature.h"

#include <libxml/entities.h>
#include <libxml/valid.h>
#include <libxml/xmlmemory.h>

#include <map>
#include <utility>

namespace
{

bool g_recording = false;
thread_local int g_depth = 0; // calls that have not returned; those within a call are the engine's
xmlChar* g_content = nullptr;
std::string g_folder;
std::vector<std::string> g_lines;
std::map<const void*, std::string> g_names;
std::string g_refused;

// The engine's allocator is a set of variables, which the transcript replaces.
xmlFreeFunc g_free = nullptr;
xmlMallocFunc g_malloc = nullptr;
xmlReallocFunc g_realloc = nullptr;
xmlStrdupFunc g_strdup = nullptr;

void RecordedFree(void* memory)
{
    kxtest::detail::Call call("xmlFree");
    if (call.Recorded())
    {
        call.Write(static_cast<const void*>(memory));
    }
    g_free(memory);
}

void* RecordedMalloc(std::size_t size)
{
    kxtest::detail::Call call("xmlMalloc");
    if (call.Recorded())
    {
        call.Write(static_cast<int>(size));
    }
    void* const memory = g_malloc(size);
    if (call.Recorded())
    {
        call.WriteResult(static_cast<const void*>(memory));
    }
    return memory;
}

// What is created is called by its own name until it is freed.
const std::map<std::string, std::string> kCreated = {{"xmlParseFile", "new doc"},
                                                     {"xmlNewDoc", "new doc"},
                                                     {"xmlNewNode", "new"},
                                                     {"xmlNewDocNode", "new"},
                                                     {"xmlGetProp", "text"},
                                                     {"xmlNodeGetContent", "text"},
                                                     {"xmlXPathNewContext", "context"},
                                                     {"xmlXPathEvalExpression", "result"},
                                                     {"xmlMalloc", "memory"}};

std::string NameOr(const void* pointer, const std::string& other)
{
    if (pointer == nullptr)
    {
        return "null";
    }
    const auto name = g_names.find(pointer);
    return name != g_names.end() ? name->second : other;
}

std::string Text(const xmlChar* text)
{
    return text != nullptr ? reinterpret_cast<const char*>(text) : "";
}

std::string ByKind(const xmlNode* node)
{
    switch (node->type)
    {
    case XML_ELEMENT_NODE:
        return "<" + Text(node->name) + ">";
    case XML_ATTRIBUTE_NODE:
        return "@" + Text(node->name);
    case XML_DOCUMENT_NODE:
        return "doc";
    case XML_DTD_NODE:
        return "dtd";
    case XML_ENTITY_REF_NODE:
        return "&" + Text(node->name) + ";";
    case XML_PI_NODE:
        return "<?" + Text(node->name) + "?>";
    default:
        return Text(node->name);
    }
}

} // namespace

namespace kxtest
{

EngineTranscript::EngineTranscript(std::string folder)
{
    g_folder = std::move(folder);
    g_lines.clear();
    g_names.clear();
    xmlMemGet(&g_free, &g_malloc, &g_realloc, &g_strdup);
    xmlMemSetup(RecordedFree, RecordedMalloc, g_realloc, g_strdup);
    g_recording = true;
}

EngineTranscript::~EngineTranscript()
{
    g_recording = false;
    xmlMemSetup(g_free, g_malloc, g_realloc, g_strdup);
    g_refused.clear();
}

std::vector<std::string> EngineTranscript::Take()
{
    return std::exchange(g_lines, {});
}

void RefuseNext(const std::string& function)
{
    g_refused = function;
}

xmlChar* TakeContent()
{
    return std::exchange(g_content, nullptr);
}

namespace detail
{

std::string Render(const char* text)
{
    const std::string whole(text);
    const bool inFolder = !g_folder.empty() && whole.compare(0, g_folder.size(), g_folder) == 0;
    return '"' + (inFolder ? whole.substr(g_folder.size()) : whole) + '"';
}

std::string Render(const xmlChar* text)
{
    return text != nullptr ? '"' + Text(text) + '"' : "null";
}

std::string Render(int number)
{
    return std::to_string(number);
}

std::string Render(const xmlNode* node)
{
    return NameOr(node, node != nullptr ? ByKind(node) : "");
}

std::string Render(const xmlEntity* entity)
{
    return Render(reinterpret_cast<const xmlNode*>(entity));
}

std::string Render(const xmlDoc* document)
{
    return Render(reinterpret_cast<const xmlNode*>(document));
}

std::string Render(const xmlAttr* attribute)
{
    return Render(reinterpret_cast<const xmlNode*>(attribute));
}

std::string Render(const xmlNs* space)
{
    return NameOr(space, space != nullptr ? "xmlns:" + Text(space->prefix) : "");
}

std::string Render(const xmlXPathContext* context)
{
    const bool hasNode = context != nullptr && context->node != nullptr;
    return NameOr(context, "context") + (hasNode ? " at " + Render(context->node) : "");
}

std::string Render(const xmlXPathObject* result)
{
    return NameOr(result, "result");
}

std::string Render(const void* memory)
{
    return NameOr(memory, "memory");
}

std::string Render(const xmlHashTable* ids)
{
    return NameOr(ids, "ids");
}

std::string Render(xmlHashScanner)
{
    return "callback";
}

std::string Render(xmlHashDeallocator)
{
    return "callback";
}

Call::Call(const char* function) : m_function(g_recording ? function : "")
{
    ++g_depth;
}

Call::~Call()
{
    --g_depth;
}

bool Call::Refused() const
{
    const bool refused = Recorded() && g_refused == m_function;
    if (refused)
    {
        g_refused.clear();
    }
    return refused;
}

bool Call::Recorded() const
{
    return g_recording && g_depth == 1;
}

void Call::Begin(const std::string& arguments)
{
    g_lines.push_back(m_function + "(" + arguments + ")");
}

void Call::NameResult(const void* result)
{
    const auto name = kCreated.find(m_function);
    if (name != kCreated.end() && result != nullptr)
    {
        g_names[result] = name->second;
    }
}

bool Call::IsText() const
{
    return m_function == "xmlGetProp" || m_function == "xmlNodeGetContent";
}

void Call::End(const std::string& result)
{
    g_lines.back() += " = " + result;
}

} // namespace detail

} // namespace kxtest

using kxtest::FirstOf;
using kxtest::Forward;

#if LIBXML_VERSION >= 21300
using SetContentResult = int;
#else
using SetContentResult = void;
#endif

// The functions that Engine.cpp does not define.

extern "C" xmlNodePtr xmlDocGetRootElement(FirstOf<decltype(xmlDocGetRootElement)> document)
{
    return Forward<&xmlDocGetRootElement>("xmlDocGetRootElement", document);
}

extern "C" xmlNodePtr xmlDocSetRootElement(xmlDocPtr document, xmlNodePtr root)
{
    return Forward<&xmlDocSetRootElement>("xmlDocSetRootElement", document, root);
}

extern "C" void xmlFreeNode(xmlNodePtr node)
{
    Forward<&xmlFreeNode>("xmlFreeNode", node);
}

extern "C" xmlDocPtr xmlNewDoc(const xmlChar* version)
{
    return Forward<&xmlNewDoc>("xmlNewDoc", version);
}

extern "C" xmlNodePtr xmlNewDocNode(xmlDocPtr document, xmlNsPtr space, const xmlChar* name,
                                    const xmlChar* content)
{
    return Forward<&xmlNewDocNode>("xmlNewDocNode", document, space, name, content);
}

extern "C" xmlNodePtr xmlNewNode(xmlNsPtr space, const xmlChar* name)
{
    return Forward<&xmlNewNode>("xmlNewNode", space, name);
}

extern "C" void xmlUnlinkNode(xmlNodePtr node)
{
    Forward<&xmlUnlinkNode>("xmlUnlinkNode", node);
}

extern "C" xmlAttrPtr xmlNewNsProp(xmlNodePtr node, xmlNsPtr space, const xmlChar* name,
                                   const xmlChar* value)
{
    return Forward<&xmlNewNsProp>("xmlNewNsProp", node, space, name, value);
}

extern "C" xmlChar* xmlNodeGetContent(FirstOf<decltype(xmlNodeGetContent)> node)
{
    xmlChar* const content = Forward<&xmlNodeGetContent>("xmlNodeGetContent", node);
    if (g_depth == 0)
    {
        g_content = content;
    }
    return content;
}

extern "C" SetContentResult xmlNodeSetContent(xmlNodePtr node, const xmlChar* content)
{
    return Forward<&xmlNodeSetContent>("xmlNodeSetContent", node, content);
}

extern "C" void xmlFreeIDTable(xmlIDTablePtr table)
{
    Forward<&xmlFreeIDTable>("xmlFreeIDTable", table);
}

extern "C" int xmlRemoveID(xmlDocPtr document, xmlAttrPtr attribute)
{
    return Forward<&xmlRemoveID>("xmlRemoveID", document, attribute);
}

extern "C" int xmlRemoveProp(xmlAttrPtr attribute)
{
    return Forward<&xmlRemoveProp>("xmlRemoveProp", attribute);
}

extern "C" int xmlHashRemoveEntry(xmlHashTablePtr table, const xmlChar* name,
                                  xmlHashDeallocator release)
{
    return Forward<&xmlHashRemoveEntry>("xmlHashRemoveEntry", table, name, release);
}

extern "C" void xmlHashScan(xmlHashTablePtr table, xmlHashScanner visit, void* data)
{
    Forward<&xmlHashScan>("xmlHashScan", table, visit, data);
}

extern "C" void xmlXPathFreeObject(xmlXPathObjectPtr result)
{
    Forward<&xmlXPathFreeObject>("xmlXPathFreeObject", result);
}

// The library calls these with old engines only.

extern "C" xmlNodePtr xmlAddChild(xmlNodePtr parent, xmlNodePtr child)
{
    return Forward<&xmlAddChild>("xmlAddChild", parent, child);
}

extern "C" xmlNodePtr xmlNewDocText(FirstOf<decltype(xmlNewDocText)> document,
                                    const xmlChar* content)
{
    return Forward<&xmlNewDocText>("xmlNewDocText", document, content);
}

extern "C" xmlEntityPtr xmlGetDocEntity(FirstOf<decltype(xmlGetDocEntity)> document,
                                        const xmlChar* name)
{
    return Forward<&xmlGetDocEntity>("xmlGetDocEntity", document, name);
}

extern "C" xmlNodePtr xmlStringGetNodeList(FirstOf<decltype(xmlStringGetNodeList)> document,
                                           const xmlChar* text)
{
    return Forward<&xmlStringGetNodeList>("xmlStringGetNodeList", document, text);
}

extern "C" xmlChar* xmlStrndup(const xmlChar* text, int length)
{
    return Forward<&xmlStrndup>("xmlStrndup", text, length);
}
