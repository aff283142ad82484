#ifndef KX_TESTS_SUPPORT_MEMORY_H
#define KX_TESTS_SUPPORT_MEMORY_H

// Counting and failing of allocations: operator new of the whole process, and the engine's own
// allocator, which the test program's main() installs before anything else.

#include <cstddef>

namespace kxtest
{

/** Counts what operator new does from construction on, and can make one request fail. */
class NewCounter
{
public:
    NewCounter();
    ~NewCounter();
    NewCounter(const NewCounter&) = delete;
    NewCounter& operator=(const NewCounter&) = delete;

    /** @return requests since construction, the failed one included. */
    std::size_t Requests() const;

    /** @return the bytes that were requested since construction. */
    std::size_t Bytes() const;

    /** @return requests since construction that were not given back, by delete. */
    long Live() const;

    /** Makes the n-th request from now on fail, and only that one; 0 makes none fail. */
    static void FailAt(std::size_t n);

    /** @return whether the request named by FailAt() has come and failed. */
    static bool Failed();

private:
    std::size_t m_requests;
    std::size_t m_bytes;
    long m_live;
};

/**
 * The same for the engine's allocator (malloc, realloc and strdup of libxml2). The text of its last
 * complaint, which the engine keeps, does not count.
 */
class EngineMemory
{
public:
    EngineMemory();
    ~EngineMemory();
    EngineMemory(const EngineMemory&) = delete;
    EngineMemory& operator=(const EngineMemory&) = delete;

    std::size_t Requests() const;
    long Live() const;
    static void FailAt(std::size_t n);
    static bool Failed();

    /** Called by main() before the engine is used. */
    static void Install();

private:
    std::size_t m_requests;
    long m_live;
};

} // namespace kxtest

#endif
