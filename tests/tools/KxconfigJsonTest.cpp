#include "ToolTest.h"

#include <nlohmann/json.hpp>

using namespace kxtest;
using nlohmann::json;

namespace
{

class KxconfigJson : public ToolTest
{
protected:
    const std::string m_file = m_folder.Write(
        "cfg.xml", "<cfg>\n<net id='1'><ip>a</ip></net>\n<net id='2'><ip>b</ip></net></cfg>");

    /** @return the object on standard output, which nothing else stands on. */
    static json Answer(std::vector<std::string> arguments)
    {
        arguments.insert(arguments.begin(), "--json");
        const Outcome outcome = Tool(arguments);
        EXPECT_EQ("", outcome.err);
        const json answer = json::parse(outcome.out, nullptr, false);
        EXPECT_TRUE(answer.is_object()) << outcome.out;
        EXPECT_EQ(outcome.status, answer.at("status"));
        return answer;
    }
};

} // namespace

TEST_F(KxconfigJson, HasOneShape)
{
    const json expected = {{"file", m_file},
                           {"verb", "keys"},
                           {"status", 0},
                           {"results",
                            {{{"key", "cfg.net@id=1.ip"}, {"value", "a"}},
                             {{"key", "cfg.net@id=2.ip"}, {"value", "b"}}}},
                           {"messages", json::array()}};
    EXPECT_EQ(expected, Answer({"keys", m_file}));
}

TEST_F(KxconfigJson, GetGivesEachValueAndItsPlace)
{
    const json expected = {{{"location", "/cfg/net[1]/ip"}, {"line", 2}, {"value", "a"}},
                           {{"location", "/cfg/net[2]/ip"}, {"line", 3}, {"value", "b"}}};
    EXPECT_EQ(expected, Answer({"get", m_file, "cfg.net.ip"}).at("results"));
}

TEST_F(KxconfigJson, SetGivesEachChange)
{
    const json expected = {{{"location", "/cfg/net[1]/ip"}, {"before", "a"}, {"after", "x"}},
                           {{"location", "/cfg/net[2]/ip"}, {"before", "b"}, {"after", "x"}}};
    EXPECT_EQ(expected, Answer({"set", "--dry-run", m_file, "cfg.ip", "x"}).at("results"));
}

TEST_F(KxconfigJson, FindGivesNodesAndValues)
{
    const json expected = {{{"location", "/cfg/net[2]"},
                            {"line", 3},
                            {"type", "element"},
                            {"value", nullptr},
                            {"attributes", {{"id", "2"}}}}};
    EXPECT_EQ(expected, Answer({"find", m_file, "//net[2]"}).at("results"));
    EXPECT_EQ(nullptr, Answer({"find", m_file, "/"}).at("results")[0].at("line"));
    EXPECT_EQ(3, Answer({"find", m_file, "//net[2]/@id"}).at("results")[0].at("line"));
    EXPECT_EQ(json({{{"value", "2"}}}), Answer({"find", m_file, "count(//net)"}).at("results"));
}

TEST_F(KxconfigJson, CheckGivesEachWarning)
{
    const json answer = Answer({"check", m_file, "cfg.net.ip"});
    EXPECT_EQ(1, answer.at("status"));
    const json expected = {
        {"line", 3},
        {"kind", "ambiguous key"},
        {"severity", "warning"},
        {"text", "\"cfg.net.ip\" matches 2 elements, the first of them /cfg/net[1]/ip (line 2)"}};
    EXPECT_THAT(answer.at("results"), testing::Contains(expected));

    const json unfound = Answer({"check", m_file, "cfg.net@id=2.name"});
    EXPECT_EQ(1, unfound.at("status"));
    const json noValue = {{"line", 3},
                          {"kind", "key without a value"},
                          {"severity", "warning"},
                          {"text", "\"cfg.net@id=2.name\" has no value: it leads as far as "
                                   "/cfg/net[2]; kxconfig explain shows the reason"}};
    EXPECT_THAT(unfound.at("results"), testing::Contains(noValue));
    EXPECT_EQ(json::array(), unfound.at("messages"));
}

TEST_F(KxconfigJson, ExplainGivesNoLocationOfMoreThanFiveHundredBytes)
{
    const std::string name(247, 'n'); // "/cfg/" + 247 + "/" + 247 are 500 bytes
    const std::string below = name + "><" + name + "/></" + name + ">";
    const std::string fits = m_folder.Write("fits.xml", "<cfg><" + below + "</cfg>");
    const std::string key = "." + name + "." + name;
    const json location = Answer({"explain", fits, "cfg" + key}).at("results")[4].at("location");
    EXPECT_EQ("/cfg/" + name + "/" + name, location);
    const std::string longer = m_folder.Write("longer.xml", "<cfgs><" + below + "</cfgs>");
    const json element = Answer({"explain", longer, "cfgs" + key}).at("results")[4];
    EXPECT_EQ(nullptr, element.at("location"));
    EXPECT_EQ(name, element.at("step"));
}

TEST_F(KxconfigJson, GetNamesTheKeyWhereThereAreSeveral)
{
    const json answer = Answer({"get", "--default", "d", m_file, "cfg.net@id=2.ip", "cfg.x"});
    const json expected = {
        {{"key", "cfg.net@id=2.ip"}, {"location", "/cfg/net[2]/ip"}, {"line", 3}, {"value", "b"}},
        {{"key", "cfg.x"}, {"location", nullptr}, {"line", nullptr}, {"value", "d"}}};
    EXPECT_EQ(expected, answer.at("results"));
}

TEST_F(KxconfigJson, ExplainGivesEachStep)
{
    const json results = Answer({"explain", m_file, "cfg.net@id=2.ip"}).at("results");
    ASSERT_EQ(8u, results.size());
    const json root = {{"event", "root"},
                       {"depth", 0},
                       {"line", 1},
                       {"location", "/cfg"},
                       {"told", "the key starts with the root's name"}};
    EXPECT_EQ(root, results[0]);
    const json level = {{"event", "level"},
                        {"depth", 0},
                        {"location", "/cfg"},
                        {"step", "/cfg"},
                        {"sought", {{"name", "net"}, {"condition", "id=2"}}}};
    EXPECT_EQ(level, results[1]);
    const json rejected = {
        {"event", "element"},
        {"depth", 1},
        {"line", 2},
        {"location", "/cfg/net[1]"},
        {"step", "net[1]"},
        {"sought", {{"name", "net"}, {"condition", "id=2"}}},
        {"verdict", "rejected"},
        {"terms", {{{"attribute", "id"}, {"expected", "2"}, {"actual", "1"}, {"holds", false}}}},
        {"value", nullptr}};
    EXPECT_EQ(rejected, results[2]);
    EXPECT_EQ("b", results[5].at("value"));
    const json last = {{"event", "result"},
                       {"depth", 0},
                       {"call", "GetValue(key, value)"},
                       {"status", 0},
                       {"value", "b"}};
    EXPECT_EQ(last, results[7]);
}

TEST_F(KxconfigJson, KeepsComplaintsAsMessages)
{
    const json missing = Answer({"get", m_folder.Path("missing.xml"), "a.b"});
    EXPECT_EQ(3, missing.at("status"));
    EXPECT_EQ(json({"cannot read " + m_folder.Path("missing.xml") + ": No such file or directory"}),
              missing.at("messages"));
    EXPECT_EQ(json::array(), missing.at("results"));
    const json usage = Answer({"get"});
    EXPECT_EQ(2, usage.at("status"));
    EXPECT_EQ(nullptr, usage.at("verb"));
    EXPECT_EQ(json({"FILE is required (kxconfig --help shows the usage)"}), usage.at("messages"));
}

TEST_F(KxconfigJson, IsValidWhateverBytesItHolds)
{
    const std::string odd = m_folder.Write("odd\xFF\n\".xml", "<cfg><a>\"\\ &#x85;\t</a></cfg>");
    const json found = Answer({"get", odd, "cfg.a"});
    EXPECT_EQ("\"\\ \xC2\x85\t", found.at("results")[0].at("value"));
    EXPECT_EQ(m_folder.Path("odd\xEF\xBF\xBD\n\".xml"), found.at("file"));
    EXPECT_EQ(1, Answer({"get", odd, "cfg.\xC3\x28\x01"}).at("status"));
    EXPECT_EQ(0, Answer({"--help"}).at("status"));
}
