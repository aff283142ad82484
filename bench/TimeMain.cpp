// Measures the time of every operation with Google Benchmark.

#include "Operations.h"

#include "KxLog.h"

#include <benchmark/benchmark.h>

#include <fstream>
#include <string>

namespace
{

void Measure(benchmark::State& state, const bench::Operation& operation)
{
    const auto run = operation.prepare();
    while (state.KeepRunningBatch(state.max_iterations))
    {
        run(static_cast<std::uint64_t>(state.max_iterations));
    }
}

/** @return what follows @p key and a separator in the first such line of @p file. */
std::string Entry(const char* file, const std::string& key)
{
    std::ifstream lines(file);
    for (std::string line; std::getline(lines, line);)
    {
        if (line.compare(0, key.size(), key) == 0)
        {
            const std::size_t begin = line.find_first_not_of(" \t:=\"", key.size());
            return line.substr(begin, line.find_last_not_of('"') + 1 - begin);
        }
    }
    return "unknown";
}

/** What a reader of the figures wants to know, besides what Google Benchmark notes itself. */
void NoteContext()
{
    benchmark::AddCustomContext("processor", Entry("/proc/cpuinfo", "model name"));
    benchmark::AddCustomContext("system", Entry("/etc/os-release", "PRETTY_NAME"));
    benchmark::AddCustomContext("compiler", "GCC " __VERSION__);
    benchmark::AddCustomContext("flags", KX_BENCH_FLAGS);
    for (const auto& [name, version] : bench::Versions())
    {
        benchmark::AddCustomContext("version of " + name, version);
    }
}

} // namespace

int main(int argc, char** argv)
{
    g_LumLogParams.xmlConfigParserMask = 0;
    for (const bench::Operation& operation : bench::Operations())
    {
        benchmark::RegisterBenchmark(operation.Name().c_str(), Measure, operation);
    }
    NoteContext();
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv))
    {
        return 1;
    }
    benchmark::RunSpecifiedBenchmarks();
    benchmark::Shutdown();
    return 0;
}
