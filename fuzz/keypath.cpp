// A document and calls on it, through reader, writer and model: whatever the bytes, they agree.
// The input is a case as tests/model/Case.h writes it down.

#include "model/Case.h"
#include "model/Compare.h"

#include "ConfinedEngine.h"

#include <cstdint>
#include <cstdio>
#include <cstdlib>

extern "C" int LLVMFuzzerInitialize(int*, char***)
{
    kxfuzz::ConfineEngine();
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const kxmodel::Case subject =
        kxmodel::FromText(std::string(reinterpret_cast<const char*>(data), size));
    kxmodel::Tally tally;
    const std::string difference = kxmodel::Difference(subject, tally);
    if (!difference.empty())
    {
        std::fprintf(stderr, "%s\n\n%s\n", kxmodel::ToText(subject).c_str(), difference.c_str());
        std::abort();
    }
    return 0;
}
