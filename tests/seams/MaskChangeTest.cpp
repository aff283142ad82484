// Changes the log mask inside KxLog, after each record of each operation. Every gate reads the mask
// anew, except that it may reuse what the gate before it in the same operation has read.

#include "Operations.h"

#include "support/EngineTranscript.h"
#include "support/Log.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

using namespace kxtest;

namespace
{

constexpr unsigned kLevels[] = {kMaskWarning, kMaskError, kMaskTrace, kMaskValue, kMaskXPath};

bool Passes(unsigned mask, const Record& gate)
{
    return (mask >> gate.level & 1u) != 0;
}

/** The mask is @ref before until the record @ref after, counted from 1, and then @ref later. */
struct Change
{
    unsigned before;
    std::size_t after;
    unsigned later;
};

/** @return the position of the gate whose record the change follows. */
std::size_t GateOf(const Change& change, const Records& gates)
{
    std::size_t records = 0;
    std::size_t gate = 0;
    while ((records += Passes(change.before, gates[gate])) != change.after)
    {
        ++gate;
    }
    return gate;
}

/** @return whether two gates in a row belong to one operation: neither leaves one nor enters one.
 */
bool InOneOperation(const Record& gate, const Record& next)
{
    return gate.tag == next.tag && gate.text != "-" && next.text != "+";
}

/** @return the sequences of records that are allowed. */
std::vector<Records> Allowed(const Change& change, const Records& gates)
{
    const std::size_t last = GateOf(change, gates);
    const Records earlier(gates.begin(), gates.begin() + static_cast<long>(last) + 1);
    const Records rest(gates.begin() + static_cast<long>(last) + 1, gates.end());
    std::vector<Records> allowed = {Under(change.before, earlier) + Under(change.later, rest)};
    if (!rest.empty() && InOneOperation(earlier.back(), rest.front()))
    {
        const Records reused = Under(change.before, {rest.front()});
        allowed.push_back(Under(change.before, earlier) + reused +
                          Under(change.later, Records(rest.begin() + 1, rest.end())));
    }
    return allowed;
}

class MaskChangeTest : public testing::TestWithParam<Operation>
{
protected:
    Records Run(const Change& change) const
    {
        World world(m_files);
        GetParam().prepare(world);
        LogRecorder log(change.before);
        LogRecorder::OnCall(change.after, [&] { LogRecorder::SetMask(change.later); });
        GetParam().run(world);
        return log.Take();
    }

    void ChangeAfterEachRecord(unsigned before, unsigned later, const Records& gates) const
    {
        const std::size_t records = Under(before, gates).size();
        for (std::size_t after = 1; after <= records; ++after)
        {
            const Change change = {before, after, later};
            EXPECT_THAT(Allowed(change, gates), testing::Contains(Run(change)))
                << std::hex << before << " becomes " << later << " after record " << after;
        }
    }

    const OperationFiles m_files;
};

} // namespace

TEST_P(MaskChangeTest, TakesEffectAtTheNextGate)
{
    const Records gates = Run({kMaskAll, 0, kMaskAll});
    ChangeAfterEachRecord(kMaskAll, kMaskNone, gates);
    for (const unsigned level : kLevels)
    {
        ChangeAfterEachRecord(kMaskAll, ~level, gates);
        ChangeAfterEachRecord(level, kMaskAll, gates);
        ChangeAfterEachRecord(level, kMaskNone, gates);
    }
}

INSTANTIATE_TEST_SUITE_P(Operations, MaskChangeTest, testing::ValuesIn(AllOperations()), TestName);
