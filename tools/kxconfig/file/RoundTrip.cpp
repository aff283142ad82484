#include "file/RoundTrip.h"

#include "file/Engine.h"
#include "file/Load.h"
#include "output/Failure.h"

#include <libxml/parser.h>

#include <memory>
#include <new>

// The engine has two calls for the same bytes: the writer uses the one that opens a file by its
// name, and does not report why that failed.
std::string SavedBytes(CXMLReader& reader)
{
    xmlChar* bytes = nullptr;
    int size = 0;
    xmlDocDumpMemoryEnc(DocumentOf(reader), &bytes, &size, "UTF-8");
    if (bytes == nullptr)
    {
        throw std::bad_alloc();
    }
    const auto release = [](xmlChar* owned) { xmlFree(owned); };
    const std::unique_ptr<xmlChar, decltype(release)> owner(bytes, release);
    return {reinterpret_cast<const char*>(bytes), static_cast<size_t>(size)};
}

void RequireLoadsAgain(const std::string& bytes, const std::string& target)
{
    const FirstEngineError error;
    xmlDoc* const again =
        xmlReadMemory(bytes.data(), static_cast<int>(bytes.size()), nullptr, nullptr, 0);
    xmlFreeDoc(again);
    if (again == nullptr)
    {
        throw Failure(ExitStatus::NotSaved,
                      "not saved: " + target + " would no longer load, line " + error.Text());
    }
}
