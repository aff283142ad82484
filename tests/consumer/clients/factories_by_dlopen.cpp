// A client that is linked against nothing: it loads the library and asks for the factories by their
// plain names. All that follows goes through the interfaces' tables.

#include "CXMLReader.h"
#include "CXMLWriter.h"

#include <dlfcn.h>
#include <stdio.h>
#include <string.h>

#include <string>

template <class Factory>
static Factory Find(void* library, const char* name)
{
    void* const found = dlsym(library, name);
    Factory factory = 0;
    memcpy(&factory, &found, sizeof factory);
    return factory;
}

static bool ReaderWorks(void* library, const char* file)
{
    typedef IConfigReader* (*Factory)(const char*);
    const Factory make = Find<Factory>(library, "GetCXMLReaderObject");
    IConfigReader* const reader = make != 0 ? make(file) : 0;
    std::string value;
    const bool good =
        reader != 0 && reader->GetValue("gateway.name", value) == 0 && value == "line-3-gateway";
    delete reader;
    return good;
}

static bool WritersWork(void* library, const char* file)
{
    typedef IConfigWriter* (*Factory)(const char*);
    typedef IConfigWriter* (*FactoryNoParam)();
    const Factory make = Find<Factory>(library, "GetCXMLWriterObject");
    const FactoryNoParam makeEmpty = Find<FactoryNoParam>(library, "GetCXMLWriterObjectNoParam");
    IConfigWriter* const writer = make != 0 ? make(file) : 0;
    IConfigWriter* const empty = makeEmpty != 0 ? makeEmpty() : 0;
    const bool good = writer != 0 && writer->SetValue("gateway.name", "changed") == 0 &&
                      empty != 0 && empty->SetValue("gateway.name", "changed") == 7;
    delete writer;
    delete empty;
    return good;
}

int main(int argc, char** argv)
{
    if (argc < 3)
    {
        return 2;
    }
    void* const library = dlopen(argv[2], RTLD_NOW | RTLD_LOCAL);
    if (library == 0)
    {
        fprintf(stderr, "%s\n", dlerror());
        return 1;
    }
    const bool good = ReaderWorks(library, argv[1]) && WritersWork(library, argv[1]);
    puts(good ? "good" : "wrong values");
    return good ? 0 : 1;
}
