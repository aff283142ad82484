#ifndef KX_TESTS_SUPPORT_SIGNATURE_H
#define KX_TESTS_SUPPORT_SIGNATURE_H

// Signatures of engine functions that a program defines itself, as the engine's headers declare
// them.

namespace kxtest
{

template <class Function>
struct Signature;
template <class Result, class First, class... Others>
struct Signature<Result(First, Others...)>
{
    using FirstType = First;
};

/** The type of a function's first argument, which older headers declare without const. */
template <class Function>
using FirstOf = typename Signature<Function>::FirstType;

} // namespace kxtest

#endif
