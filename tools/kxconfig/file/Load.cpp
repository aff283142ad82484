#include "file/Load.h"

#include "file/Engine.h"
#include "file/Input.h"
#include "output/Failure.h"
#include "output/Quoting.h"

#include <libxml/tree.h>

#include <new>

namespace
{

Failure NotRead(const std::string& path, const std::error_code& error)
{
    return {ExitStatus::BadFile,
            "cannot read " + (path.empty() ? Quoted(path) : path) + ": " + error.message()};
}

/** Throws what kept the engine from loading the file. */
[[noreturn]] void ThrowNotParsed(const std::string& path, const FirstEngineError& error)
{
    if (error.IsOutOfMemory())
    {
        throw std::bad_alloc();
    }
    throw Failure(ExitStatus::BadFile,
                  path + ":" + (error.IsNone() ? " not parsed" : error.Text()));
}

Input Open(const std::string& path, std::istream* standardInput)
{
    try
    {
        return standardInput != nullptr && path == "-" ? Input(*standardInput) : Input(path);
    }
    catch (const std::system_error& error)
    {
        throw NotRead(path, error.code());
    }
}

} // namespace

std::unique_ptr<CXMLReader> LoadFile(const std::string& path, std::istream* standardInput)
{
    const Input input = Open(path, standardInput);
    const FirstEngineError error;
    std::unique_ptr<CXMLReader> reader(GetCXMLReaderObject(input.Path().c_str()));
    if (reader == nullptr)
    {
        throw std::bad_alloc();
    }
    if (reader->GetDataPtr() == nullptr)
    {
        ThrowNotParsed(path, error);
    }
    return reader;
}

void LoadDocument(const std::string& path, CXmlParser& document, std::istream* standardInput)
{
    const Input input = Open(path, standardInput);
    const FirstEngineError error;
    if (document.ParseXml(input.Path()) != 0)
    {
        ThrowNotParsed(path, error);
    }
}

_xmlDoc* DocumentOf(CXMLReader& reader)
{
    return static_cast<xmlDoc*>(reader.GetDataPtr());
}

const _xmlNode* RootOf(CXMLReader& reader)
{
    return xmlDocGetRootElement(DocumentOf(reader));
}
