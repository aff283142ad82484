// Runs a fuzz target on files instead of under the fuzzer: the seeds and what was once found, in
// every build, under every tool.

#include "support/Files.h"

#include <cstdint>
#include <cstdio>
#include <exception>
#include <filesystem>

extern "C" int LLVMFuzzerInitialize(int* argc, char*** argv);
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size);

int main(int argc, char** argv)
try
{
    LLVMFuzzerInitialize(&argc, &argv);
    std::size_t runs = 0;
    for (int i = 1; i < argc; ++i)
    {
        for (const auto& entry : std::filesystem::directory_iterator(argv[i]))
        {
            std::printf("%s\n", entry.path().c_str());
            std::fflush(stdout);
            const std::string input = kxtest::ReadFile(entry.path());
            LLVMFuzzerTestOneInput(reinterpret_cast<const std::uint8_t*>(input.data()),
                                   input.size());
            ++runs;
        }
    }
    return runs == 0;
}
catch (const std::exception& failure)
{
    std::fprintf(stderr, "%s\n", failure.what());
    return 2;
}
