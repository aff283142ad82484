// Every allocation of the engine failed in turn, for each operation that allocates.

#include "CXmlParser.h"
#include "DomTest.h"

#include <libxml/parser.h>
#include <libxml/xpath.h>

#include <sys/wait.h>
#include <unistd.h>

using namespace kxtest;

namespace
{

/** How a process of its own ended: with what @p operation answered, or not by itself (-1). */
template <class Operation>
int InAProcess(const Operation& operation)
{
    const pid_t child = fork();
    if (child == 0)
    {
        close(STDERR_FILENO);
        _exit(operation());
    }
    int status = 0;
    waitpid(child, &status, 0);
    return WIFEXITED(status) && WEXITSTATUS(status) <= 2 ? WEXITSTATUS(status) : -1;
}

class OutOfMemoryTest : public DomTest
{
protected:
    ~OutOfMemoryTest() override { TakeEngineErrors(); }
};

} // namespace

TEST_F(OutOfMemoryTest, AddingAChildYieldsItOrSaysWhyNot)
{
    FailInTurn(
        [](std::size_t n)
        {
            const EngineMemory memory;
            const xmlDocPtr document = NewDocument("r");
            CXmlNode root(document->children);
            const EngineMemory made;
            CXmlNode child;
            LogRecorder log(kMaskError);
            const bool failed =
                Failing<EngineMemory>(n, [&] { child = root.AddChildNode("c", "text"); });
            if (child.IsNull())
            {
                EXPECT_TRUE(failed);
                EXPECT_EQ(Records({Error("AddChildNode", "Error creating child node")}),
                          log.Take());
                EXPECT_EQ(0, made.Live());
                EXPECT_EQ("<r/>", TextOf(document->children));
            }
            else
            {
                EXPECT_EQ(Records(), log.Take());
                EXPECT_EQ("c", child.Name());
                EXPECT_EQ("c", root.FirstChild().Name());
                EXPECT_TRUE(failed || TextOf(document->children) == "<r><c>text</c></r>");
            }
            xmlFreeDoc(document);
            EXPECT_EQ(0, memory.Live());
            return failed;
        });
}

TEST_F(OutOfMemoryTest, ChildThatCannotBeMadeIsReportedInPlace)
{
    CXmlNode root(Node("/*"));
    const std::string before = Text();
    ExpectRecords(Traced("AddChildNode",
                         kMade + Records({Error("AddChildNode", "Error creating child node")})) +
                      kGone,
                  [&] { Failing<EngineMemory>(1, [&] { root.AddChildNode("c", ""); }); });
    EXPECT_EQ(before, Text());
}

TEST_F(OutOfMemoryTest, AddingASiblingYieldsItOrNothing)
{
    FailInTurn(
        [](std::size_t n)
        {
            const EngineMemory memory;
            const xmlDocPtr document = NewDocument("r");
            CXmlNode first = CXmlNode(document->children).AddChildNode("a", "");
            const EngineMemory made;
            CXmlNode sibling;
            LogRecorder log(kMaskError);
            const bool failed =
                Failing<EngineMemory>(n, [&] { sibling = first.AddSiblingNode("b", "text"); });
            EXPECT_EQ(Records(), log.Take());
            if (sibling.IsNull())
            {
                EXPECT_TRUE(failed);
                EXPECT_EQ(0, made.Live());
                EXPECT_EQ("<r><a/></r>", TextOf(document->children));
            }
            else
            {
                EXPECT_EQ("b", first.NextSibling().Name());
                EXPECT_TRUE(failed || TextOf(document->children) == "<r><a/><b>text</b></r>");
            }
            xmlFreeDoc(document);
            EXPECT_EQ(0, memory.Live());
            return failed;
        });
}

TEST_F(OutOfMemoryTest, SettingContentLosesNoMemory)
{
    FailInTurn(
        [](std::size_t n)
        {
            const EngineMemory memory;
            const xmlDocPtr document = NewDocument("r");
            CXmlNode root(document->children);
            root.AddChildNode("c", "text");
            int status = -1;
            const bool failed = Failing<EngineMemory>(n, [&] { status = root.SetContent("new"); });
            EXPECT_EQ(0, status);
            // Short of memory, older engines leave the element empty and newer ones as it was.
            EXPECT_TRUE(failed || TextOf(document->children) == "<r>new</r>");
            xmlFreeDoc(document);
            EXPECT_EQ(0, memory.Live());
            return failed;
        });
}

TEST_F(OutOfMemoryTest, ContentIsReadOrEmpty)
{
    CXmlNode node(Node("//name"));
    FailInTurn(
        [&](std::size_t n)
        {
            const EngineMemory memory;
            std::string content;
            const bool failed = Failing<EngineMemory>(n, [&] { content = node.GetContent(); });
            EXPECT_TRUE(content == "box" || (failed && content.empty())) << content;
            EXPECT_EQ(content.empty() ? 0 : 1, memory.Live());
            return failed;
        });
}

TEST_F(OutOfMemoryTest, ContentOfAChildIsReadOrEmpty)
{
    CXmlNode root(Node("/*"));
    FailInTurn(
        [&](std::size_t n)
        {
            std::string value = "before";
            int status = -1;
            const bool failed = Failing<EngineMemory>(
                n, [&] { status = root.GetContentOfChildNode("name", value); });
            EXPECT_EQ(0, status);
            EXPECT_TRUE(value == "box" || (failed && value.empty())) << value;
            return failed;
        });
}

TEST_F(OutOfMemoryTest, AttributeIsAddedWholeOrItIsSaidWhyNot)
{
    FailInTurn(
        [](std::size_t n)
        {
            const EngineMemory memory;
            const xmlDocPtr document = NewDocument("r");
            CXmlNode root(document->children);
            const EngineMemory made;
            int status = -1;
            LogRecorder log(kMaskError);
            const bool failed =
                Failing<EngineMemory>(n, [&] { status = root.AddNewAttribute("a", "1"); });
            EXPECT_EQ(failed ? 22 : 0, status);
            if (failed)
            {
                EXPECT_EQ(Records({Error("AddNewAttribute", "Unable to add new property :: a")}),
                          log.Take());
                EXPECT_EQ("<r/>", TextOf(document->children));
                EXPECT_EQ(0, made.Live());
            }
            else
            {
                EXPECT_EQ(Records(), log.Take());
                EXPECT_EQ("<r a=\"1\"/>", TextOf(document->children));
            }
            xmlFreeDoc(document);
            EXPECT_EQ(0, memory.Live());
            return failed;
        });
}

TEST_F(OutOfMemoryTest, AttributeIsReadOrReportedMissing)
{
    CXmlNode net(Node("//net"));
    FailInTurn(
        [&](std::size_t n)
        {
            const EngineMemory memory;
            std::string value = "before";
            int status = -1;
            LogRecorder log(kMaskError);
            const bool failed =
                Failing<EngineMemory>(n, [&] { status = net.GetAttributeValue("mode", value); });
            EXPECT_EQ(failed ? 22 : 0, status);
            EXPECT_EQ(failed ? "before" : "on", value);
            EXPECT_EQ(failed
                          ? Records({Error("GetAttributeValue", "Attribute key :: mode not found")})
                          : Records(),
                      log.Take());
            EXPECT_EQ(0, memory.Live());
            return failed;
        });
}

TEST_F(OutOfMemoryTest, ClearingAndRemovingAskForNothing)
{
    CXmlNode net(Node("//net"));
    CXmlParser parser;
    const EngineMemory memory;
    net.RemoveChildNode("port");
    net.ClearNode();
    parser.RemoveNode(net);
    EXPECT_EQ(0u, memory.Requests());
}

TEST_F(OutOfMemoryTest, FileIsLoadedOrReported)
{
    const TemporaryFolder folder;
    const std::string file = folder.Write("cfg.xml", "<cfg a='1'><b>text</b></cfg>");
    FailInTurn(
        [&](std::size_t n)
        {
            xmlInitParser();
            CXmlParser parser;
            int status = -1;
            LogRecorder log(kMaskError);
            const bool failed = Failing<EngineMemory>(n, [&] { status = parser.ParseXml(file); });
            if (status == 0)
            {
                EXPECT_EQ(Records(), log.Take());
                // Some engines answer a document without a root when memory runs out.
                EXPECT_TRUE(failed || parser.GetRootNode().Name() == "cfg");
            }
            else
            {
                EXPECT_EQ(22, status);
                EXPECT_EQ(
                    Records({Error("ParseXml", "Document not parsed successfully :: " + file)}),
                    log.Take());
                EXPECT_TRUE(parser.GetRootNode().IsNull());
            }
            return failed;
        });
}

TEST_F(OutOfMemoryTest, FileIsSavedOrMinus2IsAnswered)
{
    const TemporaryFolder folder;
    const std::string file = folder.Write("cfg.xml", "");
    CXmlParser parser;
    ASSERT_EQ(0, parser.CreateNewXmlDoc("cfg"));
    parser.GetRootNode().AddChildNode("b", "text");
    FailInTurn(
        [&](std::size_t n)
        {
            int status = -1;
            LogRecorder log(kMaskError);
            const bool failed = Failing<EngineMemory>(n, [&] { status = parser.SaveXml(file); });
            EXPECT_TRUE(status == 0 || (status == -2 && failed)) << status;
            EXPECT_EQ(Records(), log.Take());
            if (!failed)
            {
                EXPECT_EQ(
                    "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n<cfg>\n  <b>text</b>\n</cfg>\n",
                    ReadFile(file));
            }
            return failed;
        });
}

TEST_F(OutOfMemoryTest, DocumentIsCreatedOrItIsSaidWhyNot)
{
    const char* const kNoDocument = "Unable to create new xml document structure";
    const char* const kNoRoot = "Error creating new root node";
    std::vector<std::string> messages;
    for (std::size_t n = 1;; ++n)
    {
        CXmlParser parser;
        EngineCalls calls;
        LogRecorder log;
        EngineMemory::FailAt(n);
        const int status = parser.CreateNewXmlDoc("cfg");
        const bool failed = EngineMemory::Failed();
        EngineMemory::FailAt(0);
        const Records records = log.Take();
        if (!failed)
        {
            EXPECT_EQ(0, status);
            break;
        }
        EXPECT_EQ(22, status);
        ASSERT_EQ(3u, records.size());
        EXPECT_EQ(9, records[1].level);
        messages.push_back(records[1].text);
        EXPECT_EQ(Traced("CreateNewXmlDoc", {Error("CreateNewXmlDoc", messages.back())}), records);
        EXPECT_TRUE(parser.GetRootNode().IsNull());

        // A document without a root stays held and is freed by the next release.
        const bool holds = messages.back() == kNoRoot;
        EXPECT_EQ(holds ? 7 : 22, parser.SaveXml(""));
        parser.ClearDocument();
        EXPECT_EQ(holds ? 1u : 0u, calls.Frees());
    }
    EXPECT_EQ(kNoDocument, messages.front());
    EXPECT_EQ(kNoRoot, messages.back());
}

TEST_F(OutOfMemoryTest, QueryAnswersOrSaysWhyNot)
{
    const TemporaryFolder folder;
    CXmlParser parser;
    ASSERT_EQ(0, parser.ParseXml(folder.Write("a.xml", "<a><b/><x/><b/></a>")));
    const Record noContext = XPath("GetNodeSet", "Unable to create new XPath context");
    const Record noAnswer = XPath("GetNodeSet", "Unable to evaluate nodepath :: \"//b\"");

    // Answers 0 when the request came, 1 when it did not, 2 for a wrong answer or record.
    const auto attempt = [&](std::size_t n, const std::string& tag, auto find)
    {
        bool found = false;
        EngineCalls calls;
        LogRecorder log(kMaskXPath | kMaskError);
        const bool failed = Failing<EngineMemory>(n, [&] { found = find("//b", CXmlNode()); });
        const Records records = log.Take();
        const Record noResult = XPath(tag, "xmlXPathObjectPtr is NULL");
        const bool right =
            found ? records.empty()
                  : failed && (records == Records({XPath(tag, "NodeSetVal is NULL")}) ||
                               records == Records({noContext, noResult}) ||
                               records == Records({noAnswer, noResult}));
        return right && calls.LiveContexts() == 0 ? (failed ? 0 : 1) : 2;
    };
    // Some engines end the process when one of these requests fails, regardless of the caller.
    const auto engineSurvives = [&](std::size_t n)
    {
        return InAProcess(
                   [&]
                   {
                       EngineMemory::FailAt(n);
                       const auto context = xmlXPathNewContext(Node("/*")->doc);
                       if (context != nullptr)
                       {
                           xmlXPathEvalExpression(reinterpret_cast<const xmlChar*>("//b"), context);
                       }
                       return 0;
                   }) == 0;
    };
    const auto expectInTurn = [&](const std::string& tag, auto find)
    {
        FailInTurn(
            [&](std::size_t n)
            {
                const int answer = InAProcess([&] { return attempt(n, tag, find); });
                EXPECT_NE(2, answer) << tag;
                EXPECT_TRUE(answer != -1 || !engineSurvives(n)) << tag;
                return answer != 1;
            });
    };
    expectInTurn("FindNode", [&](const char* expression, CXmlNode node)
                 { return !parser.FindNode(expression, node).IsNull(); });
    expectInTurn("FindAllNodes", [&](const char* expression, CXmlNode node)
                 { return !parser.FindAllNodes(expression, node).empty(); });
}
