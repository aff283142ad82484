#include "file/Load.h"

#include "file/Engine.h"
#include "output/Failure.h"
#include "output/Quoting.h"

#include <libxml/tree.h>

#include <cerrno>
#include <cstring>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace
{

Failure NotRead(const std::string& path, int error)
{
    return {ExitStatus::BadFile,
            "cannot read " + (path.empty() ? Quoted(path) : path) + ": " + std::strerror(error)};
}

Failure NotParsed(const std::string& path, const FirstEngineError& error)
{
    return {ExitStatus::BadFile, path + ":" + (error.IsNone() ? " not parsed" : error.Text())};
}

/** Throws unless @p path is a file that can be read. */
void RequireReadable(const std::string& path)
{
    struct stat status = {};
    const int file = open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK);
    if (file < 0)
    {
        throw NotRead(path, errno);
    }
    fstat(file, &status);
    close(file);
    if (S_ISDIR(status.st_mode))
    {
        throw NotRead(path, EISDIR);
    }
}

} // namespace

std::unique_ptr<CXMLReader> LoadFile(const std::string& path)
{
    RequireReadable(path);
    const FirstEngineError error;
    std::unique_ptr<CXMLReader> reader(GetCXMLReaderObject(path.c_str()));
    if (reader == nullptr || reader->GetDataPtr() == nullptr)
    {
        throw NotParsed(path, error);
    }
    return reader;
}

void LoadDocument(const std::string& path, CXmlParser& document)
{
    RequireReadable(path);
    const FirstEngineError error;
    if (document.ParseXml(path) != 0)
    {
        throw NotParsed(path, error);
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
