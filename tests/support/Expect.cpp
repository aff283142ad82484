#include "support/Expect.h"

#include <ios>

namespace kxtest
{

void ExpectRecords(const Records& all, const std::function<void()>& operation)
{
    for (const unsigned mask : {kMaskAll, kMaskNone, kMaskWarning, kMaskError, kMaskTrace,
                                kMaskValue, kMaskXPath, kMaskError | kMaskXPath})
    {
        const unsigned long calls = LogRecorder::Calls();
        LogRecorder log(mask);
        operation();
        const Records records = log.Take();
        EXPECT_EQ(Under(mask, all), records) << "under mask " << std::hex << mask;
        EXPECT_EQ(calls + records.size(), LogRecorder::Calls());
    }
}

} // namespace kxtest
