#include "file/Document.h"

#include "file/Nodes.h"
#include "output/Output.h"

#include <libxml/parser.h>
#include <libxml/tree.h>
#include <libxml/xmlerror.h>

#include <algorithm>
#include <cerrno>
#include <cstring>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace
{

std::string g_firstComplaint;

#if LIBXML_VERSION >= 21200
using EngineError = const xmlError*;
#else
using EngineError = xmlErrorPtr;
#endif

void Ignore(void*, const char*, ...)
{
}

void KeepFirstComplaint(void*, EngineError error)
{
    // A prefix that is not declared is complained of, but ends no parse: what does is of interest.
    if (!g_firstComplaint.empty() || error->level < XML_ERR_ERROR || error->message == nullptr ||
        error->domain == XML_FROM_NAMESPACE)
    {
        return;
    }
    g_firstComplaint = error->message;
    g_firstComplaint.erase(
        std::min(g_firstComplaint.find_first_of("\r\n"), g_firstComplaint.size()));
    if (error->line > 0)
    {
        g_firstComplaint = std::to_string(error->line) + ": " + g_firstComplaint;
    }
}

void ForgetComplaints()
{
    g_firstComplaint.clear();
}

/** @return what keeps the file from being read as one, or an empty string. */
std::string WhyNotRead(const std::string& path)
{
    struct stat status = {};
    const int file = open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK);
    if (file < 0)
    {
        return std::strerror(errno);
    }
    fstat(file, &status);
    close(file);
    if (S_ISDIR(status.st_mode))
    {
        return std::strerror(EISDIR);
    }
    return "";
}

/** @return whether @p path is a file that can be read; begins a new collection of complaints. */
bool CanBeRead(const std::string& path, std::string& complaint)
{
    ForgetComplaints();
    const std::string reason = WhyNotRead(path);
    if (!reason.empty())
    {
        complaint = "cannot read " + (path.empty() ? Quoted(path) : path) + ": " + reason;
    }
    return reason.empty();
}

std::string WhyNotParsed(const std::string& path)
{
    return path + ":" + (g_firstComplaint.empty() ? " not parsed" : g_firstComplaint);
}

} // namespace

void PrepareEngine()
{
    CountLines();
    xmlSetStructuredErrorFunc(nullptr, KeepFirstComplaint);
    xmlSetGenericErrorFunc(nullptr, Ignore); // some of XPath's say the same in other words
}

std::unique_ptr<CXMLReader> LoadFile(const std::string& path, std::string& complaint)
{
    if (!CanBeRead(path, complaint))
    {
        return nullptr;
    }
    std::unique_ptr<CXMLReader> reader(GetCXMLReaderObject(path.c_str()));
    if (reader == nullptr || reader->GetDataPtr() == nullptr)
    {
        complaint = WhyNotParsed(path);
        return nullptr;
    }
    ForgetComplaints(); // of a file that loads all the same
    return reader;
}

bool LoadDocument(const std::string& path, CXmlParser& document)
{
    std::string complaint;
    if (!CanBeRead(path, complaint))
    {
        Complain(complaint);
        return false;
    }
    if (document.ParseXml(path) != 0)
    {
        Complain(WhyNotParsed(path));
        return false;
    }
    ForgetComplaints();
    return true;
}

std::string FirstComplaint(const std::string& before)
{
    return g_firstComplaint.empty() ? "" : before + g_firstComplaint;
}

std::unique_ptr<CXMLReader> LoadFile(const std::string& path)
{
    std::string complaint;
    std::unique_ptr<CXMLReader> reader = LoadFile(path, complaint);
    if (reader == nullptr)
    {
        Complain(complaint);
    }
    return reader;
}

std::string WhyNotLoadedAgain(CXMLReader& reader)
{
    xmlChar* text = nullptr;
    int size = 0;
    xmlDocDumpMemoryEnc(static_cast<xmlDoc*>(reader.GetDataPtr()), &text, &size, "UTF-8");
    ForgetComplaints();
    xmlDoc* const again =
        xmlReadMemory(reinterpret_cast<const char*>(text), size, nullptr, nullptr, 0);
    xmlFree(text);
    const bool loads = again != nullptr;
    xmlFreeDoc(again);
    return loads ? "" : FirstComplaint("");
}

ExitStatus CheckKey(const std::string& file, const std::string& key, CXMLReader& reader)
{
    const std::string::size_type dot = key.find('.');
    if (dot == std::string::npos)
    {
        Complain("malformed key " + Quoted(key) +
                 ": it names the root element and at least one more, as in root.name");
        return ExitStatus::BadUsage;
    }
    const std::string root = Text(RootOf(reader)->name);
    if (key.substr(0, dot) != root)
    {
        Complain("nothing found: the key starts with " + Quoted(key.substr(0, dot)) +
                 ", but the root element of " + file + " is " + Quoted(root));
        return ExitStatus::NothingFound;
    }
    return ExitStatus::Done;
}

const xmlNode* RootOf(CXMLReader& reader)
{
    return xmlDocGetRootElement(static_cast<xmlDoc*>(reader.GetDataPtr()));
}
