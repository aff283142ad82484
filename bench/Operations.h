#ifndef KX_BENCH_OPERATIONS_H
#define KX_BENCH_OPERATIONS_H

// What is measured: every operation of every implementation, by name. The programs that measure
// time, instructions and allocations run the same ones.

#include <cstdint>
#include <functional>
#include <map>
#include <stdexcept>
#include <string>
#include <utility>
#include <vector>

namespace bench
{

struct Operation
{
    std::string workload;
    std::string implementation;

    /**
     * Loads what the operation works on and tries it once.
     * @return what runs it the given number of times. Throws if it does not yield what it should.
     */
    std::function<std::function<void(std::uint64_t times)>()> prepare;

    std::string Name() const { return workload + '/' + implementation; }
};

/** The operations of this program, in the order of their registration. */
std::vector<Operation>& Operations();

/** The versions of what is measured, by name. */
std::map<std::string, std::string>& Versions();

/** Keeps the compiler from leaving out what computes @p value. */
template <class T>
void Keep(const T& value)
{
    asm volatile("" : : "r"(&value) : "memory");
}

template <class Result, class Call>
std::function<void(std::uint64_t)> Tried(const Operation& operation, const Result& expected,
                                         Call call)
{
    if (!(call() == expected))
    {
        throw std::runtime_error(operation.Name() + " does not yield what it should");
    }
    return [call](std::uint64_t times) mutable
    {
        while (times-- != 0)
        {
            Keep(call());
        }
    };
}

/** Calls @p call once and sees that @p holds then. @return @p call, to be measured. */
template <class Call, class Holds>
Call Seen(Call call, Holds holds)
{
    call();
    if (!holds())
    {
        throw std::runtime_error("an operation does not do what it should");
    }
    return call;
}

/**
 * Registers an operation.
 *
 * @param setUp  returns the call to be measured, and owns or shares what the call works on. What
 *               the call returns is compared with @p expected once, before anything is measured.
 */
template <class Result, class SetUp>
void Add(const std::string& workload, const std::string& implementation, const Result& expected,
         SetUp setUp)
{
    Operation operation{workload, implementation, {}};
    operation.prepare = [operation, expected, setUp]
    { return Tried(operation, expected, setUp()); };
    Operations().push_back(operation);
}

/** Runs @p add before main(). */
struct Registration
{
    explicit Registration(void (*add)()) { add(); }
};

} // namespace bench

#endif
