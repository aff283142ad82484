// Prints, as JSON, how often each operation asks for memory: the program stands in front of malloc
// and its like.

#include "Operations.h"

#include "KxLog.h"

#include <cstdio>
#include <cstdlib>
#include <ctime>
#include <exception>

extern "C"
{
    void* __libc_malloc(std::size_t);
    void* __libc_calloc(std::size_t, std::size_t);
    void* __libc_realloc(void*, std::size_t);
    void* __libc_memalign(std::size_t, std::size_t);
}

namespace
{
unsigned long g_requests = 0;
}

extern "C" void* malloc(std::size_t size) noexcept
{
    ++g_requests;
    return __libc_malloc(size);
}

extern "C" void* calloc(std::size_t count, std::size_t size) noexcept
{
    ++g_requests;
    return __libc_calloc(count, size);
}

extern "C" void* realloc(void* memory, std::size_t size) noexcept
{
    ++g_requests;
    return __libc_realloc(memory, size);
}

extern "C" void* aligned_alloc(std::size_t alignment, std::size_t size) noexcept
{
    ++g_requests;
    return __libc_memalign(alignment, size);
}

/** Stands in front of the C library's: the engine seeds its tables with the time. */
extern "C" std::time_t time(std::time_t* result) noexcept
{
    if (result != nullptr)
    {
        *result = 0;
    }
    return 0;
}

int main()
try
{
    g_LumLogParams.xmlConfigParserMask = 0;
    const char* separator = "{\n";
    for (const bench::Operation& operation : bench::Operations())
    {
        const auto run = operation.prepare();
        run(1);
        const unsigned long before = g_requests;
        run(1);
        const unsigned long requests = g_requests - before;
        std::printf("%s  \"%s\": %lu", separator, operation.Name().c_str(), requests);
        separator = ",\n";
    }
    std::puts("\n}");
    return 0;
}
catch (const std::exception& error)
{
    std::fprintf(stderr, "%s\n", error.what());
    return 1;
}
