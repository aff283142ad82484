#include "Document.h"

#include <libxml/tree.h>
#include <libxml/xmlerror.h>

#include <cerrno>
#include <cstring>
#include <iostream>

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

void KeepFirstComplaint(void*, EngineError error)
{
    if (!g_firstComplaint.empty() || error->level < XML_ERR_ERROR || error->message == nullptr)
    {
        return;
    }
    g_firstComplaint = error->message;
    g_firstComplaint.erase(g_firstComplaint.find_last_not_of("\r\n") + 1);
    if (error->line > 0)
    {
        g_firstComplaint = std::to_string(error->line) + ": " + g_firstComplaint;
    }
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
    return S_ISREG(status.st_mode) && status.st_size == 0 ? "The file is empty" : "";
}

} // namespace

void Complain(const std::string& message)
{
    std::cerr << "kxconfig: " + message + "\n";
}

void CollectEngineComplaints()
{
    xmlSetStructuredErrorFunc(nullptr, KeepFirstComplaint);
}

std::string WhyNotLoaded(const std::string& path)
{
    const std::string reason = WhyNotRead(path);
    if (!reason.empty())
    {
        return "cannot read " + path + ": " + reason;
    }
    return path + ":" + (g_firstComplaint.empty() ? " not parsed" : g_firstComplaint);
}

std::string RootName(const void* document)
{
    const xmlNode* const root = xmlDocGetRootElement(static_cast<const xmlDoc*>(document));
    return root == nullptr ? "" : reinterpret_cast<const char*>(root->name);
}

std::string RootNameOf(const std::string& key)
{
    return key.substr(0, key.find('.'));
}
