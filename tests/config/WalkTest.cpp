// The steps of the walks, as kxconfig follows them.

#include "config/SiblingScan.h"
#include "config/UpdateWalk.h"

#include "support/Engine.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <vector>

using namespace kxtest;
using testing::ElementsAre;

namespace
{

using Document = std::unique_ptr<xmlDoc, decltype(&xmlFreeDoc)>;

Document Load(const std::string& xml)
{
    return Document(ParseText(xml), xmlFreeDoc);
}

const xmlNode* RootOf(const Document& document)
{
    return xmlDocGetRootElement(document.get());
}

std::string Name(const xmlNode* element)
{
    return reinterpret_cast<const char*>(element->name);
}

/** @return for each element: its name, whether it is named, suspended and selected. */
std::vector<std::string> Steps(const Document& document, const std::string& text)
{
    const kx::Segment segment((kx::TextView(text)));
    kx::SiblingScan scan(RootOf(document), segment);
    std::vector<std::string> steps;
    while (scan.Next())
    {
        steps.push_back(Name(scan.Element()) + (scan.IsNamed() ? " named" : "") +
                        (scan.IsSuspended() ? " suspended" : "") +
                        (scan.IsSelected() ? " selected" : ""));
    }
    return steps;
}

} // namespace

TEST(SiblingScan, AnElementOfAnotherNameSuspendsTheConditionForTheNextElement)
{
    const Document document = Load("<c><a i='1'/><b/><a i='1'/><a i='1'/><a i='2'/></c>");
    EXPECT_THAT(Steps(document, "a@i=2"), ElementsAre("a named", "b", "a named suspended selected",
                                                      "a named", "a named selected"));
}

TEST(SiblingScan, StepsOverWhatIsNoElement)
{
    const Document document = Load("<c>text<!--note--><a/><?pi?></c>");
    EXPECT_THAT(Steps(document, "a"), ElementsAre("a named selected"));
}

TEST(ConditionSteps, ReportEachTermThatWasTested)
{
    const Document document = Load("<c i='1' j='2'/>");
    const std::string text = "i=0|j=2&k=3";
    const kx::Condition condition((kx::TextView(text)));
    kx::ConditionTest test(condition, RootOf(document));
    EXPECT_EQ("i", std::string(test.GetTerm().name.data, test.GetTerm().name.size));
    EXPECT_FALSE(test.TermHolds());
    EXPECT_TRUE(test.TermEndsWithOr());
    EXPECT_FALSE(test.IsAccepted());
    ASSERT_TRUE(test.Next());
    EXPECT_TRUE(test.TermHolds());
    EXPECT_FALSE(test.TermEndsWithOr());
    EXPECT_TRUE(test.IsAccepted());
    ASSERT_TRUE(test.Next());
    EXPECT_FALSE(test.TermHolds());
    EXPECT_FALSE(test.IsAccepted());
    EXPECT_FALSE(test.Next());
}

TEST(UpdateWalk, ComparesTheFirstChildWithTheSegmentAndLaterOnesWithTheRest)
{
    const Document document = Load("<c><a>1</a><b>2</b><a>3</a></c>");
    const std::string key = "a.b";
    kx::UpdateWalk walk(RootOf(document), kx::TextView(key));
    std::vector<std::string> steps;
    while (walk.Next())
    {
        const kx::TextView wanted = walk.Wanted().name;
        steps.push_back(Name(walk.Element()) + " for " + std::string(wanted.data, wanted.size) +
                        (walk.IsNamed() ? " named" : "") + (walk.IsSelected() ? " selected" : ""));
        EXPECT_FALSE(walk.IsRejected());
        EXPECT_FALSE(walk.EndsHere());
    }
    EXPECT_THAT(steps, ElementsAre("a for a named selected", "b for b named selected", "a for b"));
    EXPECT_EQ(0, walk.GetStatus());
}
