#ifndef KX_TESTS_MODEL_GENERATE_H
#define KX_TESTS_MODEL_GENERATE_H

#include "model/Case.h"

#include <cstdint>

namespace kxmodel
{

/**
 * @return the random case of @p seed, the same on every machine: a document with a small alphabet
 *         of names that are prefixes of each other, and keys drawn from it, many of them mutated.
 */
Case Generated(std::uint64_t seed);

} // namespace kxmodel

#endif
