#include "RandomDocument.h"
#include "ToolTest.h"

#include "CXMLWriter.h"

#include <nlohmann/json.hpp>

#include <algorithm>
#include <map>
#include <sstream>

using namespace kxtest;
using testing::HasSubstr;

namespace
{

class KxconfigCheck : public ToolTest
{
protected:
    std::string m_file;

    /** Writes a file that begins with the declaration, so that its content starts on line 2. */
    void Write(const std::string& xml)
    {
        m_file = m_folder.Write("cfg.xml", kDeclaration + xml + "\n");
    }

    /** Expects these warnings, given as "LINE: TEXT", and no others. */
    void ExpectWarnings(const std::vector<std::string>& warnings,
                        const std::vector<std::string>& keys = {}) const
    {
        ExpectFindings(warnings, {}, keys);
        EXPECT_EQ(warnings.empty() ? 0 : 1, Check({}, keys).status);
    }

    /** The same for warnings and notes. */
    void ExpectWarningsAndNotes(const std::vector<std::string>& findings,
                                const std::vector<std::string>& keys = {}) const
    {
        ExpectFindings(findings, {"--notes"}, keys);
    }

    Outcome Check(const std::vector<std::string>& options,
                  const std::vector<std::string>& keys = {}) const
    {
        std::vector<std::string> arguments = {"check"};
        arguments.insert(arguments.end(), options.begin(), options.end());
        arguments.push_back(m_file);
        arguments.insert(arguments.end(), keys.begin(), keys.end());
        return Tool(arguments);
    }

private:
    void ExpectFindings(const std::vector<std::string>& findings,
                        const std::vector<std::string>& options,
                        const std::vector<std::string>& keys) const
    {
        const Outcome outcome = Check(options, keys);
        EXPECT_EQ(findings, FindingsOf(outcome.out)) << outcome.out;
        EXPECT_EQ("", outcome.err);
    }

    /** @return the lines about a line of the file, without its name, severities and kinds. */
    std::vector<std::string> FindingsOf(const std::string& out) const
    {
        std::vector<std::string> findings;
        std::istringstream lines(out);
        for (std::string line; std::getline(lines, line);)
        {
            EXPECT_EQ(m_file, line.substr(0, m_file.size()));
            line.erase(0, m_file.size() + 1);
            const size_t number = line.find_first_not_of("0123456789");
            if (number != 0)
            {
                const size_t severity = line.find(": ", number + 2) - number;
                findings.push_back(line.erase(number, severity).substr(0, line.rfind(" [")));
            }
        }
        return findings;
    }
};

} // namespace

TEST_F(KxconfigCheck, HasNothingToSayOfAPlainFile)
{
    Write("<cfg><net><if id=\"1\"><ip>a</ip></if><if id=\"2\"><ip>b</ip></if></net>"
          "<name>box</name></cfg>");
    ExpectWarningsAndNotes({});
}

TEST_F(KxconfigCheck, WarnsOfAKeyThatMatchesMoreThanOneElement)
{
    Write("<cfg>\n<a>1</a>\n<a>2</a>\n<a>3</a></cfg>");
    ExpectWarningsAndNotes(
        {"4: \"cfg.a\" matches 3 elements, the first of them /cfg/a[1] (line 3)"});
}

TEST_F(KxconfigCheck, WarnsOfAConditionThatIsSuspended)
{
    Write("<cfg>\n<z/>\n<a i=\"1\">1</a>\n<a i=\"2\">2</a></cfg>");
    ExpectWarningsAndNotes(
        {"4: /cfg/a[1] is accepted for \"a@i=2\" although it does not fulfill it: /cfg/z "
         "(line 3), a preceding element of another name, suspends the condition",
         "5: /cfg/a[2] would be accepted for \"a@i=1\" if /cfg/z (line 3), which has another name, "
         "preceded it directly",
         "5: \"cfg.a@i=2\" matches 2 elements, the first of them /cfg/a[1] (line 4)"});
}

TEST_F(KxconfigCheck, NamesTheElementThatSuspendsTheCondition)
{
    // The first of another name suspends the condition only for one that fulfills it anyway.
    Write("<cfg>\n<z/>\n<a i=\"1\">1</a>\n<a i=\"2\"/>\n<y/>\n<x/>\n<a i=\"3\"/></cfg>");
    ExpectWarnings(
        {"8: /cfg/a[3] is accepted for \"a@i=1\" although it does not fulfill it: /cfg/y "
         "(line 6), a preceding element of another name, suspends the condition"});
}

TEST_F(KxconfigCheck, WarnsOncePerLevelOfConditionsThatDependOnTheOrder)
{
    Write("<cfg>\n<a i=\"1\">1</a>\n<a i=\"2\">2</a>\n<z/></cfg>");
    ExpectWarningsAndNotes(
        {"4: /cfg/a[2] would be accepted for \"a@i=1\" if /cfg/z (line 5), which has "
         "another name, preceded it directly"});
}

TEST_F(KxconfigCheck, WarnsOncePerLevelOfConditionsThatAreSuspended)
{
    Write("<cfg>\n<z/>\n<a i=\"1\">1</a>\n<a i=\"2\">2</a>\n<a i=\"3\">3</a></cfg>");
    const auto matchesTwo = [](const std::string& line, const std::string& key)
    { return line + ": \"" + key + "\" matches 2 elements, the first of them /cfg/a[1] (line 4)"; };
    ExpectWarningsAndNotes(
        {"4: /cfg/a[1] is accepted for \"a@i=2\" although it does not fulfill it: /cfg/z "
         "(line 3), a preceding element of another name, suspends the condition",
         "5: /cfg/a[2] would be accepted for \"a@i=1\" if /cfg/z (line 3), which has another name, "
         "preceded it directly",
         matchesTwo("5", "cfg.a@i=2"), matchesTwo("6", "cfg.a@i=3")});
}

TEST_F(KxconfigCheck, ChecksTheKeysThatItIsGiven)
{
    Write("<cfg>\n<a i=\"1\">1</a>\n<a i=\"2\">2</a>\n<z/></cfg>");
    ExpectWarningsAndNotes(
        {"4: \"cfg.a\" matches 2 elements, the first of them /cfg/a[1] (line 3)",
         "5: \"cfg.z\" has no value: it leads as far as /cfg/z; kxconfig explain shows the reason"},
        {"cfg.a", "cfg.z"});
    ExpectWarningsAndNotes(
        {"3: /cfg/a[1] would be accepted for \"a@i=2\" if /cfg/z (line 5), which has "
         "another name, preceded it directly",
         "4: an update of \"cfg.a@i=2\" does not change 1 element that a lookup finds: /cfg/a[2] "
         "(line "
         "4)"},
        {"cfg.a@i=2"});
}

TEST_F(KxconfigCheck, GoesOnAfterAKeyWithAForeignRoot)
{
    Write("<cfg>\n<a>1</a>\n<a>2</a><b><![CDATA[x]]></b></cfg>");
    ExpectWarningsAndNotes(
        {"2: \"other.a\" has no value: it starts with \"other\", but the root element is \"cfg\"",
         "2: \".a\" has no value: it starts with \"\", but the root element is \"cfg\"",
         "4: \"cfg.a\" matches 2 elements, the first of them /cfg/a[1] (line 3)"},
        {"other.a", ".a", "cfg.a"});
}

TEST_F(KxconfigCheck, ChecksNothingIfAKeyIsMalformed)
{
    Write("<cfg><a>1</a><a>2</a></cfg>");
    ExpectComplaint(Tool({"check", m_file, "cfg.a", "cfg"}), 2,
                    "malformed key \"cfg\": a key names the root element and at least one more, as "
                    "in root.name");
}

TEST_F(KxconfigCheck, WarnsOfAGivenKeyThatHasNoValue)
{
    Write("<cfg>\n<a><b/></a>\n<a>\n<b><c/></b></a>\n<d>1</d></cfg>");
    const auto warning =
        [](const std::string& key, const std::string& line, const std::string& location)
    {
        return line + ": \"" + key + "\" has no value: it leads as far as " + location +
               "; kxconfig explain shows the reason";
    };
    // An element that is there and empty, the first of those that are equally deep.
    ExpectWarnings({warning("cfg.a.b", "3", "/cfg/a[1]/b")}, {"cfg.a.b"});
    // The deepest, although the first a leads astray.
    ExpectWarnings({warning("cfg.a.b.c.x", "5", "/cfg/a[2]/b/c")}, {"cfg.a.b.c.x"});
    ExpectWarnings({warning("cfg.e", "2", "/cfg")}, {"cfg.e"});
    ExpectWarnings({warning("cfg.", "2", "/cfg")}, {"cfg."});
    ExpectWarnings({warning("cfg.e", "2", "/cfg"), warning("cfg.a.b", "3", "/cfg/a[1]/b")},
                   {"cfg.d", "cfg.a.b", "cfg.e", "cfg.e"});
    ExpectWarnings({}, {"cfg.d"});
}

TEST_F(KxconfigCheck, FindsForListedKeysWhatTheWalkFinds)
{
    // Given keys are walked, listed ones are looked up by their segments.
    std::map<std::string, int> kinds;
    const auto findings = [&](const std::vector<std::string>& keys)
    {
        std::vector<std::pair<int, std::string>> texts;
        const Outcome outcome =
            Check({"--json", "--only=ambiguous-key", "--only=several-values",
                   "--only=suspended-condition", "--only=condition-depends-on-order"},
                  keys);
        const nlohmann::json answer = nlohmann::json::parse(outcome.out);
        for (const nlohmann::json& result : answer.at("results"))
        {
            if (result.contains("kind"))
            {
                ++kinds[result.at("kind")];
                texts.emplace_back(result.at("line"), result.at("text"));
            }
        }
        return texts;
    };
    for (unsigned seed = 1; seed != 61; ++seed)
    {
        Write(RandomDocument(seed).Make());
        std::vector<std::string> keys;
        const nlohmann::json listed = nlohmann::json::parse(Tool({"--json", "keys", m_file}).out);
        for (const nlohmann::json& result : listed.at("results"))
        {
            keys.push_back(result.at("key"));
        }
        EXPECT_EQ(findings(keys), findings({})) << ReadFile(m_file);
    }
    EXPECT_GT(kinds["several values"], 100);
    EXPECT_GT(kinds["suspended condition"], 200);
    EXPECT_GT(kinds["condition depends on order"], 100);
}

TEST_F(KxconfigCheck, PrintsHowManyElementsALookupAndAnUpdateReach)
{
    const auto expect = [this](const std::string& key, const std::string& reach,
                               const std::vector<std::string>& warnings)
    {
        ExpectWarnings(warnings, {key});
        EXPECT_EQ(m_file + ": \"" + key + "\": " + reach + "\n",
                  Check({"--only=mixed-content"}, {key}).out);
    };
    Write("<cfg>\n<net i=\"1\"><ip>1</ip></net>\n<net i=\"2\"><ip>2</ip></net>\n"
          "<name>box</name></cfg>");
    expect("cfg.name", "lookup 1, update 1", {});
    expect("cfg.net@i=1.ip", "lookup 1, update 2",
           {"4: an update of \"cfg.net@i=1.ip\" also changes 1 element that a lookup does not "
            "find: /cfg/net[2]/ip (line 4)"});
    expect("cfg.ip", "lookup 0, update 2",
           {"2: \"cfg.ip\" has no value: it leads as far as /cfg; kxconfig explain shows the "
            "reason",
            "3: an update of \"cfg.ip\" also changes 2 elements that a lookup does not find, the "
            "first of them /cfg/net[1]/ip (line 3)"});
    expect("other.name", "lookup 0, update 0",
           {"2: \"other.name\" has no value: it starts with \"other\", but the root element is "
            "\"cfg\""});
    Write("<cfg>\n<port n=\"1\">80</port>\n<port n=\"2\">53</port></cfg>");
    expect("cfg.port@n=2", "lookup 1, update 0",
           {"4: an update of \"cfg.port@n=2\" does not change 1 element that a lookup finds: "
            "/cfg/port[2] (line 4)"});
    expect("cfg.port", "lookup 2, update 2",
           {"4: \"cfg.port\" matches 2 elements, the first of them /cfg/port[1] (line 3)"});
}

TEST_F(KxconfigCheck, ReportsTheReachOfAKeyInJson)
{
    Write("<cfg>\n<net i=\"1\"><ip>1</ip></net>\n<net i=\"2\"><ip>2</ip></net></cfg>");
    const nlohmann::json answer = nlohmann::json::parse(Check({"--json"}, {"cfg.net@i=1.ip"}).out);
    EXPECT_EQ(nlohmann::json({{"key", "cfg.net@i=1.ip"}, {"lookup", 1}, {"update", 2}}),
              answer.at("results").at(0));
    EXPECT_EQ(
        nlohmann::json({{"line", 4},
                        {"kind", "wider update"},
                        {"severity", "warning"},
                        {"text", "an update of \"cfg.net@i=1.ip\" also changes 1 "
                                 "element that a lookup does not find: /cfg/net[2]/ip (line 4)"}}),
        answer.at("results").at(1));
    EXPECT_EQ(2U, answer.at("results").size());
}

TEST_F(KxconfigCheck, ChecksNothingButTheKeysThatItIsGiven)
{
    Write("<cfg><a>1</a><b><![CDATA[x]]></b></cfg>\n");
    EXPECT_EQ(1, Check({}).status);
    ExpectWarningsAndNotes({}, {"cfg.a"});
}

TEST_F(KxconfigCheck, ExitsWithAStatusForWarningsOnly)
{
    Write("<cfg>\n<a>1</a>\n<a>2</a></cfg>");
    const std::string note = m_file + ":4: note: \"cfg.a\" matches 2 elements, the first of them "
                                      "/cfg/a[1] (line 3) [several-values]\n";
    EXPECT_EQ("", Check({}).out);
    EXPECT_EQ(note, Check({"--notes"}).out);
    EXPECT_EQ(0, Check({"--notes"}).status);
    const std::string warning =
        m_file + ":4: warning: \"cfg.a\" matches 2 elements, the first of them /cfg/a[1] (line 3) "
                 "[ambiguous-key]\n";
    const Outcome outcome = Check({}, {"cfg.a"});
    EXPECT_EQ(m_file + ": \"cfg.a\": lookup 2, update 2\n" + warning, outcome.out);
    EXPECT_EQ(1, outcome.status);
}

TEST_F(KxconfigCheck, ReportsTheKindsThatItIsAskedFor)
{
    Write("<cfg>\n<a>1</a>\n<a>2</a><b><![CDATA[x]]></b></cfg>");
    const auto lines = [this](const std::vector<std::string>& options)
    {
        const std::string out = Check(options).out;
        return std::count(out.begin(), out.end(), '\n');
    };
    EXPECT_EQ(1, lines({}));
    EXPECT_EQ(2, lines({"--notes"}));
    EXPECT_EQ(1, lines({"--only", "several-values"}));
    EXPECT_EQ(0, Check({"--only", "several-values"}).status);
    EXPECT_EQ(2, lines({"--only", "several values", "--only", "invisible-value"}));
    EXPECT_EQ(0, lines({"--only", "mixed-content", "--notes"}));
    EXPECT_EQ(0, lines({"--ignore", "invisible-value"}));
    EXPECT_EQ(0, Check({"--ignore", "invisible-value"}).status);
    EXPECT_EQ(1, lines({"--notes", "--ignore", "invisible-value"}));
    EXPECT_EQ(0, lines({"--only", "invisible-value", "--ignore", "invisible-value"}));
    EXPECT_EQ(2, Check({"--only", "values"}).status);
    EXPECT_THAT(Check({"--ignore", "values"}).err,
                HasSubstr("\"values\" is not a kind; kxconfig check --kinds lists them"));
}

TEST_F(KxconfigCheck, ListsTheKindsThatTheDocumentationDescribes)
{
    const Outcome outcome = Tool({"check", "--kinds"});
    EXPECT_EQ(0, outcome.status);
    const std::string documentation = ReadFile(KX_TOOL_DOCUMENTATION);
    std::istringstream lines(outcome.out);
    int count = 0;
    for (std::string line; std::getline(lines, line); ++count)
    {
        std::string kind = line.substr(0, line.find(' '));
        const std::string severity =
            line.find(" warning ") != std::string::npos ? "warning" : "note";
        std::replace(kind.begin(), kind.end(), '-', ' ');
        EXPECT_NE(std::string::npos, documentation.find("| " + severity + " | `" + kind + "` |"))
            << kind;
    }
    EXPECT_EQ(12, count);
}

TEST_F(KxconfigCheck, WarnsOfValuesThatALookupCannotSee)
{
    Write("<cfg>\n<a><![CDATA[x]]></a>\n<b>y<!-- c -->z</b>\n<c>t<d/></c>\n<e>\n</e>\n<f/>\n"
          "<g>  <h/>  </g></cfg>");
    ExpectWarnings(
        {"3: /cfg/a has no value although it contains \"x\": its only child is not text: CDATA "
         "section",
         "4: /cfg/b has no value although it contains \"yz\": it has 3 children: text, comment, "
         "text"});
}

TEST_F(KxconfigCheck, NotesTextBesideElements)
{
    Write("<cfg>\n<c>t<d/></c></cfg>");
    ExpectWarnings({});
    ExpectWarningsAndNotes(
        {"3: /cfg/c has no value although it contains \"t\": it has 2 children: text, element d"});
}

TEST_F(KxconfigCheck, WarnsOfATextInTheRoot)
{
    Write("<cfg>text</cfg>");
    ExpectWarnings(
        {"2: /cfg has no value although it contains \"text\": it is the root, and a key names "
         "elements below it"});
    Write("<cfg> </cfg>");
    ExpectWarnings({});
}

TEST_F(KxconfigCheck, TakesAReferenceForContentWhateverItStandsFor)
{
    const auto expect =
        [this](const std::string& subset, const std::string& line, const std::string& name)
    {
        Write("<!DOCTYPE cfg " + subset + ">\n<cfg><a>&" + name + ";</a></cfg>");
        ExpectWarnings({line + ": /cfg/a has no value although it contains \"&" + name +
                        ";\": its only child is not text: entity reference &" + name + ";"});
    };
    expect("[\n<!ENTITY full \"x\">\n]", "5", "full");
    expect("[\n<!ENTITY none \"\">\n]", "5", "none");
    expect("SYSTEM \"missing.dtd\"", "3", "unknown");
}

TEST_F(KxconfigCheck, ExpandsNoReferences)
{
    // As much as every engine lets pass; engines that let more pass would run out of memory.
    const std::string entity(4000, 'x');
    std::string references;
    for (int i = 0; i != 200; ++i)
    {
        references += "&e;";
    }
    Write("<!DOCTYPE cfg [\n<!ENTITY e \"" + entity + "\">\n]>\n<cfg><a>" + references +
          "</a></cfg>");
    ExpectWarnings({"5: /cfg/a has no value although it contains "
                    "\"&e;&e;&e;&e;&e;&e;&e;&e;&e;&e;&e;&e;&e;&\"...: it has 200 children: entity "
                    "reference &e;, entity reference &e;, entity reference &e;, entity reference "
                    "&e;, entity reference &e;, ..."});
}

TEST_F(KxconfigCheck, ShowsOfALongTextTheFirstFortyBytesInWholeCharacters)
{
    const std::string text(39, 'x');
    const auto expect = [this](const std::string& held, const std::string& shown)
    {
        Write("<cfg><a><![CDATA[" + held + "]]></a></cfg>");
        ExpectWarningsAndNotes({"2: /cfg/a has no value although it contains " + shown +
                                ": its only child is not text: CDATA section"});
    };
    expect(text + "y", "\"" + text + "y\"");
    expect(text + "yz", "\"" + text + "y\"...");
    expect(text + "\xC3\xA9", "\"" + text + "\"...");
    Write("<cfg>\n<a >" + text.substr(2) + "\xC3\xA9z</a></cfg>");
    ExpectWarningsAndNotes({"3: saving changes white space or quotes in a tag: \" >" +
                            text.substr(2) + "\"... becomes \">" + text.substr(2) +
                            "\xC3\xA9\"..."});
    Write("<cfg>\n<a i=\"" + text + "yz\">v</a>\n<a i=\"" + text + "yz\">v</a>\n<a>v</a></cfg>");
    ExpectWarnings({"4: /cfg/a[2] has the same i=\"" + text + "y\"... as /cfg/a[1] (line 3)"});
}

TEST_F(KxconfigCheck, WarnsOfNamesThatAKeyCannotHold)
{
    Write("<cfg>\n<a.b>1</a.b></cfg>");
    ExpectWarnings({"3: /cfg/a.b cannot be named by a key: its name contains a \".\", which ends a "
                    "segment"});
}

TEST_F(KxconfigCheck, WarnsOfAttributesThatNoLongerTellElementsApart)
{
    Write("<cfg>\n<a t=\"x\" i=\"1\">v</a>\n<a t=\"x\" i=\"2\">v</a>\n<a t=\"x\" "
          "i=\"1\">v</a></cfg>");
    ExpectWarnings({"5: /cfg/a[3] has the same i=\"1\" as /cfg/a[1] (line 3)"});
    Write("<cfg>\n<a t=\"x\" i=\"1\">v</a>\n<a t=\"x\" i=\"2\">v</a></cfg>");
    ExpectWarnings({});
}

TEST_F(KxconfigCheck, WarnsOfARepeatedAttributeThatTheFirstElementLacks)
{
    Write("<cfg>\n<a>v</a>\n<a i=\"1\">v</a>\n<a i=\"1\">v</a></cfg>");
    ExpectWarnings({"5: /cfg/a[3] has the same i=\"1\" as /cfg/a[2] (line 4)"});
}

TEST_F(KxconfigCheck, DistinguishesElementsByAllAttributesTogether)
{
    Write("<cfg>\n<a c=\"1\" l=\"x\">v</a>\n<a c=\"1\" l=\"y\">v</a>\n<a c=\"2\" l=\"x\">v</a>\n"
          "<a c=\"2\" l=\"y\">v</a></cfg>");
    ExpectWarnings({});
    Write("<cfg>\n<a c=\"1\" l=\"x\">v</a>\n<a c=\"1\" l=\"y\">v</a>\n<a c=\"2\" l=\"x\">v</a>\n"
          "<a l=\"y\" c=\"1\">v</a></cfg>");
    ExpectWarnings({"6: /cfg/a[4] has the same c=\"1\" l=\"y\" as /cfg/a[2] (line 4)"});
}

TEST_F(KxconfigCheck, DistinguishesNoElementsByAnAttributeThatIsTheSameEverywhere)
{
    Write("<cfg>\n<a u=\"C\">v</a>\n<a u=\"C\">v</a></cfg>");
    ExpectWarnings({});
    Write("<cfg>\n<a u=\"C\">v</a>\n<a u=\"C\">v</a>\n<a u=\"C\" i=\"1\">v</a></cfg>");
    ExpectWarnings({});
}

TEST_F(KxconfigCheck, TakesAttributesAsConditionsSeeThem)
{
    // By the name without a prefix, of which the first counts, and with the DTD's default.
    Write("<!DOCTYPE cfg [\n<!ATTLIST a i CDATA \"1\">\n]>\n<cfg xmlns:p=\"urn:p\">\n<a>v</a>\n"
          "<a i=\"1\">v</a>\n<a p:i=\"1\" i=\"2\">v</a>\n<a i=\"3\">v</a></cfg>");
    ExpectWarnings({"7: /cfg/a[2] has the same i=\"1\" as /cfg/a[1] (line 6); 1 more of that name "
                    "repeat others"});
}

TEST_F(KxconfigCheck, WarnsOnceOfTheElementsOfANameWhoseAttributesRepeat)
{
    Write(
        "<cfg><p>\n<a i=\"1\">v</a>\n<a i=\"2\">v</a>\n<a i=\"1\">v</a>\n<a i=\"3\">v</a>\n"
        "<a i=\"1\">v</a></p><q>\n<b i=\"1\">v</b>\n<b i=\"1\">v</b>\n<b i=\"2\">v</b></q></cfg>");
    ExpectWarnings({"5: /cfg/p/a[3] has the same i=\"1\" as /cfg/p/a[1] (line 3); 1 more of that "
                    "name repeat others",
                    "9: /cfg/q/b[2] has the same i=\"1\" as /cfg/q/b[1] (line 8)"});
}

TEST_F(KxconfigCheck, TakesAttributesThatRepeatMoreOftenThanNotForNoIdentifiers)
{
    // A flag, and a language of which each element has a second one.
    Write("<cfg><a f=\"1\">v</a><a f=\"1\">v</a><a>v</a><a>v</a></cfg>");
    ExpectWarnings({});
    Write("<cfg><a l=\"1\">v</a><a l=\"2\">v</a><a l=\"1\">v</a><a l=\"2\">v</a></cfg>");
    ExpectWarnings({});
    Write("<cfg>\n<a l=\"1\">v</a>\n<a l=\"2\">v</a>\n<a l=\"1\">v</a></cfg>");
    ExpectWarnings({"5: /cfg/a[3] has the same l=\"1\" as /cfg/a[1] (line 3)"});
}

TEST_F(KxconfigCheck, WarnsOnlyOfElementsThatALookupCouldFindAValueIn)
{
    Write("<cfg><a i=\"1\"/><a i=\"2\"/><a i=\"1\"/><b.c><d/></b.c></cfg>");
    ExpectWarnings({});
    Write("<cfg>\n<b.c><d><e>1</e></d></b.c></cfg>");
    ExpectWarnings({"3: /cfg/b.c cannot be named by a key: its name contains a \".\", which ends a "
                    "segment"});
}

TEST_F(KxconfigCheck, ListsThreeOfTheAttributesThatRepeat)
{
    Write("<cfg>\n<a i=\"1\" j=\"2\" k=\"3\" l=\"4\">v</a>\n<a>v</a>\n"
          "<a i=\"1\" j=\"2\" k=\"3\" l=\"4\">v</a></cfg>");
    ExpectWarnings({"5: /cfg/a[3] has the same i=\"1\" j=\"2\" k=\"3\" ... as /cfg/a[1] (line 3)"});
}

TEST_F(KxconfigCheck, ReportsDifferencesAfterSavingFirst)
{
    const auto expect = [this](const std::string& bytes, const std::vector<std::string>& warnings)
    {
        m_file = m_folder.Write("cfg.xml", bytes);
        ExpectWarningsAndNotes(warnings);
    };
    expect(kDeclaration + "<cfg/>\n", {});
    expect("<cfg/>\n", {"1: saving changes the XML declaration: none becomes \"<?xml "
                        "version=\\\"1.0\\\" encoding=\\\"UTF-8\\\"?>\""});
    expect("<?xml\tversion=\"1.0\" encoding=\"UTF-8\"?>\n<cfg/>\n",
           {"1: saving changes the XML declaration: \"<?xml\\x09version=\\\"1.0\\\" "
            "encoding=\\\"UTF-8\\\"?>\" becomes \"<?xml version=\\\"1.0\\\" "
            "encoding=\\\"UTF-8\\\"?>\""});
    expect("<?xml-stylesheet href=\"a\"?>\n<cfg/>\n",
           {"1: saving changes the XML declaration: none becomes \"<?xml version=\\\"1.0\\\" "
            "encoding=\\\"UTF-8\\\"?>\""});
    expect("<?xml version=\"1.0\" encoding=\"ISO-8859-1\"?>\n<cfg/>\n",
           {"1: saving changes the XML declaration: \"<?xml version=\\\"1.0\\\" "
            "encoding=\\\"ISO-8859-1\\\"?>\" becomes \"<?xml version=\\\"1.0\\\" "
            "encoding=\\\"UTF-8\\\"?>\""});
    expect("\xEF\xBB\xBF" + kDeclaration + "<cfg/>\n",
           {"1: saving changes the byte order mark, which is removed"});
    expect(kDeclaration + "<cfg>\n<a i='1'/></cfg>\n",
           {"3: saving changes white space or quotes in a tag: \"'1'/></cfg>\" becomes "
            "\"\\\"1\\\"/></cfg>\""});
    expect(kDeclaration + "<cfg>\n<a  i=\"1\"/></cfg>\n",
           {"3: saving changes white space or quotes in a tag: \" i=\\\"1\\\"/></cfg>\" becomes "
            "\"i=\\\"1\\\"/></cfg>\""});
    expect(kDeclaration + "<cfg>\n<a></a></cfg>\n",
           {"3: saving changes the notation of an empty element: \"></a></cfg>\" becomes "
            "\"/></cfg>\""});
    expect(kDeclaration + "<cfg>\n<a>&#65;</a></cfg>\n",
           {"3: saving changes the notation of a character: \"&#65;</a></cfg>\" becomes "
            "\"A</a></cfg>\""});
    expect(kDeclaration + "<cfg>\r\n</cfg>\n",
           {"2: saving changes line ends (carriage returns): \"\\x0d\" becomes \"\""});
    expect(kDeclaration + "<cfg>&#xD;</cfg>\n",
           {"2: saving changes the notation of a character: \"xD;</cfg>\" becomes "
            "\"13;</cfg>\""});
    expect(kDeclaration + "<cfg><a>x > y</a></cfg>\n",
           {"2: saving changes the notation of a character: \"> y</a></cfg>\" becomes "
            "\"&gt; y</a></cfg>\""});
    expect(kDeclaration + "\n<cfg/>\n",
           {"2: saving changes white space outside the root element: \"\" becomes \"<cfg/>\""});
    expect(kDeclaration + "<!-- c --><cfg/>\n",
           {"2: saving changes white space outside the root element: \"<cfg/>\" becomes \"\""});
    expect(kDeclaration + "<cfg/>\n<!-- c -->\n\n<!-- d -->\n",
           {"4: saving changes white space outside the root element: \"\" becomes "
            "\"<!-- d -->\""});
    expect(kDeclaration + "<cfg/>", {"2: saving changes the end of the file: \"\\n\" is added"});
    expect(kDeclaration + "<cfg/>\n\n",
           {"3: saving changes the end of the file: \"\\n\" is removed"});
}

TEST_F(KxconfigCheck, ReportsThatSavingChangesAFileIfTheLibraryDoesChangeIt)
{
    const std::vector<std::string> documents = {
        "<cfg/>",
        kDeclaration + "<cfg/>\n",
        kDeclaration + "<cfg>\n  <a i=\"1\">x &lt; y &amp; z &gt;</a>\n</cfg>\n",
        kDeclaration + "<cfg><a i='1'></a></cfg>\n",
        kDeclaration + "<cfg><a><![CDATA[<x>]]></a><b>y<!-- c -->z</b><?p i?></cfg>\n",
        kDeclaration + "<!-- before -->\n<cfg/>\n<!-- behind -->\n<?p i?>\n",
        kDeclaration + "<cfg a=\"&#10;&quot;\">&#13;\xC3\xA9\xF0\x9F\x98\x80</cfg>\n",
        kDeclaration + "<!DOCTYPE cfg [\n<!ENTITY e \"x\">\n<!ATTLIST a i CDATA \"1\">\n]>\n"
                       "<cfg><a>&e;</a></cfg>\n",
        kDeclaration + "<!DOCTYPE cfg SYSTEM \"missing.dtd\">\n<cfg>&e;</cfg>\n",
        kDeclaration + "<html xmlns=\"http://www.w3.org/1999/xhtml\"><p/><br></br></html>\n",
        kDeclaration +
            "<!DOCTYPE html PUBLIC \"-//W3C//DTD XHTML 1.0 Strict//EN\" "
            "\"http://www.w3.org/TR/xhtml1/DTD/xhtml1-strict.dtd\">\n"
            "<html xmlns=\"http://www.w3.org/1999/xhtml\"><head/><body><p/><br/></body></html>\n",
        "<?xml version=\"1.0\" encoding=\"UTF-8\" standalone=\"yes\"?>\n<cfg/>\n",
        "<?xml version=\"1.1\"?>\n<cfg/>\n",
        "<?xml version=\"1.0\" encoding=\"ISO-8859-1\"?>\n<cfg>gr\xFCn</cfg>\n"};
    for (const std::string& document : documents)
    {
        const std::string loaded = m_folder.Write("loaded.xml", document);
        const std::string saved = m_folder.Path("saved.xml");
        CXMLWriter writer(loaded);
        writer.SetPath(saved);
        ASSERT_EQ(0, writer.SaveData());
        for (const std::string& file : {loaded, saved})
        {
            CXMLWriter again(file);
            again.SetPath(m_folder.Path("again.xml"));
            ASSERT_EQ(0, again.SaveData());
            const bool changes = ReadFile(file) != ReadFile(m_folder.Path("again.xml"));
            const std::string out = Tool({"check", "--notes", file}).out;
            EXPECT_EQ(changes, out.find(": note: saving changes ") != std::string::npos)
                << ReadFile(file) << out;
        }
    }
}

TEST_F(KxconfigCheck, FindsADifferenceAnywhereInAFile)
{
    // The engine saves in pieces; a difference can be at their borders.
    const std::string start = kDeclaration + "<cfg>\n";
    for (size_t size = 3940; size < 4010; size += 2)
    {
        const std::string text = start + "<!--" + std::string(size, 'x') + "-->\n<a>";
        m_file = m_folder.Write("cfg.xml", text + "&#65;</a></cfg>\n");
        ExpectWarningsAndNotes({"4: saving changes the notation of a character: "
                                "\"&#65;</a></cfg>\" becomes \"A</a></cfg>\""});
        m_file = m_folder.Write("cfg.xml", text + "</a></cfg>");
        ExpectWarningsAndNotes({"4: saving changes the notation of an empty element: "
                                "\"></a></cfg>\" becomes \"/></cfg>\""});
        m_file = m_folder.Write("cfg.xml", text + "1</a></cfg>");
        ExpectWarningsAndNotes({"4: saving changes the end of the file: \"\\n\" is added"});
        m_file = m_folder.Write("cfg.xml", text + "1</a></cfg>\n\n");
        ExpectWarningsAndNotes({"5: saving changes the end of the file: \"\\n\" is removed"});
        m_file = m_folder.Write("cfg.xml", text + "1</a></cfg>\n");
        ExpectWarningsAndNotes({});
    }
}

TEST_F(KxconfigCheck, NeedsNoPlaceForTemporaryFiles)
{
    Write("<cfg><a>1</a></cfg>");
    const Outcome outcome = Tool({"check", m_file}, {"TMPDIR=" + m_folder.Path("missing")});
    EXPECT_EQ(0, outcome.status) << outcome.err;
    EXPECT_EQ("", outcome.out + outcome.err);
}

TEST_F(KxconfigCheck, ReadsAPipeOnceAndReportsNothingAboutSaving)
{
    Write("<cfg>\n<a>1</a>\n<a>2</a></cfg>");
    const Outcome outcome =
        RunShell("cat '" + m_file + "' | " + InShell(KX_CONFIG_TOOL) + " check --notes /dev/stdin");
    EXPECT_EQ("/dev/stdin:4: note: \"cfg.a\" matches 2 elements, the first of them /cfg/a[1] (line "
              "3) [several-values]\n",
              outcome.out);
    EXPECT_EQ(0, outcome.status);
    EXPECT_EQ("", outcome.err);
}

TEST_F(KxconfigCheck, EscapesTheBytesOfAFileInAnotherEncoding)
{
    m_file = m_folder.Write("cfg.xml", "<?xml version=\"1.0\" encoding=\"ISO-8859-1\"?>\n"
                                       "<cfg>gr\xFCn</cfg>\n");
    EXPECT_THAT(
        Check({"--notes"}).out,
        HasSubstr(":2: note: saving changes the encoding of a character: \"\\xfcn</cfg>\" becomes "
                  "\"\xC3\xBCn</cfg>\""));
    // The character is shown whole also where its first byte is what the file has.
    m_file = m_folder.Write("cfg.xml", "<?xml version=\"1.0\" encoding=\"ISO-8859-1\"?>\n"
                                       "<cfg>\xC3z</cfg>\n");
    EXPECT_THAT(
        Check({"--notes"}).out,
        HasSubstr(":2: note: saving changes the encoding of a character: \"\\xc3z</cfg>\" becomes "
                  "\"\xC3\x83z</cfg>\""));
}

TEST_F(KxconfigCheck, ReportsAFileOfOtherBytesThanItsCharacters)
{
    std::string utf16 = "\xFF\xFE";
    for (const char c : std::string("<cfg/>\n"))
    {
        utf16 += {c, '\0'};
    }
    m_file = m_folder.Write("cfg.xml", utf16);
    ExpectWarningsAndNotes({"1: saving changes every character: UTF-16 becomes UTF-8"});
}

TEST_F(KxconfigCheck, NamesTheEncodingOfAFileWithoutAMark)
{
    std::string wide;
    for (const char c : std::string("<?xml version=\"1.0\"?><cfg/>\n"))
    {
        wide += {c, '\0'};
    }
    m_file = m_folder.Write("cfg.xml", wide);
    ExpectWarningsAndNotes({"1: saving changes every character: UTF-16 becomes UTF-8"});
}

TEST_F(KxconfigCheck, NotesThatACompressedFileIsSavedUncompressed)
{
    for (const std::string program : {"gzip", "xz"})
    {
        const std::string plain = m_folder.Write("cfg.xml", kDeclaration + "<cfg/>\n");
        m_file = m_folder.Path(program);
        const bool isCompressed =
            RunShell(program + " -c '" + plain + "' >'" + m_file + "'").status == 0;
        if (isCompressed && Tool({"get", m_file, "cfg.a"}).status != 3) // the engine reads it
        {
            ExpectWarningsAndNotes({"1: saving changes the whole file: it is compressed, and is "
                                    "saved uncompressed"});
        }
    }
}

TEST_F(KxconfigCheck, LeavesTheFileAlone)
{
    m_file = m_folder.Write("cfg.xml", "<cfg><a i='1'/></cfg>");
    EXPECT_EQ(0, Check({"--notes"}).status);
    EXPECT_EQ(1, Check({}, {"cfg.a"}).status);
    EXPECT_EQ("<cfg><a i='1'/></cfg>", ReadFile(m_file));
    EXPECT_EQ(3, Tool({"check", m_folder.Path("missing.xml")}).status);
}

TEST_F(KxconfigCheck, LeavesOutASuspendedConditionThatIsIgnored)
{
    Write("<cfg>\n<net id='1'>a</net>\n<x>b</x>\n<net id='2'>c</net></cfg>");
    const std::vector<std::string> keys = {"cfg.net@id=1"};
    EXPECT_THAT(Check({}, keys).out, HasSubstr("[suspended-condition]"));
    EXPECT_THAT(Check({"--ignore", "suspended-condition"}, keys).out,
                testing::Not(HasSubstr("[suspended-condition]")));
}

TEST_F(KxconfigCheck, NamesTheEncodingOfAFileThatIsNoAscii)
{
    std::string wide;
    for (const char c : std::string("<?xml version=\"1.0\"?><cfg/>\n"))
    {
        wide += {'\0', '\0', '\0', c};
    }
    m_file = m_folder.Write("cfg.xml", wide);
    ExpectWarningsAndNotes({"1: saving changes every character: UTF-32 becomes UTF-8"});
    const Outcome converted =
        RunShell("printf '<?xml version=\"1.0\" encoding=\"IBM037\"?><cfg/>' | iconv -t IBM037");
    m_file = m_folder.Write("cfg.xml", converted.out);
    if (converted.status == 0 && Tool({"get", m_file, "cfg.a"}).status != 3) // the engine reads it
    {
        ExpectWarningsAndNotes({"1: saving changes every character: IBM037 becomes UTF-8"});
    }
}

TEST_F(KxconfigCheck, AReferenceBeforeADifferenceIsNotTheDifference)
{
    Write("<cfg>&lt;<b></b></cfg>");
    EXPECT_THAT(Check({"--notes"}).out,
                HasSubstr(":2: note: saving changes the notation of an empty element: "
                          "\"></b></cfg>\" becomes \"/></cfg>\" "));
}

TEST_F(KxconfigCheck, ReportsBlanksBeforeTheRoot)
{
    m_file = m_folder.Write("cfg.xml", "\n<cfg/>\n");
    EXPECT_THAT(Check({"--notes"}).out,
                HasSubstr(":1: note: saving changes white space outside the root element: "));
}

TEST_F(KxconfigCheck, NamesUtf16WithItsFirstByteLast)
{
    std::string wide = "\xFE\xFF";
    for (const char c : std::string("<cfg/>\n"))
    {
        wide += {'\0', c};
    }
    m_file = m_folder.Write("cfg.xml", wide);
    ExpectWarningsAndNotes({"1: saving changes every character: UTF-16 becomes UTF-8"});
}

TEST_F(KxconfigCheck, CutsALongTextOfNoCharacters)
{
    m_file = m_folder.Write("cfg.xml", "<?xml version=\"1.0\" encoding=\"ISO-8859-1\"?>\n<cfg>" +
                                           std::string(50, '\xA0') + "</cfg>\n");
    std::string shown;
    for (int i = 0; i != 40; ++i)
    {
        shown += "\\xa0";
    }
    EXPECT_THAT(Check({"--notes"}).out,
                HasSubstr("the encoding of a character: \"" + shown + "\"... becomes "));
}

TEST_F(KxconfigCheck, NamesTheFirstOfTheElementsThatRepeatOthers)
{
    const std::string rest = "<a i='3'>v</a><a i='4'>v</a></cfg>";
    Write("<cfg>\n<a i='2'>v</a>\n<a i='2'>v</a>\n<a i='1'>v</a>\n<a i='1'>v</a>" + rest);
    ExpectWarnings({"4: /cfg/a[2] has the same i=\"2\" as /cfg/a[1] (line 3); 1 more of that name "
                    "repeat others"});
    Write("<cfg>\n<a i='1'>v</a>\n<a i='1'>v</a>\n<a i='2'>v</a>\n<a i='2'>v</a>" + rest);
    ExpectWarnings({"4: /cfg/a[2] has the same i=\"1\" as /cfg/a[1] (line 3); 1 more of that name "
                    "repeat others"});
}
