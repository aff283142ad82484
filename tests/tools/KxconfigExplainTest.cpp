#include "ToolTest.h"

#include <algorithm>
#include <sstream>

using namespace kxtest;
using testing::HasSubstr;
using testing::Not;

namespace
{

class KxconfigExplain : public ToolTest
{
protected:
    /** The file of most tests. */
    const std::string m_file =
        m_folder.Write("cfg.xml", "<cfg>\n"
                                  "  <net id='1' on='y'><ip>10.0.0.1</ip></net>\n"
                                  "  <net id='2'><ip>10.0.0.2</ip></net>\n"
                                  "  <name>box</name>\n"
                                  "  <net id='3'><ip>10.0.0.3</ip></net>\n"
                                  "</cfg>\n");

    void ExpectExplained(const std::string& key, int status, const std::string& lines) const
    {
        ExpectOutput({"explain", m_file, key}, status, lines);
    }

    void ExpectUpdateExplained(const std::string& key, int status, const std::string& lines) const
    {
        const std::string before = ReadFile(m_file);
        ExpectOutput({"explain", "--set", m_file, key}, status, lines);
        EXPECT_EQ(before, ReadFile(m_file));
    }

    static void ExpectOutput(const std::vector<std::string>& arguments, int status,
                             const std::string& lines)
    {
        const Outcome outcome = Tool(arguments);
        EXPECT_EQ(status, outcome.status);
        EXPECT_EQ(lines, outcome.out);
        EXPECT_EQ("", outcome.err);
    }

    /** @return the line about the element a of a document with this root content. */
    std::string LineAboutA(const std::string& content) const
    {
        const std::string file =
            m_folder.Write("a.xml", "<!DOCTYPE cfg [<!ENTITY e 'x'>]><cfg>" + content + "</cfg>");
        std::istringstream lines(Tool({"explain", file, "cfg.a"}).out);
        std::string line;
        while (std::getline(lines, line) && line.find(": a: ") == std::string::npos)
        {
        }
        return line;
    }
};

const std::string kRoot = "line 1: /cfg: the key starts with the root's name\n";

} // namespace

TEST_F(KxconfigExplain, ExplainsLevelByLevelWhatWasComparedWithWhat)
{
    ExpectExplained("cfg.net@id=1|id=2.ip", 0,
                    kRoot + "below /cfg: looking for \"net@id=1|id=2\"\n"
                            "  line 2: net[1]: accepted: id is \"1\"; or id is \"1\", not \"2\"\n"
                            "    below net[1]: looking for \"ip\"\n"
                            "      line 2: ip: accepted; value \"10.0.0.1\"\n"
                            "  line 3: net[2]: accepted: id is \"2\", not \"1\"; or id is \"2\"\n"
                            "    below net[2]: looking for \"ip\"\n"
                            "      line 3: ip: accepted; value \"10.0.0.2\"\n"
                            "  line 4: name: not named \"net\"; suspends the condition for the "
                            "next element of that name\n"
                            "  line 5: net[3]: accepted by name alone: name (line 4) "
                            "suspended the condition \"id=1|id=2\", which it does not fulfill\n"
                            "    below net[3]: looking for \"ip\"\n"
                            "      line 5: ip: accepted; value \"10.0.0.3\"\n"
                            "GetValue(key): \"10.0.0.1\\n10.0.0.2\\n10.0.0.3\"\n"
                            "GetValue(key, value): status 0 (success), value "
                            "\"10.0.0.1\\n10.0.0.2\\n10.0.0.3\"\n");
}

TEST_F(KxconfigExplain, ExplainsEachTermUntilOneRejects)
{
    const Outcome outcome = Tool({"explain", m_file, "cfg.net@on=y&id=9&x=1.ip"});
    EXPECT_EQ(0, outcome.status); // the third net is taken by its name alone
    EXPECT_THAT(outcome.out, HasSubstr("  line 2: net[1]: rejected: on is \"y\"; and id is "
                                       "\"1\", not \"9\"\n"));
    EXPECT_THAT(outcome.out, HasSubstr("  line 3: net[2]: rejected: on is absent, not \"y\"\n"));
}

TEST_F(KxconfigExplain, ExplainsThatAnAmpersandAheadOfABarIsPartOfTheValue)
{
    EXPECT_THAT(Tool({"explain", m_file, "cfg.net@id=1&on=y|id=2.ip"}).out,
                HasSubstr("  line 2: net[1]: rejected: id is \"1\", not \"1&on=y\" (\"&\" "
                          "before \"|\" is part of the value); or id is \"1\", not \"2\"\n"));
}

TEST_F(KxconfigExplain, ExplainsATermThatNamesNoAttribute)
{
    EXPECT_THAT(
        Tool({"explain", m_file, "cfg.net@id.ip"}).out,
        HasSubstr("  line 2: net[1]: rejected: a term without an attribute name is never true\n"));
}

TEST_F(KxconfigExplain, ExplainsThatASuspendedConditionWouldHaveHeld)
{
    EXPECT_THAT(Tool({"explain", m_file, "cfg.net@id=3.ip"}).out,
                HasSubstr("suspended the condition \"id=3\", which it fulfills anyway\n"));
}

TEST_F(KxconfigExplain, ExplainsWhyAnAcceptedElementHasNoValue)
{
    EXPECT_EQ("  line 1: a: accepted; value \"x\"", LineAboutA("<a>x</a>"));
    EXPECT_EQ("  line 1: a: accepted; no value: it is empty", LineAboutA("<a/>"));
    EXPECT_EQ("  line 1: a: accepted; no value: its only child is not text: CDATA section",
              LineAboutA("<a><![CDATA[x]]></a>"));
    EXPECT_EQ("  line 1: a: accepted; no value: its only child is not text: entity reference "
              "&e;",
              LineAboutA("<a>&e;</a>"));
    EXPECT_EQ("  line 1: a: accepted; no value: it has 3 children: text, comment, text",
              LineAboutA("<a>x<!-- c -->y</a>"));
    EXPECT_EQ("  line 1: a: accepted; no value: it has 7 children: blank text, element b, "
              "blank text, element b, blank text, ...",
              LineAboutA("<a> <b/> <b/> <b/> </a>"));
    EXPECT_EQ("  line 1: a: accepted; no value: it has 2 children: processing instruction, "
              "text",
              LineAboutA("<a><?p?>x</a>"));
}

TEST_F(KxconfigExplain, SummarisesElementsThatAreAlike)
{
    std::string xml = "<cfg>";
    for (int i = 0; i != 1000; ++i)
    {
        xml += "<x i='" + std::to_string(i) + "'/>";
    }
    const std::string file = m_folder.Write("many.xml", xml + "<y/><a>1</a><z/><z/></cfg>");
    ExpectOutput({"explain", file, "cfg.a"}, 0,
                 kRoot + "below /cfg: looking for \"a\"\n"
                         "  line 1: x[1]: not named \"a\"\n"
                         "  ... 1000 more elements of other names\n"
                         "  line 1: a: accepted; value \"1\"\n"
                         "  line 1: z[1]: not named \"a\"\n"
                         "  line 1: z[2]: not named \"a\"\n"
                         "GetValue(key): \"1\"\n"
                         "GetValue(key, value): status 0 (success), value \"1\"\n");
    EXPECT_THAT(Tool({"explain", file, "cfg.x@i=-"}).out,
                HasSubstr("  line 1: x[1]: rejected: i is \"0\", not \"-\"\n"
                          "  ... 999 more elements that the condition rejects\n"
                          "  line 1: y: not named \"x\"; suspends"));
    const std::string same = m_folder.Write("same.xml", xml + "</cfg>");
    EXPECT_THAT(Tool({"explain", same, "cfg.a"}).out,
                HasSubstr("  ... 999 more elements named x\n"));
}

TEST_F(KxconfigExplain, ExplainsThatAForeignRootCountsAsSuccess)
{
    ExpectExplained("other.name", 1,
                    "line 1: /cfg: the key starts with \"other\", not with the root's name "
                    "\"cfg\": nothing is searched, which counts as success\n"
                    "GetValue(key): \"\"\n"
                    "GetValue(key, value): status 0 (success), value \"\"\n");
}

TEST_F(KxconfigExplain, ExplainsKeysThatNameNothing)
{
    ExpectExplained("cfg", 2,
                    "line 1: /cfg: the key \"cfg\" has no \".\", so nothing is searched\n"
                    "GetValue(key): \"\"\n"
                    "GetValue(key, value): status 7 (malformed key), value \"\"\n");
    ExpectExplained("", 2,
                    "line 1: /cfg: the key is empty, so nothing is searched\n"
                    "GetValue(key): \"\"\n"
                    "GetValue(key, value): status 22 (missing object or empty key), value \"\"\n");
    ExpectExplained("cfg.", 1,
                    kRoot + "below /cfg: the key ends in \".\", so nothing is searched\n"
                            "GetValue(key): \"\"\n"
                            "GetValue(key, value): status -2 (nothing found), value \"\"\n");
    ExpectExplained("cfg.name.x", 0,
                    kRoot + "below /cfg: looking for \"name\"\n"
                            "  line 2: net[1]: not named \"name\"\n"
                            "  line 3: net[2]: not named \"name\"\n"
                            "  line 4: name: accepted; value \"box\"\n"
                            "    below name: there is no element\n"
                            "  line 5: net[3]: not named \"name\"\n"
                            "GetValue(key): \"box\"\n"
                            "GetValue(key, value): status 0 (success), value \"box\"\n");
}

TEST_F(KxconfigExplain, AgreesWithGet)
{
    for (const std::string key :
         {"gateway.name", "gateway.network.interface.address", "gateway.network.dns.server",
          "gateway.channels.channel@id=1|id=2.limit@level=alarm", "gateway.missing", "gateway.log",
          "gateway.network.interface@name=eth1.address", "other.name", "gateway"})
    {
        const Outcome explained = Tool({"explain", kGateway, key});
        const Outcome got = Tool({"get", kGateway, key});
        EXPECT_EQ(got.status, explained.status) << key;
        // Each value of the narrative stands on a line of what get prints, in this order.
        std::istringstream lines(explained.out);
        std::string values;
        const std::string mark = "; value \"";
        for (std::string line; std::getline(lines, line);)
        {
            const auto at = line.find(mark);
            const auto start = at + mark.size();
            values +=
                at == std::string::npos ? "" : line.substr(start, line.size() - start - 1) + "\n";
        }
        EXPECT_EQ(got.out, values) << key;
    }
}

TEST_F(KxconfigExplain, EndsWithTheStatusOfGetAndSet)
{
    // Of keys that end in a dot the last elements are found, and the library answers an error.
    const std::string file =
        m_folder.Write("small.xml", "<cfg><a>1</a><b i='1'><c>2</c><c/></b></cfg>");
    for (const std::string key :
         {"cfg.a", "cfg.a.", "cfg.b", "cfg.b.", "cfg.b.c", "cfg.b.c.", "cfg.b@i=1.c.",
          "cfg.b@i=2.c", "cfg.c.", "cfg..", "cfg.", "cfg", "", ".", "other.a", "other.a."})
    {
        EXPECT_EQ(Tool({"get", file, key}).status, Tool({"explain", file, key}).status) << key;
        EXPECT_EQ(Tool({"set", "--dry-run", file, key, "x"}).status,
                  Tool({"explain", "--set", file, key}).status)
            << key;
    }
}

TEST_F(KxconfigExplain, UpdateByAKeyThatEndsInADotIsBadUsage)
{
    const std::string file = m_folder.Write("dot.xml", "<cfg><a>1</a></cfg>");
    EXPECT_EQ(2, Tool({"explain", "--set", file, "cfg.a."}).status);
}

TEST_F(KxconfigExplain, ExplainsWhatAnUpdateReaches)
{
    ExpectUpdateExplained(
        "cfg.net@id=2.ip", 0,
        kRoot + "below /cfg: looking first for \"net@id=2\"\n"
                "  line 2: net[1]: rejected: id is \"1\", not \"2\"; skipped with everything "
                "below it\n"
                "  line 3: net[2]: accepted as \"net@id=2\": id is \"2\"; no text to replace: its "
                "only child is not text: element ip\n"
                "    below net[2]: looking first for \"ip\"\n"
                "      line 3: ip: accepted as \"ip\"; its text \"10.0.0.2\" is replaced\n"
                "  line 4: name: not \"ip\"\n"
                "  line 5: net[3]: not \"ip\"\n"
                "    below net[3]: looking first for \"ip\"\n"
                "      line 5: ip: accepted as \"ip\"; its text \"10.0.0.3\" is replaced\n"
                "SetValue(key, value): status 0 (success)\n");
}

TEST_F(KxconfigExplain, ExplainsThatAnUpdateLosesTheLastSegmentAfterARejection)
{
    const Outcome outcome = Tool({"explain", "--set", m_file, "cfg.net@id=2"});
    EXPECT_EQ(1, outcome.status);
    EXPECT_THAT(outcome.out, HasSubstr("  line 3: net[2]: not \"\"\n"));
    EXPECT_THAT(outcome.out, HasSubstr("SetValue(key, value): status -2 (nothing found)\n"));
}

TEST_F(KxconfigExplain, ExplainsThatAnUpdateIgnoresAForeignRootAndATrailingDot)
{
    EXPECT_THAT(Tool({"explain", "--set", m_file, "other.name"}).out,
                HasSubstr("which counts as success\nSetValue(key, value): status 0 (success)\n"));
    ExpectUpdateExplained("cfg.", 1,
                          kRoot + "below /cfg: the key ends in \".\", so nothing is searched\n"
                                  "SetValue(key, value): status -2 (nothing found)\n");
}

TEST_F(KxconfigExplain, NamesTheElementsThatSetChanges)
{
    for (const std::string key : {"cfg.ip", "cfg.net.ip", "cfg.name", "cfg.net@id=2.ip"})
    {
        const std::string explained = Tool({"explain", "--set", m_file, key}).out;
        std::istringstream changes(Tool({"set", "--dry-run", m_file, key, "new"}).out);
        long count = 0;
        for (std::string line; std::getline(changes, line); ++count)
        {
            const std::string location = line.substr(0, line.find(':'));
            const std::string step = location.substr(location.rfind('/') + 1);
            EXPECT_THAT(explained, HasSubstr(": " + step + ": accepted"));
        }
        long replaced = 0;
        for (auto at = explained.find(" is replaced\n"); at != std::string::npos;
             at = explained.find(" is replaced\n", at + 1))
        {
            ++replaced;
        }
        EXPECT_EQ(count, replaced) << key;
    }
}

TEST_F(KxconfigExplain, SaysWhereTheEngineStopsCountingLines)
{
    const std::string file = m_folder.Write("long.xml", "<cfg>" + std::string(65533, '\n') +
                                                            "<a>1</a>\n<a>2</a>\n</cfg>");
    for (const std::string update : {"", "--set"})
    {
        std::vector<std::string> arguments = {"explain", file, "cfg.a"};
        arguments.insert(arguments.end(), update.empty() ? 0 : 1, update);
        const std::string explained = Tool(arguments).out;
        EXPECT_THAT(explained, HasSubstr("  line 65534: a[1]: accepted"));
        EXPECT_THAT(explained, HasSubstr("  line 65535 or later: a[2]: accepted"));
    }
}

TEST_F(KxconfigExplain, SaysWhyAFileCannotBeRead)
{
    const std::string missing = m_folder.Path("missing.xml");
    ExpectComplaint(Tool({"explain", missing, "a.b"}), 3,
                    "cannot read " + missing + ": No such file or directory");
}

TEST_F(KxconfigExplain, ShowsTheRecordsOfTheLibrarysOwnRunOnly)
{
    const Outcome outcome = ToolProcess({"explain", "--log-mask", "value", m_file, "cfg.name"});
    EXPECT_EQ(4, std::count(outcome.err.begin(), outcome.err.end(), '\n')) << outcome.err;
    EXPECT_THAT(outcome.out, Not(HasSubstr("Key is")));
}

TEST_F(KxconfigExplain, PrintsAtMostAHundredTimesTheFile)
{
    // Every element is accepted, and so is a line of its own; a path is 250 steps long.
    std::string key = "a";
    std::string before;
    std::string after;
    for (int i = 0; i != 250; ++i)
    {
        key += ".a";
        before += "<a>";
        after += "</a>";
    }
    std::string xml = before;
    for (int i = 0; i != 1000; ++i)
    {
        xml += "<a/>";
    }
    const std::string file = m_folder.Write("deep.xml", xml + after);
    const Outcome lookup = Tool({"explain", file, key});
    EXPECT_EQ(1, lookup.status);
    EXPECT_THAT(lookup.out, HasSubstr("line 1: a[1000]: accepted; no value: it is empty\n"));
    EXPECT_LT(lookup.out.size(), 100 * xml.size());
    EXPECT_LT(Tool({"explain", "--set", file, key}).out.size(), 100 * xml.size());
    EXPECT_LT(Tool({"--json", "explain", file, key}).out.size(), 200 * xml.size());
}

TEST_F(KxconfigExplain, JsonHasTheRunsAndTheVerdictsOfTheText)
{
    const std::string file =
        m_folder.Write("a.xml", "<cfg><a/><b/><c/><d/><x i='1'>v</x><x i='2'>w</x></cfg>");
    const Outcome outcome = Tool({"--json", "explain", file, "cfg.x@i=1"});
    EXPECT_THAT(outcome.out, HasSubstr("\"event\": \"more\",\n      \"count\": 3,\n"
                                       "      \"what\": \"elements of other names\""));
    EXPECT_THAT(outcome.out, HasSubstr("\"verdict\": \"accepted by name alone\""));
    EXPECT_THAT(outcome.out, HasSubstr("\"verdict\": \"rejected\""));
}

TEST_F(KxconfigExplain, ColorsTheVerdictsIfItIsAskedTo)
{
    const Outcome outcome =
        Tool({"--color", "always", "explain", m_file, "cfg.net@id=1.ip"}, {"TERM=dumb"});
    EXPECT_THAT(outcome.out, HasSubstr(": \x1B[32maccepted\x1B[0m: id is \"1\"\n"));
    EXPECT_THAT(outcome.out, HasSubstr(": \x1B[31mrejected\x1B[0m: id is \"2\", not \"1\"\n"));
    EXPECT_THAT(outcome.out, HasSubstr(": \x1B[2mnot named \"net\""));
    EXPECT_THAT(outcome.out, HasSubstr("; value \x1B[32m\"10.0.0.1\"\x1B[0m\n"));
    EXPECT_EQ("\x1B[31mkxconfig:\x1B[0m nothing found: no element of " + m_file +
                  " has a value under \"cfg.x\"\n",
              Tool({"--color", "always", "get", m_file, "cfg.x"}).err);
}

TEST_F(KxconfigExplain, ANameWithANulIsOfNoAttribute)
{
    const std::string key = std::string("cfg.net@i") + '\0' + "d=1.ip";
    EXPECT_THAT(Tool({"explain", m_file, key}).out, HasSubstr("rejected: i\\x00d is absent"));
}
