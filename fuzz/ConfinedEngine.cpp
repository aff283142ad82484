#include "ConfinedEngine.h"

#include <libxml/parser.h>
#include <libxml/xmlerror.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>

namespace
{

xmlExternalEntityLoader g_loader;

void Ignore(void*, const char*, ...)
{
}

xmlParserInputPtr LoadMadeFilesOnly(const char* url, const char* id, xmlParserCtxtPtr context)
{
    if (url == nullptr || std::strncmp(url, "/proc/self/fd/", 14) != 0)
    {
        std::fprintf(stderr, "the engine was made to read %s\n", url == nullptr ? "null" : url);
        std::abort();
    }
    return g_loader(url, id, context);
}

} // namespace

namespace kxfuzz
{

void ConfineEngine()
{
    xmlSetGenericErrorFunc(nullptr, Ignore);
    g_loader = xmlGetExternalEntityLoader();
    xmlSetExternalEntityLoader(LoadMadeFilesOnly);
}

} // namespace kxfuzz
