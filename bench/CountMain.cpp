// Runs every operation, or those named by the arguments, under Valgrind's callgrind, which dumps
// its counters after one and after two of them; scripts/count_instructions.sh reads the dumps.
//
// usage: PROGRAM [NAME...]

#include "Operations.h"

#include "KxLog.h"

#include <valgrind/callgrind.h>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <ctime>
#include <exception>
#include <vector>

/**
 * Stands in front of the C library's: the engine seeds its tables with the time, and a few
 * instructions more or less follow from where they put what they hold.
 */
extern "C" std::time_t time(std::time_t* result) noexcept
{
    if (result != nullptr)
    {
        *result = 0;
    }
    return 0;
}

namespace
{

/** Counts @p times operations together with the call that runs them. */
void Dump(const std::function<void(std::uint64_t)>& run, std::uint64_t times,
          const std::string& name)
{
    CALLGRIND_START_INSTRUMENTATION;
    CALLGRIND_ZERO_STATS;
    run(times);
    CALLGRIND_DUMP_STATS_AT(name.c_str());
    CALLGRIND_STOP_INSTRUMENTATION;
}

void Count(const bench::Operation& operation)
{
    using Clock = std::chrono::steady_clock;
    const auto run = operation.prepare();
    run(1);
    const Clock::time_point begin = Clock::now();
    Dump(run, 1, "1 " + operation.Name());
    // The difference between the two is one operation without what surrounds it, which is nothing
    // beside a long one.
    if (Clock::now() - begin < std::chrono::milliseconds(500))
    {
        Dump(run, 2, "2 " + operation.Name());
    }
}

bool IsWanted(const bench::Operation& operation, const std::vector<std::string>& names)
{
    return names.empty() || std::find(names.begin(), names.end(), operation.Name()) != names.end();
}

} // namespace

int main(int argc, char** argv)
try
{
    g_LumLogParams.xmlConfigParserMask = 0;
    const std::vector<std::string> names(argv + 1, argv + argc);
    for (const bench::Operation& operation : bench::Operations())
    {
        if (IsWanted(operation, names))
        {
            Count(operation);
        }
    }
    return 0;
}
catch (const std::exception& error)
{
    std::fprintf(stderr, "%s\n", error.what());
    return 1;
}
