#include "file/SavedBytes.h"

#include "file/Engine.h"

#include <libxml/xmlsave.h>

#include <filesystem>
#include <fstream>
#include <new>
#include <utility>

namespace
{

/** Receives what the engine saves. */
int AppendTo(void* bytes, const char* data, int size)
{
    try
    {
        static_cast<std::string*>(bytes)->append(data, static_cast<size_t>(size));
    }
    catch (const std::bad_alloc&)
    {
        return -1; // an exception must not pass through the engine
    }
    return size;
}

} // namespace

std::optional<std::string> BytesOf(const std::string& path)
{
    std::error_code error;
    if (!std::filesystem::is_regular_file(path, error))
    {
        return std::nullopt;
    }
    const auto size = std::filesystem::file_size(path, error);
    std::string bytes;
    if (error || size > bytes.max_size())
    {
        return std::nullopt;
    }
    bytes.resize(static_cast<size_t>(size));
    std::ifstream file(path, std::ios::binary);
    const bool isRead =
        static_cast<bool>(file.read(bytes.data(), static_cast<std::streamsize>(bytes.size())));
    return isRead ? std::optional(std::move(bytes)) : std::nullopt;
}

// The writer uses the call of the engine that opens a file by its name, and does not report why
// that failed. This is the same call for an open file.
std::string SavedBytes(xmlDoc* document)
{
    std::string bytes;
    const FirstEngineError error;
    xmlOutputBuffer* const buffer =
        xmlOutputBufferCreateIO(AppendTo, nullptr, &bytes, xmlFindCharEncodingHandler("UTF-8"));
    const bool isSaved = buffer != nullptr && xmlSaveFileTo(buffer, document, "UTF-8") >= 0;
    error.RequireMemory(); // short of it the engine leaves out declarations and reports success
    if (!isSaved)
    {
        throw std::bad_alloc();
    }
    return bytes;
}
