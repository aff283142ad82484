#ifndef KX_TESTS_SUPPORT_LAYOUT_H
#define KX_TESTS_SUPPORT_LAYOUT_H

// What the compiler makes of a class: the words of an object, and the slots of its table.

#include <cstddef>
#include <cstring>

namespace kxtest
{

/** @return the pointer that @p object holds at the byte @p offset. */
inline void* PointerAt(const void* object, std::size_t offset)
{
    void* pointer = nullptr;
    std::memcpy(&pointer, static_cast<const char*>(object) + offset, sizeof pointer);
    return pointer;
}

/**
 * @return the function in @p slot (counted from 0) of the table that @p object begins with.
 *
 * It is called with the object as its first argument; slot 0 destroys it and slot 1 deletes it.
 */
template <class Function>
Function Slot(const void* object, std::size_t slot)
{
    void* const* const table = static_cast<void* const*>(PointerAt(object, 0));
    return reinterpret_cast<Function>(table[slot]);
}

} // namespace kxtest

#endif
