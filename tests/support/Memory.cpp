#include "support/Memory.h"

#include <libxml/xmlerror.h>
#include <libxml/xmlmemory.h>

#include <atomic>
#include <cstdlib>
#include <cstring>
#include <new>

namespace
{

struct Ledger
{
    std::atomic<std::size_t> requests{0};
    std::atomic<std::size_t> bytes{0};
    std::atomic<long> live{0};
    std::atomic<std::size_t> failAt{0}; // requests left until the one that fails; 0: none
    std::atomic<bool> failed{false};

    bool Refuses()
    {
        ++requests;
        if (failAt == 0 || --failAt != 0)
        {
            return false;
        }
        failed = true;
        return true;
    }

    void* Allocate(std::size_t size)
    {
        bytes += size;
        void* const memory = Refuses() ? nullptr : std::malloc(size == 0 ? 1 : size);
        live += memory != nullptr;
        return memory;
    }

    void Release(void* memory)
    {
        live -= memory != nullptr;
        std::free(memory);
    }
};

Ledger g_new;
Ledger g_engine;

void* EngineMalloc(size_t size)
{
    return g_engine.Allocate(size);
}

void EngineFree(void* memory)
{
    g_engine.Release(memory);
}

void* EngineRealloc(void* memory, size_t size)
{
    if (memory == nullptr)
    {
        return g_engine.Allocate(size);
    }
    return g_engine.Refuses() ? nullptr : std::realloc(memory, size);
}

char* EngineStrdup(const char* text)
{
    const std::size_t size = std::strlen(text) + 1;
    void* const memory = g_engine.Allocate(size);
    return memory == nullptr ? nullptr : static_cast<char*>(std::memcpy(memory, text, size));
}

} // namespace

void* operator new(std::size_t size)
{
    void* const memory = g_new.Allocate(size);
    if (memory == nullptr)
    {
        throw std::bad_alloc();
    }
    return memory;
}

void* operator new[](std::size_t size)
{
    return operator new(size);
}
void* operator new(std::size_t size, const std::nothrow_t&) noexcept
{
    return g_new.Allocate(size);
}
void* operator new[](std::size_t size, const std::nothrow_t&) noexcept
{
    return g_new.Allocate(size);
}
// malloc() aligns for every type that is not overaligned. Memory resources ask like that for all.
void* operator new(std::size_t size, std::align_val_t)
{
    return operator new(size);
}
void operator delete(void* memory, std::align_val_t) noexcept
{
    g_new.Release(memory);
}
void operator delete(void* memory, std::size_t, std::align_val_t) noexcept
{
    g_new.Release(memory);
}
void operator delete(void* memory) noexcept
{
    g_new.Release(memory);
}
void operator delete[](void* memory) noexcept
{
    g_new.Release(memory);
}
void operator delete(void* memory, std::size_t) noexcept
{
    g_new.Release(memory);
}
void operator delete[](void* memory, std::size_t) noexcept
{
    g_new.Release(memory);
}
void operator delete(void* memory, const std::nothrow_t&) noexcept
{
    g_new.Release(memory);
}
void operator delete[](void* memory, const std::nothrow_t&) noexcept
{
    g_new.Release(memory);
}

namespace kxtest
{

NewCounter::NewCounter() : m_requests(g_new.requests), m_bytes(g_new.bytes), m_live(g_new.live)
{
}
NewCounter::~NewCounter()
{
    FailAt(0);
}
std::size_t NewCounter::Requests() const
{
    return g_new.requests - m_requests;
}
std::size_t NewCounter::Bytes() const
{
    return g_new.bytes - m_bytes;
}
long NewCounter::Live() const
{
    return g_new.live - m_live;
}

void NewCounter::FailAt(std::size_t n)
{
    g_new.failed = false;
    g_new.failAt = n;
}

bool NewCounter::Failed()
{
    return g_new.failed;
}

EngineMemory::EngineMemory()
{
    xmlResetLastError();
    m_requests = g_engine.requests;
    m_live = g_engine.live;
}

EngineMemory::~EngineMemory()
{
    FailAt(0);
}
std::size_t EngineMemory::Requests() const
{
    return g_engine.requests - m_requests;
}

long EngineMemory::Live() const
{
    xmlResetLastError();
    return g_engine.live - m_live;
}

void EngineMemory::FailAt(std::size_t n)
{
    g_engine.failed = false;
    g_engine.failAt = n;
}

bool EngineMemory::Failed()
{
    return g_engine.failed;
}

void EngineMemory::Install()
{
    xmlMemSetup(EngineFree, EngineMalloc, EngineRealloc, EngineStrdup);
}

} // namespace kxtest
