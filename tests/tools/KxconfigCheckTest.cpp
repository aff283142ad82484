#include "RandomDocument.h"
#include "ToolTest.h"

#include "CXMLWriter.h"

#include <nlohmann/json.hpp>

#include <chrono>
#include <map>

using namespace kxtest;
using testing::HasSubstr;

namespace
{

const std::string kDeclaration = "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n";

class KxconfigCheck : public ToolTest
{
protected:
    std::string m_file;

    /** Writes a file that begins with the declaration, so that its content starts on line 2. */
    void Write(const std::string& xml)
    {
        m_file = m_folder.Write("cfg.xml", kDeclaration + xml + "\n");
    }

    /** Expects one line for each warning, given without the file's name. */
    void ExpectWarnings(const std::vector<std::string>& warnings,
                        const std::vector<std::string>& keys = {}) const
    {
        std::vector<std::string> arguments = {"check", m_file};
        arguments.insert(arguments.end(), keys.begin(), keys.end());
        const Outcome outcome = Tool(arguments);
        std::string lines;
        for (const std::string& warning : warnings)
        {
            lines += m_file + ":" + warning + "\n";
        }
        EXPECT_EQ(lines, outcome.out);
        EXPECT_EQ(warnings.empty() ? 0 : 1, outcome.status);
        EXPECT_EQ("", outcome.err);
    }
};

} // namespace

TEST_F(KxconfigCheck, HasNothingToSayOfAPlainFile)
{
    Write("<cfg><net><if id=\"1\"><ip>a</ip></if><if id=\"2\"><ip>b</ip></if></net>"
          "<name>box</name></cfg>");
    ExpectWarnings({});
}

TEST_F(KxconfigCheck, WarnsOfAKeyThatMatchesMoreThanOneElement)
{
    Write("<cfg>\n<a>1</a>\n<a>2</a>\n<a>3</a></cfg>");
    ExpectWarnings({"4: \"cfg.a\" matches 3 elements, the first of them /cfg/a[1] (line 3)"});
}

TEST_F(KxconfigCheck, WarnsOfAConditionThatIsSuspended)
{
    Write("<cfg>\n<z/>\n<a i=\"1\">1</a>\n<a i=\"2\">2</a></cfg>");
    ExpectWarnings(
        {"4: /cfg/a[1] is accepted for \"a@i=2\" although it does not fulfill it: /cfg/z "
         "(line 3), a preceding element of another name, suspends the condition",
         "5: /cfg/a[2] would be accepted for \"a@i=1\" if /cfg/z (line 3), which has another name, "
         "preceded it directly",
         "5: \"cfg.a@i=2\" matches 2 elements, the first of them /cfg/a[1] (line 4)"});
}

TEST_F(KxconfigCheck, NamesTheElementThatSuspendsTheCondition)
{
    // The first of another name suspends the condition only for one that fulfils it anyway.
    Write("<cfg>\n<z/>\n<a i=\"1\">1</a>\n<a i=\"2\"/>\n<y/>\n<x/>\n<a i=\"3\"/></cfg>");
    ExpectWarnings(
        {"8: /cfg/a[3] is accepted for \"a@i=1\" although it does not fulfill it: /cfg/y "
         "(line 6), a preceding element of another name, suspends the condition"});
}

TEST_F(KxconfigCheck, WarnsOncePerLevelOfConditionsThatDependOnTheOrder)
{
    Write("<cfg>\n<a i=\"1\">1</a>\n<a i=\"2\">2</a>\n<z/></cfg>");
    ExpectWarnings({"4: /cfg/a[2] would be accepted for \"a@i=1\" if /cfg/z (line 5), which has "
                    "another name, preceded it directly"});
}

TEST_F(KxconfigCheck, WarnsOncePerLevelOfConditionsThatAreSuspended)
{
    Write("<cfg>\n<z/>\n<a i=\"1\">1</a>\n<a i=\"2\">2</a>\n<a i=\"3\">3</a></cfg>");
    const auto matchesTwo = [](const std::string& line, const std::string& key)
    { return line + ": \"" + key + "\" matches 2 elements, the first of them /cfg/a[1] (line 4)"; };
    ExpectWarnings(
        {"4: /cfg/a[1] is accepted for \"a@i=2\" although it does not fulfill it: /cfg/z "
         "(line 3), a preceding element of another name, suspends the condition",
         "5: /cfg/a[2] would be accepted for \"a@i=1\" if /cfg/z (line 3), which has another name, "
         "preceded it directly",
         matchesTwo("5", "cfg.a@i=2"), matchesTwo("6", "cfg.a@i=3")});
}

TEST_F(KxconfigCheck, ChecksTheKeysThatItIsGiven)
{
    Write("<cfg>\n<a i=\"1\">1</a>\n<a i=\"2\">2</a>\n<z/></cfg>");
    ExpectWarnings(
        {"4: \"cfg.a\" matches 2 elements, the first of them /cfg/a[1] (line 3)",
         "5: \"cfg.z\" has no value: it leads as far as /cfg/z; kxconfig explain shows the reason"},
        {"cfg.a", "cfg.z"});
    ExpectWarnings({"3: /cfg/a[1] would be accepted for \"a@i=2\" if /cfg/z (line 5), which has "
                    "another name, preceded it directly"},
                   {"cfg.a@i=2"});
}

TEST_F(KxconfigCheck, GoesOnAfterAKeyWithAForeignRoot)
{
    Write("<cfg>\n<a>1</a>\n<a>2</a><b><![CDATA[x]]></b></cfg>");
    ExpectWarnings(
        {"2: \"other.a\" has no value: it starts with \"other\", but the root element is \"cfg\"",
         "2: \".a\" has no value: it starts with \"\", but the root element is \"cfg\"",
         "4: \"cfg.a\" matches 2 elements, the first of them /cfg/a[1] (line 3)",
         "4: /cfg/b has no value although it contains \"x\": its only child is not text: CDATA "
         "section"},
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

TEST_F(KxconfigCheck, TellsOfListedKeysWhatTheWalkTells)
{
    // Keys that it is given it walks, the listed ones it looks up by their segments.
    std::map<std::string, int> kinds;
    for (unsigned seed = 1; seed != 61; ++seed)
    {
        Write(RandomDocument(seed).Make());
        std::vector<std::string> walk = {"check", m_file};
        const nlohmann::json keys = nlohmann::json::parse(Tool({"--json", "keys", m_file}).out);
        for (const nlohmann::json& result : keys.at("results"))
        {
            walk.push_back(result.at("key"));
        }
        EXPECT_EQ(Tool(walk).out, Tool({"check", m_file}).out) << ReadFile(m_file);
        const nlohmann::json answer = nlohmann::json::parse(Tool({"--json", "check", m_file}).out);
        for (const nlohmann::json& result : answer.at("results"))
        {
            ++kinds[result.at("kind")];
        }
    }
    EXPECT_GT(kinds["ambiguous key"], 100);
    EXPECT_GT(kinds["suspended condition"], 100);
    EXPECT_GT(kinds["condition depends on order"], 50);
}

TEST_F(KxconfigCheck, NeedsNoTimeWorthMentioningForManyElements)
{
    // A walk for each key would take minutes.
    std::string xml = "<cfg>\n<name>box</name>\n";
    for (int i = 0; i != 10000; ++i)
    {
        xml += "<net id=\"" + std::to_string(i) + "\"><ip>x</ip></net>\n";
    }
    Write(xml + "</cfg>");
    const auto start = std::chrono::steady_clock::now();
    const Outcome outcome = Tool({"check", m_file});
    EXPECT_LT(std::chrono::steady_clock::now() - start, std::chrono::seconds(30));
    EXPECT_EQ(1, outcome.status);
    EXPECT_THAT(outcome.out, HasSubstr(":10003: \"cfg.net@id=9999.ip\" matches 2 elements, the "
                                       "first of them /cfg/net[1]/ip (line 4)\n"));
}

TEST_F(KxconfigCheck, WarnsOfValuesThatALookupCannotSee)
{
    Write("<cfg>\n<a><![CDATA[x]]></a>\n<b>y<!-- c -->z</b>\n<c>t<d/></c>\n<e>\n</e>\n<f/>\n"
          "<g>  <h/>  </g></cfg>");
    ExpectWarnings(
        {"3: /cfg/a has no value although it contains \"x\": its only child is not text: CDATA "
         "section",
         "4: /cfg/b has no value although it contains \"yz\": it has 3 children: text, comment, "
         "text",
         "5: /cfg/c has no value although it contains \"t\": it has 2 children: text, element d"});
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
        ExpectWarnings({"2: /cfg/a has no value although it contains " + shown +
                        ": its only child is not text: CDATA section"});
    };
    expect(text + "y", "\"" + text + "y\"");
    expect(text + "yz", "\"" + text + "y\"...");
    expect(text + "\xC3\xA9", "\"" + text + "\"...");
    Write("<cfg>\n<a >" + text.substr(2) + "\xC3\xA9z</a></cfg>");
    ExpectWarnings({"3: saving changes white space or quotes in a tag: \" >" + text.substr(2) +
                    "\"... becomes \">" + text.substr(2) + "\xC3\xA9\"..."});
    Write("<cfg>\n<a i=\"" + text + "yz\"/>\n<a i=\"" + text + "yz\"/>\n<a/></cfg>");
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
    Write("<cfg>\n<a t=\"x\" i=\"1\"/>\n<a t=\"x\" i=\"2\"/>\n<a t=\"x\" i=\"1\"/></cfg>");
    ExpectWarnings({"5: /cfg/a[3] has the same i=\"1\" as /cfg/a[1] (line 3)"});
    Write("<cfg>\n<a t=\"x\" i=\"1\"/>\n<a t=\"x\" i=\"2\"/></cfg>");
    ExpectWarnings({});
}

TEST_F(KxconfigCheck, WarnsOfARepeatedAttributeThatTheFirstElementLacks)
{
    Write("<cfg>\n<a/>\n<a i=\"1\"/>\n<a i=\"1\"/></cfg>");
    ExpectWarnings({"5: /cfg/a[3] has the same i=\"1\" as /cfg/a[2] (line 4)"});
}

TEST_F(KxconfigCheck, TakesAllAttributesTogetherForWhatTellsElementsApart)
{
    Write("<cfg>\n<a c=\"1\" l=\"x\"/>\n<a c=\"1\" l=\"y\"/>\n<a c=\"2\" l=\"x\"/>\n"
          "<a c=\"2\" l=\"y\"/></cfg>");
    ExpectWarnings({});
    Write("<cfg>\n<a c=\"1\" l=\"x\"/>\n<a c=\"1\" l=\"y\"/>\n<a c=\"2\" l=\"x\"/>\n"
          "<a l=\"y\" c=\"1\"/></cfg>");
    ExpectWarnings({"6: /cfg/a[4] has the same c=\"1\" l=\"y\" as /cfg/a[2] (line 4)"});
}

TEST_F(KxconfigCheck, TakesNoAttributeThatIsTheSameEverywhereForOneThatTellsElementsApart)
{
    Write("<cfg>\n<a u=\"C\"/>\n<a u=\"C\"/></cfg>");
    ExpectWarnings({});
    Write("<cfg>\n<a u=\"C\"/>\n<a u=\"C\"/>\n<a u=\"C\" i=\"1\"/></cfg>");
    ExpectWarnings({});
}

TEST_F(KxconfigCheck, TakesAttributesAsConditionsSeeThem)
{
    // By the name without a prefix, of which the first counts, and with the DTD's default.
    Write("<!DOCTYPE cfg [\n<!ATTLIST a i CDATA \"1\">\n]>\n<cfg xmlns:p=\"urn:p\">\n<a/>\n"
          "<a i=\"1\"/>\n<a p:i=\"1\" i=\"2\"/>\n<a i=\"3\"/></cfg>");
    ExpectWarnings({"7: /cfg/a[2] has the same i=\"1\" as /cfg/a[1] (line 6); 1 more of that name "
                    "repeat others"});
}

TEST_F(KxconfigCheck, WarnsOnceOfTheElementsOfANameWhoseAttributesRepeat)
{
    Write("<cfg>\n<a i=\"1\"/>\n<a i=\"2\"/>\n<a i=\"1\"/>\n<a i=\"2\"/>\n<a i=\"1\"/>\n"
          "<b i=\"1\"/>\n<b i=\"1\"/>\n<b i=\"2\"/></cfg>");
    ExpectWarnings({"5: /cfg/a[3] has the same i=\"1\" as /cfg/a[1] (line 3); 2 more of that name "
                    "repeat others",
                    "9: /cfg/b[2] has the same i=\"1\" as /cfg/b[1] (line 8)"});
}

TEST_F(KxconfigCheck, ListsThreeOfTheAttributesThatRepeat)
{
    Write("<cfg>\n<a i=\"1\" j=\"2\" k=\"3\" l=\"4\"/>\n<a/>\n"
          "<a i=\"1\" j=\"2\" k=\"3\" l=\"4\"/></cfg>");
    ExpectWarnings({"5: /cfg/a[3] has the same i=\"1\" j=\"2\" k=\"3\" ... as /cfg/a[1] (line 3)"});
}

TEST_F(KxconfigCheck, TellsWhatSavingChangesFirst)
{
    const auto expect = [this](const std::string& bytes, const std::vector<std::string>& warnings)
    {
        m_file = m_folder.Write("cfg.xml", bytes);
        ExpectWarnings(warnings);
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
    expect(kDeclaration + "<cfg/>", {"2: saving changes the end of the file: \"\\n\" is added"});
    expect(kDeclaration + "<cfg/>\n\n",
           {"3: saving changes the end of the file: \"\\n\" is removed"});
}

TEST_F(KxconfigCheck, TellsThatSavingChangesAFileIfTheLibraryDoesChangeIt)
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
            const std::string out = Tool({"check", file}).out;
            EXPECT_EQ(changes, out.find(": saving changes ") != std::string::npos)
                << ReadFile(file) << out;
        }
    }
}

TEST_F(KxconfigCheck, NeedsNoPlaceForTemporaryFiles)
{
    Write("<cfg><a>1</a></cfg>");
    const Outcome outcome = Tool({"check", m_file}, {"TMPDIR=" + m_folder.Path("missing")});
    EXPECT_EQ(0, outcome.status) << outcome.err;
    EXPECT_EQ("", outcome.out + outcome.err);
}

TEST_F(KxconfigCheck, ReadsAPipeOnceAndTellsNothingOfSaving)
{
    Write("<cfg>\n<a>1</a>\n<a>2</a></cfg>");
    const Outcome outcome =
        RunShell("cat '" + m_file + "' | " + InShell(KX_CONFIG_TOOL) + " check /dev/stdin");
    EXPECT_EQ("/dev/stdin:4: \"cfg.a\" matches 2 elements, the first of them /cfg/a[1] (line 3)\n",
              outcome.out);
    EXPECT_EQ(1, outcome.status);
    EXPECT_EQ("", outcome.err);
}

TEST_F(KxconfigCheck, EscapesTheBytesOfAFileInAnotherEncoding)
{
    m_file = m_folder.Write("cfg.xml", "<?xml version=\"1.0\" encoding=\"ISO-8859-1\"?>\n"
                                       "<cfg>gr\xFCn</cfg>\n");
    EXPECT_THAT(Tool({"check", m_file, "cfg."}).out,
                HasSubstr(":2: saving changes the text: \"\\xfcn</cfg>\" becomes "
                          "\"\xC3\xBCn</cfg>\"\n"));
    // The character is shown whole also where its first byte is what the file has.
    m_file = m_folder.Write("cfg.xml", "<?xml version=\"1.0\" encoding=\"ISO-8859-1\"?>\n"
                                       "<cfg>\xC3z</cfg>\n");
    EXPECT_THAT(Tool({"check", m_file, "cfg."}).out,
                HasSubstr(":2: saving changes the text: \"\\xc3z</cfg>\" becomes "
                          "\"\xC3\x83z</cfg>\"\n"));
}

TEST_F(KxconfigCheck, TellsOfAFileOfOtherBytesThanItsCharacters)
{
    std::string utf16 = "\xFF\xFE";
    for (const char c : std::string("<cfg/>\n"))
    {
        utf16 += {c, '\0'};
    }
    m_file = m_folder.Write("cfg.xml", utf16);
    ExpectWarnings({"1: saving changes every character: UTF-16 becomes UTF-8"});
}

TEST_F(KxconfigCheck, TellsThatACompressedFileIsSavedPlain)
{
    const std::string plain = m_folder.Write("cfg.xml", kDeclaration + "<cfg/>\n");
    if (RunShell("gzip " + plain).status != 0)
    {
        GTEST_SKIP() << "needs gzip";
    }
    m_file = plain + ".gz";
    if (Tool({"get", m_file, "cfg.a"}).status == 3)
    {
        GTEST_SKIP() << "needs an engine that reads compressed files";
    }
    ExpectWarnings(
        {"1: saving changes the whole file: it is compressed, and is saved uncompressed"});
}

TEST_F(KxconfigCheck, LeavesTheFileAlone)
{
    m_file = m_folder.Write("cfg.xml", "<cfg><a i='1'/></cfg>");
    EXPECT_EQ(1, Tool({"check", m_file}).status);
    EXPECT_EQ("<cfg><a i='1'/></cfg>", ReadFile(m_file));
    EXPECT_EQ(3, Tool({"check", m_folder.Path("missing.xml")}).status);
}
