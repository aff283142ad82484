#include "ToolTest.h"

#include <nlohmann/json.hpp>

using namespace kxtest;

namespace
{

/** The commands that change nodes by XPath: set --node, add and remove. */
class KxconfigNodes : public ToolTest
{
protected:
    const std::string m_before = "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n"
                                 "<cfg>\n"
                                 "    <!-- keep -->\n"
                                 "    <name><![CDATA[box]]></name>\n"
                                 "    <net id=\"1\">\n"
                                 "        <ip>a</ip>\n"
                                 "    </net>\n"
                                 "    <net id=\"2\"><ip>b</ip></net>\n"
                                 "</cfg>\n";
    const std::string m_file = m_folder.Write("cfg.xml", m_before);

    std::string With(const std::string& from, const std::string& to) const
    {
        std::string text = m_before;
        return text.replace(text.find(from), from.size(), to);
    }

    /** Expects success, the report, and the file with only @p from replaced by @p to. */
    void ExpectChange(const std::vector<std::string>& arguments, const std::string& report,
                      const std::string& from, const std::string& to)
    {
        const Outcome outcome = Tool(arguments);
        EXPECT_EQ(0, outcome.status);
        EXPECT_EQ("", outcome.err);
        EXPECT_EQ(report, outcome.out);
        EXPECT_EQ(With(from, to), ReadFile(m_file));
        WriteFile(m_file, m_before);
    }

    void ExpectRefused(const std::vector<std::string>& arguments, int status,
                       const std::string& message)
    {
        ExpectComplaint(Tool(arguments), status, message);
        EXPECT_EQ(m_before, ReadFile(m_file));
    }
};

} // namespace

TEST_F(KxconfigNodes, SetsOneElementOnly)
{
    ExpectChange({"set", "--node", m_file, "/cfg/net[2]/ip", "x &amp; y"},
                 "/cfg/net[2]/ip: \"b\" -> \"x & y\"\n", "<ip>b</ip>", "<ip>x &amp; y</ip>");
}

TEST_F(KxconfigNodes, SetsWhatHasNoPlainText)
{
    ExpectChange({"set", "--node", m_file, "/cfg/name", "crate"},
                 "/cfg/name: \"box\" -> \"crate\"\n", "<![CDATA[box]]>", "crate");
}

TEST_F(KxconfigNodes, SetsAnAttribute)
{
    ExpectChange({"set", "--node", m_file, "//net[ip='a']/@id", "&lt;7"},
                 "/cfg/net[1]/@id: \"1\" -> \"<7\"\n", "id=\"1\"", "id=\"&lt;7\"");
    ExpectChange({"set", "--node", m_file, "//net[ip='a']/@id", ""},
                 "/cfg/net[1]/@id: \"1\" -> \"\"\n", "id=\"1\"", "id=\"\"");
}

TEST_F(KxconfigNodes, SetsAllThatIsSelectedIfAsked)
{
    ExpectRefused({"set", "--node", m_file, "//ip", "x"}, 4,
                  "not saved: \"//ip\" selects 2 nodes; --all changes them all");
    EXPECT_EQ("/cfg/net[1]/ip: \"a\" -> \"x\"\n/cfg/net[2]/ip: \"b\" -> \"x\"\n",
              Tool({"set", "--node", "--all", m_file, "//ip", "x"}).out);
}

TEST_F(KxconfigNodes, SetsAllOfMoreThan255Nodes)
{
    std::string xml;
    for (int i = 0; i != 300; ++i)
    {
        xml += "<a>1</a>";
    }
    const std::string file = m_folder.Write("many.xml", "<r>" + xml + "</r>");
    EXPECT_EQ(0, Tool({"set", "--node", "--all", "--expect=300", file, "//a", "2"}).status);
}

TEST_F(KxconfigNodes, SetsSeveralExpressionsOrNone)
{
    EXPECT_EQ("/cfg/name: \"box\" -> \"1\"\n/cfg/net[1]/ip: \"a\" -> \"2\"\n",
              Tool({"set", "--node", "--dry-run", m_file, "//name", "1", "//net[1]/ip", "2"}).out);
    ExpectRefused({"set", "--node", m_file, "//name", "1", "//missing", "2"}, 1,
                  "nothing found: \"//missing\" selects no node of " + m_file);
}

TEST_F(KxconfigNodes, SetRefusesWhatItWouldDestroy)
{
    ExpectRefused({"set", "--node", m_file, "//net[1]", "x"}, 4,
                  "not saved: \"//net[1]\" selects an element with elements in it, which would be "
                  "removed");
    ExpectRefused({"set", "--node", m_file, "//comment()", "x"}, 2,
                  "\"//comment()\" selects a comment; --node changes elements and attributes");
    ExpectRefused({"set", "--node", m_file, "/", "x"}, 2,
                  "\"/\" selects the document; --node changes elements and attributes");
    ExpectRefused({"set", "--node", m_file, "/cfg/namespace::*", "x"}, 2,
                  "\"/cfg/namespace::*\" selects a namespace declaration, which cannot be changed");
    ExpectRefused({"set", "--node", m_file, "count(//ip)", "x"}, 2,
                  "\"count(//ip)\" selects no nodes: it is a value");
    ExpectRefused({"set", "--node", m_file, "//name", "a&b"}, 2,
                  "the new text is not XML text: write & as &amp;");
    EXPECT_EQ(2, Tool({"set", "--node", m_file, "//name[", "x"}).status);
    EXPECT_EQ(2, Tool({"set", "--all", m_file, "cfg.name", "x"}).status);
    EXPECT_EQ(2, Tool({"set", "--node", "--create", m_file, "//name", "x"}).status);
    EXPECT_EQ(2, Tool({"set", "--node", m_file, "//name", "&nowhere;"}).status);
    EXPECT_EQ(m_before, ReadFile(m_file));
}

TEST_F(KxconfigNodes, AddsAChildIndentedLikeTheOthers)
{
    ExpectChange({"add", m_file, "//net[@id=1]", "mask", "24"}, "/cfg/net[1]/mask: added \"24\"\n",
                 "<ip>a</ip>\n", "<ip>a</ip>\n        <mask>24</mask>\n");
    ExpectChange({"add", m_file, "//net[@id=2]", "mask"}, "/cfg/net[2]/mask: added \"\"\n",
                 "<ip>b</ip>", "<ip>b</ip><mask/>");
}

TEST_F(KxconfigNodes, AddsASiblingRightAfterAnElement)
{
    ExpectChange({"add", "--after", m_file, "/cfg/name", "place", "a &lt; b"},
                 "/cfg/place: added \"a < b\"\n", "</name>\n",
                 "</name>\n    <place>a &lt; b</place>\n");
    ExpectRefused({"add", "--after", m_file, "/cfg", "x"}, 4,
                  "not saved: a document has one root element, and no other after it");
}

TEST_F(KxconfigNodes, AddsToTheNamespaceOfTheParent)
{
    const std::string file =
        m_folder.Write("space.xml", "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n"
                                    "<p:cfg xmlns:p=\"urn:p\"><a xmlns=\"urn:a\"/></p:cfg>\n");
    EXPECT_EQ(0, Tool({"add", file, "/*", "b"}).status);
    EXPECT_EQ(0, Tool({"add", file, "/*/*[1]", "c"}).status);
    EXPECT_EQ("<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n"
              "<p:cfg xmlns:p=\"urn:p\"><a xmlns=\"urn:a\"><c/></a><p:b/></p:cfg>\n",
              ReadFile(file));
}

TEST_F(KxconfigNodes, AddsAnAttribute)
{
    ExpectChange({"add", "--attribute", m_file, "/cfg/name", "lang", "&quot;&#65;"},
                 "/cfg/name/@lang: added \"\\\"A\"\n", "<name>", "<name lang=\"&quot;A\">");
    ExpectChange({"add", "--attribute", m_file, "/cfg/name", "lang"},
                 "/cfg/name/@lang: added \"\"\n", "<name>", "<name lang=\"\">");
    ExpectRefused({"add", "--attribute", "--all", m_file, "//net", "id", "3"}, 4,
                  "not saved: /cfg/net[1] has an attribute \"id\" already");
}

TEST_F(KxconfigNodes, AddRefusesWhatCannotBeSaved)
{
    ExpectRefused({"add", m_file, "/cfg", "a b"}, 2,
                  "\"a b\" is not a name without a prefix, as elements and attributes get it");
    ExpectRefused({"add", m_file, "/cfg", "p:a"}, 2,
                  "\"p:a\" is not a name without a prefix, as elements and attributes get it");
    ExpectRefused({"add", "--attribute", m_file, "/cfg", "xmlns", "urn:a"}, 2,
                  "\"xmlns\" declares a namespace, and is no attribute");
    ExpectRefused({"add", m_file, "/cfg/net", "a"}, 4,
                  "not saved: \"/cfg/net\" selects 2 nodes; --all changes them all");
    ExpectRefused({"add", m_file, "//@id[.=1]", "a"}, 2,
                  "\"//@id[.=1]\" selects an attribute; add needs an element");
    ExpectRefused({"add", m_file, "/cfg", "a", "x&y"}, 2,
                  "the new text is not XML text: write & as &amp;");
    EXPECT_EQ(2, Tool({"add", m_file, "/cfg", "a", "&nowhere;"}).status);
    EXPECT_EQ(2, Tool({"add", "--after", "--attribute", m_file, "/cfg/name", "a"}).status);
    EXPECT_EQ(2, Tool({"add", "-", "/cfg", "a"}).status);
    EXPECT_EQ(m_before, ReadFile(m_file));
}

TEST_F(KxconfigNodes, RemovesAnElementWithItsLine)
{
    ExpectChange({"remove", m_file, "/cfg/name"}, "/cfg/name: removed \"box\"\n",
                 "    <name><![CDATA[box]]></name>\n", "");
    ExpectChange({"remove", m_file, "//net[@id=2]/ip"}, "/cfg/net[2]/ip: removed \"b\"\n",
                 "<net id=\"2\"><ip>b</ip></net>", "<net id=\"2\"/>");
}

TEST_F(KxconfigNodes, RemovesAttributesAndComments)
{
    ExpectChange({"remove", m_file, "//net[1]/@id"}, "/cfg/net[1]/@id: removed \"1\"\n",
                 " id=\"1\"", "");
    ExpectChange({"remove", m_file, "//comment()"}, "/cfg/comment(): removed \" keep \"\n",
                 "    <!-- keep -->\n", "");
}

TEST_F(KxconfigNodes, LocationsThatFindPrintsSelectTheSameNodes)
{
    const std::string file = m_folder.Write("blanks.xml", "<cfg> <a/>one<a/>\n<a/>two</cfg>\n");
    EXPECT_EQ("/cfg/text()[1] text \" \"\n"
              "/cfg/text()[2] text \"one\"\n"
              "/cfg/text()[3] text \"\\n\"\n"
              "/cfg/text()[4] text \"two\"\n",
              Tool({"find", file, "//text()"}).out);
    EXPECT_EQ("/cfg/text()[2]: removed \"one\"\n", Tool({"remove", file, "/cfg/text()[2]"}).out);
}

TEST_F(KxconfigNodes, RemovesAllOnceAndWhatIsBelowWithIt)
{
    EXPECT_EQ(4, Tool({"remove", m_file, "//net"}).status);
    const Outcome outcome = Tool({"remove", "--all", m_file, "//net | //net//node() | //net/@id"});
    EXPECT_EQ(0, outcome.status);
    EXPECT_EQ("/cfg/net[1]: removed \"\\n        a\\n    \"\n/cfg/net[2]: removed \"b\"\n",
              outcome.out);
    EXPECT_EQ("<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n<cfg>\n    <!-- keep -->\n"
              "    <name><![CDATA[box]]></name>\n</cfg>\n",
              ReadFile(m_file));
    EXPECT_EQ(0, Tool({"remove", "--all", m_file, "/cfg/node()"}).status);
}

TEST_F(KxconfigNodes, RemoveKeepsTheDocument)
{
    ExpectRefused(
        {"remove", m_file, "/cfg"}, 4,
        "not saved: \"/cfg\" selects the root element, without which there is no document");
    ExpectRefused({"remove", m_file, "/"}, 4,
                  "not saved: \"/\" selects the document, without which there is no document");
    ExpectRefused({"remove", m_file, "//missing"}, 1,
                  "nothing found: \"//missing\" selects no node of " + m_file);
}

TEST_F(KxconfigNodes, TakeTheOptionsOfEverySave)
{
    EXPECT_EQ(0, Tool({"add", "--dry-run", m_file, "/cfg", "a"}).status);
    EXPECT_EQ(4, Tool({"remove", "--expect=2", m_file, "//name"}).status);
    EXPECT_EQ(m_before, ReadFile(m_file));
    EXPECT_EQ("--- " + m_file + "\n+++ " + m_file +
                  "\n@@ -1,7 +1,6 @@\n <?xml version=\"1.0\" encoding=\"UTF-8\"?>\n <cfg>\n"
                  "     <!-- keep -->\n-    <name><![CDATA[box]]></name>\n"
                  "     <net id=\"1\">\n         <ip>a</ip>\n     </net>\n",
              Tool({"remove", "--diff", "--quiet", "--backup", m_file, "//name"}).out);
    EXPECT_EQ(m_before, ReadFile(m_file + "~"));
    const auto answer =
        nlohmann::json::parse(Tool({"--json", "add", m_file, "/cfg", "a", "b"}).out);
    EXPECT_EQ("add", answer["verb"]);
    EXPECT_EQ(nlohmann::json({{"location", "/cfg/a"}, {"before", nullptr}, {"after", "b"}}),
              answer["results"][0]);
}

TEST_F(KxconfigNodes, RemovesANodeAndTheLineBeforeItOnce)
{
    const Outcome outcome =
        Tool({"remove", "--all", "--quiet", m_file, "/cfg/comment()|/cfg/text()[1]"});
    EXPECT_EQ("", outcome.err);
    EXPECT_EQ(0, outcome.status);
    EXPECT_EQ(With("\n    <!-- keep -->", ""), ReadFile(m_file));
}

TEST_F(KxconfigNodes, AddsAnAttributeThatOnlyHasADefault)
{
    const std::string file =
        m_folder.Write("dtd.xml", "<!DOCTYPE cfg [<!ATTLIST cfg a CDATA 'x'>]><cfg/>");
    EXPECT_EQ(0, Tool({"add", "--attribute", file, "/cfg", "a", "y"}).status);
    EXPECT_THAT(ReadFile(file), testing::HasSubstr("<cfg a=\"y\"/>"));
}

TEST_F(KxconfigNodes, NamesTheKindThatItCannotChange)
{
    const std::string file =
        m_folder.Write("k.xml", "<a><?pi x?><!--c-->t<b><![CDATA[d]]></b></a>");
    const std::vector<std::pair<std::string, std::string>> kinds = {
        {"/a/text()", "a text"},
        {"/a/b/text()", "a text"},
        {"/a/comment()", "a comment"},
        {"//processing-instruction()", "a processing instruction"},
        {"/", "the document"}};
    for (const auto& [expression, kind] : kinds)
    {
        ExpectComplaint(Tool({"set", "--node", file, expression, "x"}), 2,
                        "\"" + expression + "\" selects " + kind +
                            "; --node changes elements and attributes");
        ExpectComplaint(Tool({"add", file, expression, "n", "x"}), 2,
                        "\"" + expression + "\" selects " + kind + "; add needs an element");
    }
}

TEST_F(KxconfigNodes, ReportsANodeThatTwoPairsSetOnce)
{
    const Outcome outcome = Tool({"set", "--node", m_file, "//net[2]/ip", "x", "//net[2]/ip", "y"});
    EXPECT_EQ("/cfg/net[2]/ip: \"b\" -> \"y\"\n", outcome.out);
}

TEST_F(KxconfigNodes, SettingTheSameTextChangesNothing)
{
    EXPECT_EQ("nothing changed: the text is already the same\n",
              Tool({"set", "--node", m_file, "//net[2]/ip", "b"}).out);
    EXPECT_EQ(m_before, ReadFile(m_file));
}

TEST_F(KxconfigNodes, OnlyALineOfItsOwnIsRemovedWithANode)
{
    const std::string before =
        m_before.substr(0, m_before.find('\n') + 1) + "<cfg><a/> <b/>x<c/>y\n<d/>\n<e/>z</cfg>\n";
    const auto expect = [&](const std::string& node, const std::string& tag)
    {
        WriteFile(m_file, before);
        EXPECT_EQ(0, Tool({"remove", m_file, node}).status);
        std::string after = before;
        EXPECT_EQ(after.erase(after.find(tag), tag.size()), ReadFile(m_file));
    };
    expect("/cfg/a", "<a/>");
    expect("/cfg/b", "<b/>");
    expect("/cfg/c", "<c/>");
    expect("/cfg/d", "<d/>");
    expect("/cfg/e", "<e/>");
}

TEST_F(KxconfigNodes, AnElementIsAddedOnALineOnlyWhereTheOneBeforeIsOnOne)
{
    const std::string start = m_before.substr(0, m_before.find('\n') + 1);
    const auto expect = [&](const std::string& before, const std::vector<std::string>& options,
                            const std::string& after)
    {
        WriteFile(m_file, start + before);
        std::vector<std::string> add = {"add", m_file};
        add.insert(add.end(), options.begin(), options.end());
        EXPECT_EQ(0, Tool(add).status);
        EXPECT_EQ(start + after, ReadFile(m_file));
    };
    expect("<cfg><a/></cfg>\n", {"/cfg/a", "b", "--after"}, "<cfg><a/><b/></cfg>\n");
    expect("<cfg>\n <!--c-->\n</cfg>\n", {"/cfg", "b"}, "<cfg>\n <!--c-->\n<b/></cfg>\n");
    expect("<cfg>\n <a/>\n</cfg>\n", {"/cfg", "b"}, "<cfg>\n <a/>\n <b/>\n</cfg>\n");
}
