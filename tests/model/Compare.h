#ifndef KX_TESTS_MODEL_COMPARE_H
#define KX_TESTS_MODEL_COMPARE_H

#include "model/Case.h"

#include <cstddef>
#include <map>
#include <string>

namespace kxmodel
{

/** What the comparisons met, to show whether they were worth the time. */
struct Tally
{
    std::size_t documents = 0; ///< that were parsed
    std::size_t calls = 0;
    std::map<int, std::size_t> statuses;
    std::size_t values = 0;  ///< lookups that found something
    std::size_t updates = 0; ///< updates that changed the document
    std::size_t records = 0;
};

/**
 * Makes the calls of @p subject on the library and on the model, each with a document of its own.
 *
 * @return an empty text if results, statuses, records and documents agree after every call,
 *         otherwise what the first difference is.
 */
std::string Difference(const Case& subject, Tally& tally);

} // namespace kxmodel

#endif
