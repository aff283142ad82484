// Library against model, on random cases and on cases that once were found and are kept.
//
// KX_EVALUATIONS: how many calls to compare. KX_SEED: where the sequence of cases starts.

#include "model/Compare.h"
#include "model/Generate.h"
#include "model/Shrink.h"

#include "support/Files.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <iostream>

using namespace kxmodel;

namespace
{

unsigned long long Setting(const char* name, unsigned long long otherwise)
{
    const char* const text = std::getenv(name);
    return text == nullptr ? otherwise : std::strtoull(text, nullptr, 10);
}

bool Differs(const Case& subject)
{
    Tally ignored;
    return !Difference(subject, ignored).empty();
}

/** Compares; a case that fails is reported as small as it gets. */
void Check(const Case& subject, Tally& tally)
{
    if (Difference(subject, tally).empty())
    {
        return;
    }
    const Case shrunk = Shrunk(subject, Differs);
    Tally ignored;
    ADD_FAILURE() << "--- the case\n"
                  << ToText(shrunk) << "\n--- the difference\n"
                  << Difference(shrunk, ignored);
}

std::ostream& operator<<(std::ostream& out, const Tally& tally)
{
    out << tally.calls << " calls on " << tally.documents << " documents: " << tally.values
        << " lookups found something, " << tally.updates << " updates changed something, "
        << tally.records << " records; statuses";
    for (const auto& [status, count] : tally.statuses)
    {
        out << ' ' << status << ": " << count;
    }
    return out;
}

} // namespace

TEST(Differential, LibraryAndModelAgreeOnRandomCases)
{
    const unsigned long long seed = Setting("KX_SEED", 1);
    const unsigned long long evaluations = Setting("KX_EVALUATIONS", 20000);
    std::cout << "from seed " << seed << std::endl;
    Tally tally;
    for (unsigned long long i = seed; tally.calls < evaluations; ++i)
    {
        SCOPED_TRACE("seed " + std::to_string(i));
        Check(Generated(i), tally);
        if (HasFailure())
        {
            return;
        }
    }
    std::cout << tally << std::endl;

    // Cases of which most find nothing would prove little.
    EXPECT_GT(tally.values, tally.calls / 8);
    EXPECT_GT(tally.updates, tally.calls / 20);
    for (const int status : {0, 7, 22, -2})
    {
        EXPECT_GT(tally.statuses[status], tally.calls / 500) << status;
    }
}

TEST(Differential, WithoutADocumentTheyAgreeToo)
{
    Tally tally;
    Case subject = Generated(1);
    subject.document = "<cfg>";
    Check(subject, tally);
    EXPECT_EQ(0u, tally.documents);
    EXPECT_EQ(subject.operations.size(), tally.calls);
}

TEST(Differential, TheyAgreeOnTheCasesThatTheFuzzingStartsFrom)
{
    Tally tally;
    for (const auto& entry : std::filesystem::directory_iterator(KX_KEYPATH_CORPUS))
    {
        SCOPED_TRACE(entry.path());
        Check(FromText(kxtest::ReadFile(entry.path())), tally);
    }
    EXPECT_GT(tally.values, 0u);
    EXPECT_GT(tally.updates, 0u);
}
