#include "ToolTest.h"

#include <nlohmann/json.hpp>

using namespace kxtest;

namespace
{

class KxconfigDiff : public ToolTest
{
protected:
    const std::string m_file =
        m_folder.Write("a.xml", "<cfg><name>box</name><old>1</old><port><n>1</n></port></cfg>");
    const std::string m_other = m_folder.Write(
        "b.xml", "<cfg>\n<name>tin</name>\n<new>a\nb</new><port><n>1</n></port></cfg>");
};

} // namespace

TEST_F(KxconfigDiff, PrintsKeysOfOneFileAndValuesThatDiffer)
{
    const Outcome outcome = Tool({"diff", m_file, m_other});
    EXPECT_EQ(1, outcome.status);
    EXPECT_EQ("! cfg.name\t\"box\" -> \"tin\"\n"
              "- cfg.old\t\"1\"\n"
              "+ cfg.new\t\"a\\nb\"\n",
              outcome.out);
    EXPECT_EQ("", outcome.err);
}

TEST_F(KxconfigDiff, GivesNullInJsonForAValueThatIsNotThere)
{
    const Outcome outcome = Tool({"--json", "diff", m_file, m_other});
    EXPECT_EQ(1, outcome.status);
    const nlohmann::json expected = {{{"key", "cfg.name"}, {"value", "box"}, {"other", "tin"}},
                                     {{"key", "cfg.old"}, {"value", "1"}, {"other", nullptr}},
                                     {{"key", "cfg.new"}, {"value", nullptr}, {"other", "a\nb"}}};
    EXPECT_EQ(expected, nlohmann::json::parse(outcome.out).at("results"));
}

TEST_F(KxconfigDiff, PrintsNothingIfAllValuesAreTheSame)
{
    // Comments, white space and the order of elements are in no value.
    const std::string file = m_folder.Write("c.xml", "<cfg><!-- x --><a>1</a>\n<b>2</b></cfg>");
    const Outcome outcome =
        ToolWithInput({"diff", file, "-"}, "<?xml version='1.0'?><cfg><b>2</b><a>1</a></cfg>");
    EXPECT_EQ(0, outcome.status);
    EXPECT_EQ("", outcome.out + outcome.err);
    EXPECT_EQ(0, Tool({"diff", file, file}).status);
    EXPECT_EQ(0, ToolWithInput({"diff", "-", m_folder.Write("e.xml", "<d/>")}, "<c/>").status);
}

TEST_F(KxconfigDiff, NamesTheFileThatCannotBeRead)
{
    const std::string missing = m_folder.Path("missing.xml");
    const std::string message = "cannot read " + missing + ": No such file or directory";
    ExpectComplaint(Tool({"diff", m_file, missing}), 3, message);
    ExpectComplaint(Tool({"diff", missing, m_file}), 3, message);
    EXPECT_EQ(2, Tool({"diff", m_file}).status);
    EXPECT_EQ(2, Tool({"diff", "-", "-"}).status);
}
