#include "CXMLReader.h"
#include "CXMLWriter.h"
#include "CXmlParser.h"
#include "DomTest.h"

#include <libxml/parser.h>

#include <gtest/gtest.h>

#include <filesystem>
#include <memory>
#include <type_traits>

#include <sys/stat.h>
#include <unistd.h>

using namespace kxtest;

namespace
{

static_assert(!std::is_copy_constructible<CXmlParser>::value, "");
static_assert(!std::is_copy_assignable<CXmlParser>::value, "");
static_assert(!std::is_polymorphic<CXmlParser>::value, "");

const Records kReadable = Traced("IsReadable");

// What the engine is asked for when a document is released. From 2.14 on its cleanup forgets
// whether blanks are kept, which is put back.
#if LIBXML_VERSION >= 21400
const Records kReleased = {Engine("xmlFreeDoc"), Engine("xmlKeepBlanksDefault"),
                           Engine("xmlCleanupParser"), Engine("xmlKeepBlanksDefault")};
#else
const Records kReleased = {Engine("xmlFreeDoc"), Engine("xmlCleanupParser")};
#endif

/** @return the document that holds what @p parser's root handle designates. */
xmlDocPtr DocumentOf(CXmlParser& parser)
{
    const xmlXPathObjectPtr result = parser.GetNodeSet("/", CXmlNode());
    const xmlNodePtr node = xmlXPathNodeSetItem(result->nodesetval, 0);
    xmlXPathFreeObject(result);
    return reinterpret_cast<xmlDocPtr>(node);
}

bool HoldsDocument(CXmlParser& parser)
{
    const xmlXPathObjectPtr result = parser.GetNodeSet("/", CXmlNode());
    const bool holds = result != nullptr;
    xmlXPathFreeObject(result);
    return holds;
}

/** Gives up the superuser's powers, to whom every file is open, from construction to destruction.
 */
class OrdinaryUser
{
public:
    explicit OrdinaryUser(const std::string& folder) : m_user(geteuid())
    {
        if (m_user == 0)
        {
            chmod(folder.c_str(), 0755);
            EXPECT_EQ(0, seteuid(65534));
        }
    }
    ~OrdinaryUser() { EXPECT_EQ(0, seteuid(m_user)); }
    OrdinaryUser(const OrdinaryUser&) = delete;
    OrdinaryUser& operator=(const OrdinaryUser&) = delete;

private:
    const uid_t m_user;
};

class DocumentTest : public DomTest
{
protected:
    DocumentTest()
    {
        // What the engine sets up anew after each release is in the balance of both ends.
        xmlCleanupParser();
        xmlInitParser();
    }

    TemporaryFolder m_folder;
    const std::string m_file = m_folder.Write("cfg.xml", "<cfg>\n  <name>box</name>\n</cfg>\n");
    const std::string m_other = m_folder.Write("other.xml", "<other/>");
    const std::string m_broken = m_folder.Write("broken.xml", "<cfg><name></cfg>");
    const std::string m_missing = m_folder.Path("missing.xml");
    const std::string m_target = m_folder.Write("target.xml", "");
};

} // namespace

// --- Construction and destruction

TEST_F(DocumentTest, NewObjectIsEmpty)
{
    CXmlParser parser;
    EXPECT_TRUE(parser.GetRootNode().IsNull());
    EXPECT_FALSE(HoldsDocument(parser));
    LogRecorder log(kMaskError);
    EXPECT_EQ(22, parser.SaveXml(""));
    EXPECT_EQ(Records({Error("SaveXml", "m_pXmlDoc is NULL")}), log.Take());
}

TEST_F(DocumentTest, ConstructorAndDestructorTraceInsideTheirRootHandle)
{
    ExpectRecords(kMade + Traced("CXmlParser") + Traced("~CXmlParser") + kGone,
                  [] { CXmlParser parser; });
}

TEST_F(DocumentTest, EveryConstructionTurnsBlanksOff)
{
    EngineCalls calls;
    CXmlParser first;
    CXmlParser second;
    EXPECT_EQ(std::vector<int>({0, 0}), calls.BlanksDefaults());
}

TEST_F(DocumentTest, ConstructionActsOnParsesOfTheReader)
{
    CXMLReader before(m_file);
    EXPECT_EQ(XML_TEXT_NODE,
              xmlDocGetRootElement(static_cast<xmlDocPtr>(before.GetDataPtr()))->children->type);
    CXmlParser parser;
    CXMLReader after(m_file);
    EXPECT_EQ(XML_ELEMENT_NODE,
              xmlDocGetRootElement(static_cast<xmlDocPtr>(after.GetDataPtr()))->children->type);
}

TEST_F(DocumentTest, DestructorFreesTheDocumentOnce)
{
    auto parser = std::make_unique<CXmlParser>();
    ASSERT_EQ(0, parser->ParseXml(m_file));
    const void* const document = DocumentOf(*parser);
    EngineCalls calls;
    parser.reset();
    EXPECT_EQ(1u, calls.Freed(document));
    EXPECT_EQ(1u, calls.Frees());
    EXPECT_EQ(1u, calls.Cleanups());
}

TEST_F(DocumentTest, DestructorWithoutDocumentFreesNothing)
{
    EngineCalls calls;
    {
        CXmlParser parser;
    }
    EXPECT_EQ(0u, calls.Frees());
    EXPECT_EQ(0u, calls.Cleanups());
}

TEST_F(DocumentTest, LoadingSavingAndDestroyingLosesNothing)
{
    const NewCounter heap;
    const EngineMemory memory;
    {
        CXmlParser parser;
        EXPECT_EQ(0, parser.ParseXml(m_file));
        EXPECT_EQ(0, parser.ParseXml(m_other));
        EXPECT_EQ(22, parser.ParseXml(m_broken));
        EXPECT_EQ(0, parser.CreateNewXmlDoc("cfg"));
        EXPECT_EQ(0, parser.SaveXml(m_target));
    }
    TakeEngineErrors();
    xmlCleanupParser();
    xmlInitParser();
    EXPECT_EQ(0, heap.Live());
    EXPECT_EQ(0, memory.Live());
}

// --- ClearDocument

TEST_F(DocumentTest, ClearDocumentReleasesEverything)
{
    CXmlParser parser;
    ASSERT_EQ(0, parser.ParseXml(m_file));
    const void* const document = DocumentOf(parser);
    EXPECT_FALSE(parser.GetRootNode().IsNull());
    EngineCalls calls;
    parser.ClearDocument();
    EXPECT_EQ(1u, calls.Freed(document));
    EXPECT_EQ(1u, calls.Cleanups());
    EXPECT_TRUE(parser.GetRootNode().IsNull());
    EXPECT_FALSE(HoldsDocument(parser));

    // The recorded path is gone too.
    ASSERT_EQ(0, parser.CreateNewXmlDoc("x"));
    EXPECT_EQ(7, parser.SaveXml(""));
}

TEST_F(DocumentTest, ClearDocumentWithoutDocumentLeavesTheEngineAlone)
{
    CXmlParser parser;
    EngineCalls calls;
    parser.ClearDocument();
    EXPECT_EQ(0u, calls.Frees());
    EXPECT_EQ(0u, calls.Cleanups());
}

TEST_F(DocumentTest, ClearDocumentForgetsThePathOfAFailedLoad)
{
    CXmlParser parser;
    EXPECT_EQ(7, parser.ParseXml(m_missing));
    parser.ClearDocument();
    ASSERT_EQ(0, parser.CreateNewXmlDoc("x"));
    LogRecorder log(kMaskError);
    WriteFile(m_missing, "");
    EXPECT_EQ(7, parser.SaveXml(""));
    EXPECT_EQ(Records({Error("SaveXml", "File not exists :: ")}), log.Take());
}

TEST_F(DocumentTest, ClearDocumentLogsNothing)
{
    CXmlParser parser;
    for (int i = 0; i < 2; ++i)
    {
        ASSERT_EQ(0, parser.ParseXml(m_file));
        ExpectRecords({}, [&] { parser.ClearDocument(); });
    }
}

// --- ParseXml

TEST_F(DocumentTest, LoadedDocumentHasARecordedRoot)
{
    CXmlParser parser;
    EXPECT_EQ(0, parser.ParseXml(m_file));
    EXPECT_EQ("cfg", parser.GetRootNode().Name());
    ExpectRecords(Traced("ParseXml", kReadable + kSet), [&] { parser.ParseXml(m_file); });
}

TEST_F(DocumentTest, PathGoesToTheEngineAsItIs)
{
    CXmlParser parser;
    EngineCalls calls;
    EXPECT_EQ(0, parser.ParseXml(m_file));
    EXPECT_EQ(std::vector<std::string>({m_file}), calls.Parsed());
}

TEST_F(DocumentTest, LoadingASecondFileFreesTheFirstDocument)
{
    CXmlParser parser;
    ASSERT_EQ(0, parser.ParseXml(m_file));
    const void* const first = DocumentOf(parser);
    EngineCalls calls;
    EXPECT_EQ(0, parser.ParseXml(m_other));
    EXPECT_EQ(1u, calls.Freed(first));
    EXPECT_EQ(1u, calls.Cleanups());
    EXPECT_EQ("other", parser.GetRootNode().Name());
}

TEST_F(DocumentTest, MissingFileAnswers7AndIsNotGivenToTheEngine)
{
    CXmlParser parser;
    EngineCalls calls;
    EXPECT_EQ(7, parser.ParseXml(m_missing));
    EXPECT_TRUE(calls.Parsed().empty());
    EXPECT_TRUE(parser.GetRootNode().IsNull());
    ExpectRecords(Traced("ParseXml", kReadable + Records({Error("ParseXml", "File not exists :: " +
                                                                                m_missing)})),
                  [&] { parser.ParseXml(m_missing); });
}

TEST_F(DocumentTest, MissingFileIsRecordedAndNothingIsHeld)
{
    CXmlParser parser;
    ASSERT_EQ(0, parser.ParseXml(m_file));
    EXPECT_EQ(7, parser.ParseXml(m_missing));
    EXPECT_FALSE(HoldsDocument(parser));
    EXPECT_TRUE(parser.GetRootNode().IsNull());
    ExpectRecords(Traced("SaveXml", {Error("SaveXml", "m_pXmlDoc is NULL")}),
                  [&] { EXPECT_EQ(22, parser.SaveXml("")); });
}

TEST_F(DocumentTest, FileThatIsNotWellFormedAnswers22)
{
    CXmlParser parser;
    ASSERT_EQ(0, parser.ParseXml(m_file));
    EXPECT_EQ(22, parser.ParseXml(m_broken));
    EXPECT_FALSE(HoldsDocument(parser));
    EXPECT_TRUE(parser.GetRootNode().IsNull());
    const Records records = {Error("ParseXml", "Document not parsed successfully :: " + m_broken)};
    ExpectRecords(Traced("ParseXml", kReadable + records), [&] { parser.ParseXml(m_broken); });
    TakeEngineErrors();
}

TEST_F(DocumentTest, DirectoryOpensButDoesNotParse)
{
    CXmlParser parser;
    EXPECT_EQ(22, parser.ParseXml(m_folder.Path("")));
    TakeEngineErrors();
}

TEST_F(DocumentTest, PathMayHoldAnyCharacters)
{
    const std::string path = m_folder.Write("100%s %d.xml", "<a/>");
    CXmlParser parser;
    LogRecorder log(kMaskError);
    EXPECT_EQ(0, parser.ParseXml(path));
    unlink(path.c_str());
    EXPECT_EQ(7, parser.ParseXml(path));
    EXPECT_EQ(Records({Error("ParseXml", "File not exists :: " + path)}), log.Take());
    EXPECT_EQ("File not exists :: %s", LogRecorder::LastFormat());
}

// --- SaveXml

TEST_F(DocumentTest, SavesOverTheRecordedPath)
{
    CXmlParser parser;
    ASSERT_EQ(0, parser.ParseXml(m_file));
    parser.GetRootNode().FindChildNode("name").SetContent("lid");
    EngineCalls calls;
    EXPECT_EQ(0, parser.SaveXml(""));
    EXPECT_EQ(std::vector<std::string>({m_file + " UTF-8 1"}), calls.FormatSaves());
    EXPECT_EQ("<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n<cfg>\n  <name>lid</name>\n</cfg>\n",
              ReadFile(m_file));
    ExpectRecords(Traced("SaveXml", kReadable), [&] { parser.SaveXml(""); });
}

TEST_F(DocumentTest, SavingToAnotherPathKeepsTheRecordedOne)
{
    CXmlParser parser;
    ASSERT_EQ(0, parser.ParseXml(m_file));
    EXPECT_EQ(0, parser.SaveXml(m_target));
    const std::string saved = ReadFile(m_target);
    EXPECT_NE("", saved);
    EXPECT_NE(saved, ReadFile(m_file));
    EXPECT_EQ(0, parser.SaveXml(""));
    EXPECT_EQ(saved, ReadFile(m_file));
}

TEST_F(DocumentTest, SavingNeverCreatesAFile)
{
    CXmlParser parser;
    ASSERT_EQ(0, parser.ParseXml(m_file));
    EXPECT_EQ(7, parser.SaveXml(m_missing));
    EXPECT_FALSE(FileExists(m_missing));
    ExpectRecords(Traced("SaveXml", kReadable + Records({Error("SaveXml", "File not exists :: " +
                                                                              m_missing)})),
                  [&] { parser.SaveXml(m_missing); });

    WriteFile(m_missing, "");
    EXPECT_EQ(0, parser.SaveXml(m_missing));
    EXPECT_NE("", ReadFile(m_missing));
}

TEST_F(DocumentTest, FailedRecordedPathIsLoggedAsAnEmptyString)
{
    CXmlParser parser;
    ASSERT_EQ(0, parser.ParseXml(m_file));
    unlink(m_file.c_str());
    ExpectRecords(Traced("SaveXml", kReadable + Records({Error("SaveXml", "File not exists :: ")})),
                  [&] { EXPECT_EQ(7, parser.SaveXml("")); });
}

TEST_F(DocumentTest, SavingWithoutDocumentAsksForNoFile)
{
    CXmlParser parser;
    EXPECT_EQ(22, parser.SaveXml(m_target));
    EXPECT_EQ("", ReadFile(m_target));
    ExpectRecords(Traced("SaveXml", {Error("SaveXml", "m_pXmlDoc is NULL")}),
                  [&] { parser.SaveXml(m_target); });
}

TEST_F(DocumentTest, FailedWriteAnswersMinus2WithoutAMessage)
{
    CXmlParser parser;
    ASSERT_EQ(0, parser.ParseXml(m_file));
    for (const int answer : {-1, -1549})
    {
        ExpectRecords(Traced("SaveXml", kReadable),
                      [&]
                      {
                          AnswerNextFormatSave(answer);
                          EXPECT_EQ(-2, parser.SaveXml(m_target));
                      });
    }
}

TEST_F(DocumentTest, AnyOtherAnswerOfTheWriteIsSuccess)
{
    CXmlParser parser;
    ASSERT_EQ(0, parser.ParseXml(m_file));
    AnswerNextFormatSave(0);
    EXPECT_EQ(0, parser.SaveXml(m_target));
}

TEST_F(DocumentTest, FileThatCanBeReadButNotWrittenAnswersMinus2)
{
    CXmlParser parser;
    ASSERT_EQ(0, parser.ParseXml(m_file));
    chmod(m_target.c_str(), 0444);
    {
        const OrdinaryUser user(m_folder.Path(""));
        EXPECT_EQ(-2, parser.SaveXml(m_target));
    }
    TakeEngineErrors();
}

TEST_F(DocumentTest, DirectoryAsTargetAnswersMinus2)
{
    CXmlParser parser;
    ASSERT_EQ(0, parser.ParseXml(m_file));
    EXPECT_EQ(-2, parser.SaveXml(m_folder.Path("")));
    TakeEngineErrors();
}

TEST_F(DocumentTest, BlanksAreDroppedAndElementsIndented)
{
    WriteFile(m_file, "<a>\n\n <b  z='1'   y='2'>  </b> <c><d/>\n</c><e>text <f/> tail</e></a>");
    CXmlParser parser;
    ASSERT_EQ(0, parser.ParseXml(m_file));
    EXPECT_EQ(0, parser.SaveXml(""));
    EXPECT_EQ("<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n"
              "<a>\n"
              "  <b z=\"1\" y=\"2\">  </b>\n"
              "  <c>\n"
              "    <d/>\n"
              "  </c>\n"
              "  <e>text <f/> tail</e>\n"
              "</a>\n",
              ReadFile(m_file));
}

TEST_F(DocumentTest, OtherEncodingsAreSavedAsUtf8)
{
    WriteFile(m_file, "<?xml version='1.0' encoding='ISO-8859-1'?>\n<a n='\xE4'>\xFC</a>");
    CXmlParser parser;
    ASSERT_EQ(0, parser.ParseXml(m_file));
    EXPECT_EQ(0, parser.SaveXml(""));
    EXPECT_EQ("<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n<a n=\"\xC3\xA4\">\xC3\xBC</a>\n",
              ReadFile(m_file));
}

TEST_F(DocumentTest, CreatedDocumentIsSavedWhole)
{
    CXmlParser parser;
    ASSERT_EQ(0, parser.CreateNewXmlDoc("cfg"));
    CXmlNode net = parser.AddNewNode(parser.GetRootNode(), "net", "");
    net.AddNewAttribute("id", "1");
    net.AddNewAttribute("a", "2");
    net.AddChildNode("port", "80").AddSiblingNode("name", "\xC3\xA4 &lt; b");
    EXPECT_EQ(0, parser.SaveXml(m_target));
    EXPECT_EQ("<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n"
              "<cfg>\n"
              "  <net id=\"1\" a=\"2\">\n"
              "    <port>80</port>\n"
              "    <name>\xC3\xA4 &lt; b</name>\n"
              "  </net>\n"
              "</cfg>\n",
              ReadFile(m_target));
}

// --- CreateNewXmlDoc

TEST_F(DocumentTest, CreatedDocumentHasARecordedRoot)
{
    CXmlParser parser;
    EXPECT_EQ(0, parser.CreateNewXmlDoc("cfg"));
    CXmlNode root = parser.GetRootNode();
    EXPECT_EQ("cfg", root.Name());
    EXPECT_TRUE(root.FirstChild().IsNull());
    EXPECT_EQ("<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n<cfg/>\n",
              Serialized(DocumentOf(parser)));
    EXPECT_EQ(nullptr, xmlDocGetRootElement(DocumentOf(parser))->ns);
    ExpectRecords(Traced("CreateNewXmlDoc", kSet), [&] { parser.CreateNewXmlDoc("cfg"); });
}

TEST_F(DocumentTest, CreatedDocumentHasNoRecordedPath)
{
    CXmlParser parser;
    ASSERT_EQ(0, parser.ParseXml(m_file));
    ASSERT_EQ(0, parser.CreateNewXmlDoc("cfg"));
    ExpectRecords(Traced("SaveXml", kReadable + Records({Error("SaveXml", "File not exists :: ")})),
                  [&] { EXPECT_EQ(7, parser.SaveXml("")); });
}

TEST_F(DocumentTest, CreatingReplacesTheHeldDocument)
{
    CXmlParser parser;
    ASSERT_EQ(0, parser.ParseXml(m_file));
    const void* const document = DocumentOf(parser);
    EngineCalls calls;
    EXPECT_EQ(0, parser.CreateNewXmlDoc("cfg"));
    EXPECT_EQ(1u, calls.Freed(document));
    EXPECT_EQ(1u, calls.Cleanups());
}

TEST_F(DocumentTest, EmptyRootNameAnswers7AndDropsTheHeldDocument)
{
    CXmlParser parser;
    ASSERT_EQ(0, parser.ParseXml(m_file));
    const void* const document = DocumentOf(parser);
    {
        EngineCalls calls;
        EXPECT_EQ(7, parser.CreateNewXmlDoc(""));
        EXPECT_EQ(1u, calls.Freed(document));
    }
    EXPECT_FALSE(HoldsDocument(parser));
    EXPECT_TRUE(parser.GetRootNode().IsNull());
    ExpectRecords(
        Traced("CreateNewXmlDoc", {Error("CreateNewXmlDoc", "Invalid root node name :: ")}),
        [&] { parser.CreateNewXmlDoc(""); });
    EXPECT_EQ(22, parser.SaveXml(""));
}

// --- GetRootNode

TEST_F(DocumentTest, GetRootNodeCopiesTheRecordedHandle)
{
    CXmlParser parser;
    EXPECT_TRUE(parser.GetRootNode().IsNull());
    ExpectRecords(Traced("GetRootNode") + kGone, [&] { parser.GetRootNode(); });
    ASSERT_EQ(0, parser.ParseXml(m_file));
    ExpectRecords(Traced("GetRootNode") + kGone, [&] { parser.GetRootNode(); });
    parser.GetRootNode().SetXmlNodePtr(nullptr);
    EXPECT_EQ("cfg", parser.GetRootNode().Name());
    parser.ClearDocument();
    EXPECT_TRUE(parser.GetRootNode().IsNull());
}

TEST_F(DocumentTest, RemovedRootElementStaysRecorded)
{
    CXmlParser parser;
    ASSERT_EQ(0, parser.ParseXml(m_file));
    EXPECT_EQ(0, parser.RemoveNode(parser.GetRootNode()));
    EXPECT_FALSE(parser.GetRootNode().IsNull());
    EXPECT_TRUE(parser.FindNode("/*", CXmlNode()).IsNull());
}

// --- IsReadable

TEST_F(DocumentTest, ExistingFileIsReadableAndUnchanged)
{
    CXmlParser parser;
    const std::string before = ReadFile(m_file);
    const auto written = std::filesystem::last_write_time(m_file);
    EXPECT_TRUE(parser.IsReadable(m_file));
    EXPECT_TRUE(parser.IsReadable(m_target));
    EXPECT_EQ(before, ReadFile(m_file));
    EXPECT_EQ(written, std::filesystem::last_write_time(m_file));
    ExpectRecords(kReadable, [&] { parser.IsReadable(m_file); });
}

TEST_F(DocumentTest, MissingFileIsNotReadableAndNotCreated)
{
    CXmlParser parser;
    EXPECT_FALSE(parser.IsReadable(m_missing));
    EXPECT_FALSE(parser.IsReadable(""));
    EXPECT_FALSE(FileExists(m_missing));
    ExpectRecords(kReadable, [&] { parser.IsReadable(m_missing); });
}

TEST_F(DocumentTest, FileWithoutReadPermissionIsNotReadable)
{
    CXmlParser parser;
    chmod(m_file.c_str(), 0200);
    chmod(m_other.c_str(), 0644);
    const OrdinaryUser user(m_folder.Path(""));
    EXPECT_FALSE(parser.IsReadable(m_file));
    EXPECT_TRUE(parser.IsReadable(m_other));
}

TEST_F(DocumentTest, IsReadableLeavesNoFileOpen)
{
    CXmlParser parser;
    const auto open = []
    {
        const std::filesystem::directory_iterator files("/proc/self/fd");
        return std::distance(begin(files), end(files));
    };
    const auto before = open();
    parser.IsReadable(m_file);
    EXPECT_EQ(before, open());
}

TEST_F(DocumentTest, LoadingReleasesTheDocumentHeldBeforeItLooksAtTheFile)
{
    CXmlParser parser;
    ASSERT_EQ(0, parser.ParseXml(m_file));
    EngineCalls calls;
    calls.ShowAmongRecords();
    LogRecorder log;
    EXPECT_EQ(0, parser.ParseXml(m_other));
    EXPECT_EQ(Traced("ParseXml", kReleased + kReadable + Records({Engine("xmlParseFile")}) + kSet),
              log.Take());
}

// --- What a release does to others

TEST_F(DocumentTest, DocumentsHeldElsewhereSurviveARelease)
{
    CXMLReader reader(m_file);
    CXMLWriter writer(m_file);
    ASSERT_EQ(0, writer.SetPath(m_target));
    CXmlParser other;
    ASSERT_EQ(0, other.ParseXml(m_file));
    {
        CXmlParser parser;
        ASSERT_EQ(0, parser.ParseXml(m_other));
    }
    EXPECT_EQ("box", reader.GetValue("cfg.name"));
    const xmlDocPtr document = static_cast<xmlDocPtr>(reader.GetDataPtr());
    CXmlNode(xmlDocGetRootElement(document)).FindChildNode("name").SetContent("crate");
    EXPECT_EQ("crate", reader.GetValue("cfg.name"));
    EXPECT_EQ(0, writer.SetValue("cfg.name", "lid"));
    EXPECT_EQ(0, writer.SaveData());
    EXPECT_NE(std::string::npos, ReadFile(m_target).find("<name>lid</name>"));

    EXPECT_EQ("box", other.FindNode("//name", CXmlNode()).GetContent());
    EXPECT_EQ(0, other.SaveXml(""));
    CXMLReader later(m_file);
    EXPECT_EQ("box", later.GetValue("cfg.name"));
    EXPECT_EQ(0, other.ParseXml(m_other));
}

TEST_F(DocumentTest, WhatTheEngineIsAskedForLiesInsideTheTrace)
{
    const Records refused = {Error("CreateNewXmlDoc", "Invalid root node name :: ")};
    EngineCalls calls;
    calls.ShowAmongRecords();
    LogRecorder log;
    {
        CXmlParser parser;
        EXPECT_EQ(kMade + Traced("CXmlParser", {Engine("xmlKeepBlanksDefault")}), log.Take());
        EXPECT_EQ(0, parser.ParseXml(m_file));
        log.Take();
        EXPECT_EQ(0, parser.CreateNewXmlDoc("cfg"));
        EXPECT_EQ(Traced("CreateNewXmlDoc", kReleased + kSet), log.Take());
        EXPECT_EQ(7, parser.CreateNewXmlDoc(""));
        EXPECT_EQ(Traced("CreateNewXmlDoc", kReleased + refused), log.Take());
        EXPECT_EQ(0, parser.CreateNewXmlDoc("cfg"));
        log.Take();
    }
    EXPECT_EQ(Traced("~CXmlParser", kReleased) + kGone, log.Take());
}

TEST_F(DocumentTest, LoadedDocumentWithoutARootIsHeld)
{
    CXmlParser parser;
    AnswerNextParse(xmlNewDoc(nullptr));
    LogRecorder log;
    EXPECT_EQ(0, parser.ParseXml(m_file));
    EXPECT_EQ(Traced("ParseXml", kReadable + kSet), log.Take());
    EXPECT_TRUE(parser.GetRootNode().IsNull());
    EXPECT_TRUE(HoldsDocument(parser));
}

TEST_F(DocumentTest, LinkToAFileIsReadable)
{
    CXmlParser parser;
    const std::string link = m_folder.Path("link.xml");
    ASSERT_EQ(0, symlink(m_file.c_str(), link.c_str()));
    EXPECT_TRUE(parser.IsReadable(link));
}
