#include "RandomDocument.h"
#include "ToolTest.h"

#include <nlohmann/json.hpp>

#include <map>
#include <system_error>

using namespace kxtest;
using testing::HasSubstr;
using testing::StartsWith;

namespace
{

/** What set does beyond the update by one key and one value. */
class KxconfigSetPairs : public ToolTest
{
protected:
    const std::string m_declaration = "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n";
    const std::string m_before = m_declaration + "<cfg>\n  <name>box</name>\n  <net>\n"
                                                 "    <ip>a</ip>\n  </net>\n</cfg>\n";
    const std::string m_file = m_folder.Write("cfg.xml", m_before);

    /** Expects the complaint, and the file as it was. */
    void ExpectRefused(const std::vector<std::string>& arguments, int status,
                       const std::string& message)
    {
        ExpectComplaint(Tool(arguments), status, message);
        EXPECT_EQ(m_before, ReadFile(m_file));
    }

    static Outcome ToolWithInput(const std::vector<std::string>& arguments, const std::string& text)
    {
        std::istringstream in(text);
        std::ostringstream out;
        std::ostringstream err;
        const int status = ::Run(arguments, in, out, err);
        return {status, out.str(), err.str()};
    }

    std::string With(const std::string& from, const std::string& to) const
    {
        std::string text = m_before;
        return text.replace(text.find(from), from.size(), to);
    }
};

} // namespace

TEST_F(KxconfigSetPairs, SetsSeveralKeysWithOneSave)
{
    const Outcome outcome = Tool({"set", m_file, "cfg.net.ip", "b", "cfg.name", "crate"});
    EXPECT_EQ(0, outcome.status);
    EXPECT_EQ("/cfg/name: \"box\" -> \"crate\"\n/cfg/net/ip: \"a\" -> \"b\"\n", outcome.out);
    EXPECT_EQ("", outcome.err);
    EXPECT_EQ("crate\n", Tool({"get", m_file, "cfg.name"}).out);
    EXPECT_EQ("b\n", Tool({"get", m_file, "cfg.net.ip"}).out);
}

TEST_F(KxconfigSetPairs, AppliesPairsInTheirOrderAndReportsTheSum)
{
    EXPECT_EQ("/cfg/name: \"box\" -> \"2\"\n",
              Tool({"set", m_file, "cfg.name", "1", "cfg.name", "2"}).out);
    EXPECT_EQ("nothing changed: the text is already the same\n",
              Tool({"set", m_file, "cfg.name", "1", "cfg.name", "2"}).out);
}

TEST_F(KxconfigSetPairs, SavesNothingUnlessAllPairsApply)
{
    ExpectRefused({"set", m_file, "cfg.name", "crate", "cfg.missing", "x"}, 1,
                  "nothing found: no element of " + m_file +
                      " has text that can be replaced under \"cfg.missing\"");
    ExpectRefused({"set", m_file, "cfg.name", "crate", "cfg.net.ip", "a&b"}, 2,
                  "the new text is not XML text: write & as &amp;");
    ExpectRefused(
        {"set", m_file, "cfg.name", "crate", "cfg", "x"}, 2,
        "malformed key \"cfg\": a key names the root element and at least one more, as in "
        "root.name");
    const std::string copy = m_folder.Path("copy.xml");
    EXPECT_EQ(1,
              Tool({"set", m_file, "cfg.name", "x", "cfg.missing", "x", "--output", copy}).status);
    EXPECT_FALSE(FileExists(copy));
}

TEST_F(KxconfigSetPairs, EachKeyNeedsAValue)
{
    ExpectRefused({"set", m_file, "cfg.name"}, 2,
                  "VALUE is required after the key \"cfg.name\"; a value with spaces needs quotes");
    ExpectRefused(
        {"set", m_file, "cfg.name", "x", "cfg.net.ip"}, 2,
        "VALUE is required after the key \"cfg.net.ip\"; a value with spaces needs quotes");
}

TEST_F(KxconfigSetPairs, ValuesMayStartWithADashAfterTwo)
{
    const std::string changes = "/cfg/name: \"box\" -> \"-1\"\n/cfg/net/ip: \"a\" -> \"-2\"\n";
    EXPECT_EQ(changes,
              Tool({"set", "--dry-run", m_file, "cfg.name", "--", "-1", "cfg.net.ip", "-2"}).out);
    EXPECT_EQ(changes, Tool({"set", "--", m_file, "cfg.name", "-1", "cfg.net.ip", "-2"}).out);
}

TEST_F(KxconfigSetPairs, TakesTheValueFromAFile)
{
    const std::string value = m_folder.Write("value", "one\ntwo &amp;\n");
    EXPECT_EQ("/cfg/name: \"box\" -> \"one\\ntwo &\"\n",
              Tool({"set", m_file, "cfg.name", "--value-from", value}).out);
}

TEST_F(KxconfigSetPairs, TakesTheValueFromStandardInput)
{
    const std::vector<std::string> arguments = {"set", "--value-from", "-", m_file, "cfg.name"};
    EXPECT_EQ("/cfg/name: \"box\" -> \"a\"\n", ToolWithInput(arguments, "a").out);
    EXPECT_EQ("/cfg/name: \"a\" -> \"b\"\n", ToolWithInput(arguments, "b\r\n").out);
    EXPECT_EQ("/cfg/name: \"b\" -> \"c\\n\"\n", ToolWithInput(arguments, "c\n\n").out);
    EXPECT_EQ(2, ToolWithInput(arguments, std::string("d\0e", 3)).status);
    EXPECT_EQ(2, ToolWithInput(arguments, "\x1B").status);
}

TEST_F(KxconfigSetPairs, AValueFromAFileReplacesVALUE)
{
    const std::string value = m_folder.Write("value", "v");
    ExpectRefused({"set", m_file, "cfg.name", "x", "--value-from", value}, 2,
                  "--value-from takes the place of VALUE: give one KEY only");
    ExpectRefused({"set", m_file, "cfg.name", "--value-from", m_folder.Path("none")}, 3,
                  "cannot read \"" + m_folder.Path("none") + "\": No such file or directory");
    EXPECT_EQ(2, Tool({"set", m_file, "cfg.name", "--value-from", ""}).status);
}

TEST_F(KxconfigSetPairs, StandardInputIsNoFileToChange)
{
    EXPECT_THAT(Tool({"set", "-", "cfg.name", "x"}).err, HasSubstr("\"-\" is not a file name"));
}

TEST_F(KxconfigSetPairs, CreatesWhatIsNotThere)
{
    const Outcome outcome = Tool({"set", "--create", m_file, "cfg.net.mask", "24"});
    EXPECT_EQ(0, outcome.status);
    EXPECT_EQ("/cfg/net/mask: added \"24\"\n", outcome.out);
    EXPECT_EQ(With("</ip>\n", "</ip>\n    <mask>24</mask>\n"), ReadFile(m_file));
}

TEST_F(KxconfigSetPairs, CreatesEveryMissingLevel)
{
    EXPECT_EQ(
        "/cfg/log: added \"x\"\n/cfg/log/file: added \"x\"\n/cfg/log/file/path: added \"x\"\n",
        Tool({"set", "--create", m_file, "cfg.log.file.path", "x"}).out);
    EXPECT_EQ(With("</net>\n", "</net>\n  <log><file><path>x</path></file></log>\n"),
              ReadFile(m_file));
    EXPECT_EQ("x\n", Tool({"get", m_file, "cfg.log.file.path"}).out);
}

TEST_F(KxconfigSetPairs, CreateGivesAnEmptyElementTheValue)
{
    const std::string file = m_folder.Write("empty.xml", "<cfg><name/></cfg>");
    EXPECT_EQ("/cfg/name: \"\" -> \"x\"\n", Tool({"set", "--create", file, "cfg.name", "x"}).out);
    EXPECT_EQ(m_declaration + "<cfg><name>x</name></cfg>\n", ReadFile(file));
}

TEST_F(KxconfigSetPairs, CreateOnlyUpdatesWhatIsThere)
{
    EXPECT_EQ("/cfg/name: \"box\" -> \"x\"\n",
              Tool({"set", "--create", m_file, "cfg.name", "x"}).out);
}

TEST_F(KxconfigSetPairs, CreateUpdatesNothingElsewhere)
{
    // Without --create the update would reach the ip of the net.
    EXPECT_EQ("/cfg/ip: added \"x\"\n", Tool({"set", "--create", m_file, "cfg.ip", "x"}).out);
    EXPECT_EQ("a\n", Tool({"get", m_file, "cfg.net.ip"}).out);
}

TEST_F(KxconfigSetPairs, CreateRefusesWhatHasNoOnePlace)
{
    ExpectRefused(
        {"set", "--create", m_file, "cfg.name@id=3", "x"}, 1,
        "nothing found: no element has a value under \"cfg.name@id=3\", and --create makes "
        "none for a key with a condition");
    ExpectRefused({"set", "--create", m_file, "cfg.a b", "x"}, 2,
                  "malformed key \"cfg.a b\": \"a b\" is not the name of an element");
    ExpectRefused({"set", "--create", m_file, "cfg.p:a", "x"}, 2,
                  "malformed key \"cfg.p:a\": \"p:a\" is not the name of an element");
    ExpectRefused({"set", "--create", m_file, "cfg.", "x"}, 2,
                  "malformed key \"cfg.\": \"\" is not the name of an element");
    ExpectRefused({"set", "--create", m_file, "cfg.net", "x"}, 1,
                  "nothing found: the element under \"cfg.net\" has no text that can be replaced: "
                  "it has 3 children: blank text, element ip, blank text");
    const std::string twice = m_folder.Write("twice.xml", "<cfg><net/><net/></cfg>");
    ExpectComplaint(Tool({"set", "--create", twice, "cfg.net.ip", "x"}), 4,
                    "not saved: \"cfg.net.ip\" leads to several elements named \"net\", and has a "
                    "value in none");
}

TEST_F(KxconfigSetPairs, ExpectRefusesAnotherNumberOfChanges)
{
    const std::vector<std::string> set = {"set", m_file, "cfg.name", "x", "cfg.net.ip", "x"};
    const auto with = [&set](const std::string& option)
    {
        std::vector<std::string> arguments = set;
        arguments.push_back(option);
        return arguments;
    };
    ExpectRefused(with("--expect=1"), 4, "not saved: 2 nodes would change, --expect requires 1");
    ExpectRefused({"set", "--expect=0", "--dry-run", m_file, "cfg.name", "x"}, 4,
                  "not saved: 1 node would change, --expect requires 0");
    EXPECT_EQ(2, Tool(with("--expect=-1")).status);
    EXPECT_EQ(2, Tool(with("--expect=x")).status);
    EXPECT_EQ(m_before, ReadFile(m_file));
    EXPECT_EQ(0, Tool(with("--expect=2")).status);
    EXPECT_EQ(0, Tool(with("--expect=0")).status);
}

TEST_F(KxconfigSetPairs, WarnsOfElementsThatGetDoesNotFind)
{
    const std::string file = m_folder.Write(
        "far.xml", "<cfg><ip>1</ip><net><ip>2</ip></net><net><ip>3</ip></net></cfg>");
    EXPECT_EQ("1\n", Tool({"get", file, "cfg.ip"}).out);
    const Outcome outcome = Tool({"set", "--dry-run", file, "cfg.ip", "x"});
    EXPECT_EQ(0, outcome.status);
    EXPECT_EQ("/cfg/ip: \"1\" -> \"x\"\n/cfg/net[1]/ip: \"2\" -> \"x\"\n"
              "/cfg/net[2]/ip: \"3\" -> \"x\"\n",
              outcome.out);
    EXPECT_EQ("kxconfig: warning: \"cfg.ip\" changes 3 elements; get finds 1 of them\n",
              outcome.err);
}

TEST_F(KxconfigSetPairs, WarnsThatAnEmptyTextCannotBeSetAgain)
{
    const Outcome outcome = Tool({"set", m_file, "cfg.name", ""});
    EXPECT_EQ(0, outcome.status);
    EXPECT_EQ("/cfg/name: \"box\" -> \"\"\n", outcome.out);
    EXPECT_EQ("kxconfig: warning: no later set reaches 1 element, which has no plain text any "
              "more\n",
              outcome.err);
    EXPECT_EQ(1, Tool({"set", m_file, "cfg.name", "x"}).status);
}

TEST_F(KxconfigSetPairs, WarningsAreMessagesInJson)
{
    const auto answer = nlohmann::json::parse(Tool({"set", "--json", m_file, "cfg.name", ""}).out);
    EXPECT_EQ(1u, answer["messages"].size());
    EXPECT_THAT(answer["messages"][0].get<std::string>(), StartsWith("warning: "));
    const auto created =
        nlohmann::json::parse(Tool({"set", "--json", "--create", m_file, "cfg.x", "y"}).out);
    EXPECT_TRUE(created["results"][0]["before"].is_null());
    EXPECT_EQ("y", created["results"][0]["after"]);
}

TEST_F(KxconfigSetPairs, QuietPrintsNoChanges)
{
    const Outcome outcome = Tool({"set", "--quiet", m_file, "cfg.name", "x"});
    EXPECT_EQ(0, outcome.status);
    EXPECT_EQ("", outcome.out + outcome.err);
    EXPECT_EQ(With("box", "x"), ReadFile(m_file));
    EXPECT_EQ("", Tool({"set", "--quiet", m_file, "cfg.name", "x"}).out);
    EXPECT_EQ(1, Tool({"set", "--quiet", m_file, "cfg.missing", "x"}).status);
}

TEST_F(KxconfigSetPairs, HelpStatesThatAnUpdateReachesFurther)
{
    EXPECT_THAT(Tool({"set", "--help"}).out, HasSubstr("reach more elements than get finds"));
}

TEST_F(KxconfigSetPairs, RefusesATextThatTheEngineWouldNotLoad)
{
    const std::string most(10000000, 'x');
    EXPECT_EQ(0, Tool({"set", "--quiet", m_file, "cfg.name", most}).status);
    EXPECT_EQ(0, Tool({"get", m_file, "cfg.net.ip"}).status);
    const Outcome outcome = Tool({"set", m_file, "cfg.name", most + "x"});
    EXPECT_EQ(4, outcome.status);
    EXPECT_EQ("kxconfig: not saved: " + m_file +
                  " would no longer load: a text of more than 10,000,000 bytes\n",
              outcome.err);
}

TEST_F(KxconfigSetPairs, RefusesToNestDeeperThanTheEngineLoads)
{
    int refused = 0;
    for (int depth = 250; depth != 260; ++depth)
    {
        std::string xml = "<e/>";
        std::string key = "e";
        for (int level = 1; level != depth; ++level)
        {
            xml = "<e>" + xml + "</e>";
            key += ".e";
        }
        const std::string file = m_folder.Write("deep.xml", xml);
        const int status = Tool({"set", "--create", file, key + ".e", "x"}).status;
        EXPECT_TRUE(status == 0 || status == 3 || status == 4) << status;
        EXPECT_EQ(status == 3, Tool({"find", file, "/e"}).status == 3) << depth;
        refused += status == 4 ? 1 : 0;
    }
    EXPECT_EQ(1, refused); // the deepest that loads
}

TEST_F(KxconfigSetPairs, ReportsTheDifferenceBetweenTheFiles)
{
    const auto texts = [](const std::string& file)
    {
        std::map<std::string, std::string> values;
        const auto found = nlohmann::json::parse(Tool({"--json", "find", file, "//*[not(*)]"}).out);
        for (const auto& result : found["results"])
        {
            const std::string location = result["location"];
            values[location] = result["value"].is_null() ? "" : result["value"].get<std::string>();
        }
        return values;
    };
    const std::vector<std::string> keys = {"cfg.a",     "cfg.a.b",       "cfg.b",   "cfg.a.a",
                                           "cfg.b.a.b", "cfg.a@i=1.b",   "cfg.c.d", "cfg.b@j=1|i=2",
                                           "cfg.a.a.a", "cfg.a@i=2.c.d", "cfg.d"};
    int changes = 0;
    for (unsigned seed = 0; seed != 60; ++seed)
    {
        const std::string file = m_folder.Write("random.xml", RandomDocument(seed).Make());
        const std::string after = m_folder.Path("after.xml");
        const std::string first = keys[seed % keys.size()];
        const std::string second = keys[(seed / 3) % keys.size()];
        const Outcome outcome =
            Tool({"--json", "set", file, first, "n1", second, "n2", "--output", after});
        if (outcome.status != 0)
        {
            continue;
        }
        std::map<std::string, std::string> expected = texts(file);
        const auto answer = nlohmann::json::parse(outcome.out);
        for (const auto& change : answer["results"])
        {
            std::string& text = expected[change["location"].get<std::string>()];
            EXPECT_EQ(change["before"], text);
            text = change["after"].get<std::string>();
            ++changes;
        }
        EXPECT_EQ(expected, texts(after)) << seed;
    }
    EXPECT_GT(changes, 60);
}

TEST_F(KxconfigSetPairs, WarnsOfAllElementsThatLoseTheirText)
{
    const Outcome outcome = Tool({"set", m_file, "cfg.net.ip", "", "cfg.name", ""});
    EXPECT_EQ(0, outcome.status);
    EXPECT_THAT(outcome.err,
                HasSubstr("no later set reaches 2 elements, which have no plain text"));
}

TEST_F(KxconfigSetPairs, AnEmptyFileIsAnEmptyValue)
{
    const std::string empty = m_folder.Write("empty", "");
    EXPECT_EQ("/cfg/name: \"box\" -> \"\"\n",
              Tool({"set", m_file, "cfg.name", "--value-from", empty}).out);
}

TEST_F(KxconfigSetPairs, InputThatBreaksIsReported)
{
    struct Broken : std::streambuf
    {
        int underflow() override { throw std::system_error(EIO, std::generic_category()); }
    };
    Broken broken;
    std::istream in(&broken);
    std::ostringstream out;
    std::ostringstream err;
    EXPECT_EQ(3, ::Run({"set", m_file, "cfg.name", "--value-from", "-"}, in, out, err));
    EXPECT_EQ("kxconfig: cannot read \"-\": Input/output error\n", err.str());
    EXPECT_EQ(m_before, ReadFile(m_file));
    in.clear();
    err.str("");
    EXPECT_EQ(3, ::Run({"get", "-", "cfg.name"}, in, out, err));
    EXPECT_EQ("kxconfig: cannot read -: Input/output error\n", err.str());
}

TEST_F(KxconfigSetPairs, RefusesAnAmpersandWithoutASemicolon)
{
    for (const std::string value : {"a & b", "&lt", "&;", "& ;", "&#;", "&#x;", "&#xg;", "&#1a;"})
    {
        ExpectRefused({"set", m_file, "cfg.name", value}, 2,
                      "the new text is not XML text: write & as &amp;");
    }
}

TEST_F(KxconfigSetPairs, TakesAnEntityThatAnotherFileMayDeclare)
{
    const std::string file =
        m_folder.Write("external.xml", "<!DOCTYPE cfg SYSTEM \"x.dtd\"><cfg><a>1</a></cfg>");
    EXPECT_EQ(0, Tool({"set", file, "cfg.a", "&e;"}).status);
    EXPECT_THAT(ReadFile(file), HasSubstr("<a>&e;</a>"));
}
