#include "file/Load.h"

#include "file/Engine.h"
#include "file/Input.h"
#include "output/Failure.h"
#include "output/Quoting.h"

#include "KxLog.h"

#include <libxml/parser.h>

#include <array>
#include <new>

namespace
{

Failure NotRead(const std::string& path, const std::error_code& error)
{
    return {ExitStatus::BadFile,
            "cannot read " + (path.empty() ? Quoted(path) : path) + ": " + error.message()};
}

bool IsWellFormed(const std::string& path)
{
    // As the library loads it: from 2.14 on other calls read compressed files, too.
    xmlDoc* const document = xmlParseFile(path.c_str());
    xmlFreeDoc(document);
    return document != nullptr;
}

/** Throws unless the engine has loaded the file completely. */
void RequireParsed(bool isParsed, const Input& input, const std::string& path,
                   const FirstEngineError& error)
{
    error.RequireMemory();
    if (isParsed)
    {
        return;
    }
    // Running out of memory can look like an error of the file: if the file parses now, it was
    // that.
    if (IsWellFormed(input.Path()))
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

/** What is kept: more than a command loads. */
std::array<void*, 4> g_kept;
size_t g_keptCount = g_kept.size(); ///< none is, unless it is asked for

} // namespace

void KeepLoaded()
{
    g_keptCount = 0;
}

bool Keep(void* loaded)
{
    if (g_keptCount == g_kept.size() || g_LumLogParams.xmlConfigParserMask != 0)
    {
        return false;
    }
    g_kept[g_keptCount++] = loaded;
    return true;
}

void LoadWith(const std::function<bool(const std::string&)>& load, const std::string& path,
              std::istream* standardInput)
{
    const Input input = Open(path, standardInput);
    const FirstEngineError error;
    RequireParsed(load(input.Path()), input, path, error);
}

LoadedReader LoadFile(const std::string& path, std::istream* standardInput)
{
    LoadedReader reader;
    LoadWith(
        [&](const std::string& file)
        {
            reader.reset(GetCXMLReaderObject(file.c_str()));
            if (reader == nullptr)
            {
                throw std::bad_alloc();
            }
            return reader->GetDataPtr() != nullptr;
        },
        path, standardInput);
    if (RootOf(*reader) == nullptr)
    {
        throw std::bad_alloc(); // short of memory, some engines load a document without a root
    }
    return reader;
}

void LoadDocument(const std::string& path, CXmlParser& document, std::istream* standardInput)
{
    // Constructing the parser made the engine drop blanks. They are the form of a file that is
    // saved, and count in the locations of other texts.
    xmlKeepBlanksDefault(1);
    LoadWith([&](const std::string& file) { return document.ParseXml(file) == 0; }, path,
             standardInput);
}

_xmlDoc* DocumentOf(CXMLReader& reader)
{
    return static_cast<xmlDoc*>(reader.GetDataPtr());
}

const _xmlNode* RootOf(CXMLReader& reader)
{
    return xmlDocGetRootElement(DocumentOf(reader));
}
