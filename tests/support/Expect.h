#ifndef KX_TESTS_SUPPORT_EXPECT_H
#define KX_TESTS_SUPPORT_EXPECT_H

// Expectations that several suites share.

#include "support/Log.h"
#include "support/Memory.h"

#include <gtest/gtest.h>

#include <functional>
#include <string>

namespace kxtest
{

/**
 * Runs @p operation under masks of all, no and single levels: it must log those of the records
 * @p all that the mask lets through, and call KxLog no more often.
 */
void ExpectRecords(const Records& all, const std::function<void()>& operation);

/**
 * Calls @p attempt(n) for n from 1 on until it returns false: the operation made fewer than n
 * requests, so none failed. At least the first @p fewest must have failed.
 */
template <class Attempt>
void FailInTurn(const Attempt& attempt, std::size_t fewest = 1)
{
    constexpr std::size_t kEnough = 5000;
    for (std::size_t n = 1; n < kEnough; ++n)
    {
        SCOPED_TRACE("request " + std::to_string(n) + " fails");
        if (!attempt(n))
        {
            EXPECT_LT(fewest, n);
            return;
        }
    }
    ADD_FAILURE() << "the operation never succeeds";
}

/**
 * Runs @p operation with the n-th request of @p Faults, NewCounter or EngineMemory, failing.
 *
 * @return whether the operation made that request.
 */
template <class Faults, class Operation>
bool Failing(std::size_t n, const Operation& operation)
{
    Faults::FailAt(n);
    operation();
    const bool failed = Faults::Failed();
    Faults::FailAt(0);
    return failed;
}

} // namespace kxtest

#endif
