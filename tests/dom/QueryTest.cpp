#include "CXmlParser.h"
#include "DomTest.h"

#include <libxml/parser.h>
#include <libxml/xpath.h>
#include <libxml/xpathInternals.h>

#include <algorithm>
#include <new>

using namespace kxtest;

namespace
{

const Records kNoDocument =
    Traced("GetNodeSet", {Error("GetNodeSet", "document object is NULL")}) + kGone;
const Records kAsked =
    Traced("GetNodeSet") + kGone; // the copy of the context node dies with the call

Record NoResult(const std::string& tag)
{
    return XPath(tag, "xmlXPathObjectPtr is NULL");
}
Record NoNodes(const std::string& tag)
{
    return XPath(tag, "NodeSetVal is NULL");
}

class QueryTest : public DomTest
{
protected:
    QueryTest() { Load("<a><b n='1'/><x><y>deep</y></x><b n='2'/></a>"); }

    void Load(const std::string& xml)
    {
        m_root = CXmlNode();
        WriteFile(m_file, xml);
        ASSERT_EQ(0, m_parser.ParseXml(m_file));
        m_root = m_parser.GetRootNode();
    }

    void LoadItems(int count)
    {
        std::string xml = "<r>";
        for (int i = 0; i < count; ++i)
        {
            xml += "<i/>";
        }
        Load(xml + "</r>");
    }

    std::string Attribute(CXmlNode node, const std::string& name)
    {
        std::string value;
        node.GetAttributeValue(name, value);
        return value;
    }

    std::string Saved()
    {
        EXPECT_EQ(0, m_parser.SaveXml(""));
        return ReadFile(m_file);
    }

    TemporaryFolder m_folder;
    const std::string m_file = m_folder.Path("doc.xml");
    CXmlParser m_parser;
    CXmlParser m_empty;
    CXmlNode m_root;
    CXmlNode m_null;
};

} // namespace

// --- GetNodeSet

TEST_F(QueryTest, NodeSetHoldsTheDocumentsOwnNodesAndIsTheCallers)
{
    EngineCalls calls;
    const EngineMemory memory;
    const xmlXPathObjectPtr result = m_parser.GetNodeSet("//b", m_null);
    ASSERT_NE(nullptr, result);
    EXPECT_EQ(XPATH_NODESET, result->type);
    ASSERT_EQ(2, result->nodesetval->nodeNr);
    CXmlNode(result->nodesetval->nodeTab[0]).AddNewAttribute("seen", "1");
    EXPECT_EQ("1", Attribute(m_root.FirstChild(), "seen"));
    m_parser.RemoveNode(CXmlNode(m_parser.FindNode("//@seen", m_null)));
    xmlXPathFreeObject(result);
    EXPECT_EQ(0, memory.Live());
    EXPECT_EQ(0, calls.LiveContexts());
}

TEST_F(QueryTest, ResultsOfEveryTypeAreHandedOutUnchanged)
{
    const std::vector<std::pair<std::string, xmlXPathObjectType>> cases = {
        {"count(//b)", XPATH_NUMBER},
        {"string(//y)", XPATH_STRING},
        {"true()", XPATH_BOOLEAN},
        {"//nothing", XPATH_NODESET}};
    for (const auto& each : cases)
    {
        const xmlXPathObjectPtr result = m_parser.GetNodeSet(each.first, m_null);
        ASSERT_NE(nullptr, result) << each.first;
        EXPECT_EQ(each.second, result->type) << each.first;
        xmlXPathFreeObject(result);
    }
}

TEST_F(QueryTest, NodeSetIsTraced)
{
    ExpectRecords(Traced("GetNodeSet") + kGone,
                  [&] { xmlXPathFreeObject(m_parser.GetNodeSet("//b", m_root)); });
}

TEST_F(QueryTest, NodeSetWithoutDocumentIsNull)
{
    EXPECT_EQ(nullptr, m_empty.GetNodeSet("//b", m_null));
    ExpectRecords(kNoDocument, [&] { m_empty.GetNodeSet("//b", m_null); });
}

TEST_F(QueryTest, NodeSetWithoutContextObjectIsNull)
{
    ExpectRecords(
        Traced("GetNodeSet", {XPath("GetNodeSet", "Unable to create new XPath context")}) + kGone,
        [&]
        {
            RefuseNextXPathContext();
            EXPECT_EQ(nullptr, m_parser.GetNodeSet("//b", m_null));
        });
}

TEST_F(QueryTest, MalformedExpressionGivesNoNodeSet)
{
    EngineCalls calls;
    EXPECT_EQ(nullptr, m_parser.GetNodeSet("//[", m_null));
    EXPECT_EQ(0, calls.LiveContexts());
    ExpectRecords(
        Traced("GetNodeSet", {XPath("GetNodeSet", "Unable to evaluate nodepath :: \"//[ %s\"")}) +
            kGone,
        [&] { m_parser.GetNodeSet("//[ %s", m_null); });
    EXPECT_EQ("Unable to evaluate nodepath :: \"%s\"",
              (m_parser.GetNodeSet("", m_null), LogRecorder::LastFormat()));
    TakeEngineErrors();
}

TEST_F(QueryTest, PrefixesAreNotRegistered)
{
    Load("<p:a xmlns:p='urn:p'/>");
    EXPECT_EQ(nullptr, m_parser.GetNodeSet("//unknown:a", m_null));
    EXPECT_EQ(nullptr, m_parser.GetNodeSet("$variable", m_null));
    EXPECT_EQ(nullptr, m_parser.GetNodeSet("function()", m_null));
    TakeEngineErrors();
}

// --- FindNode

TEST_F(QueryTest, FirstNodeInDocumentOrderIsFound)
{
    CXmlNode found = m_parser.FindNode("//b", m_null);
    EXPECT_EQ("1", Attribute(found, "n"));
    ExpectRecords(Traced("FindNode", kMade + kAsked + kSet) + kGone + kGone,
                  [&] { m_parser.FindNode("//b", m_null); });
}

TEST_F(QueryTest, RelativeExpressionStartsAtTheContextNode)
{
    EXPECT_EQ("1", Attribute(m_parser.FindNode("b", m_root), "n"));
    EXPECT_EQ("y", m_parser.FindNode("y", m_parser.FindNode("x", m_root)).Name());
    EXPECT_TRUE(m_parser.FindNode("y", m_root).IsNull());
    EXPECT_EQ("2", Attribute(m_parser.FindNode("following-sibling::b", m_root.FirstChild()), "n"));
}

TEST_F(QueryTest, AbsoluteExpressionWorksWithEitherContext)
{
    EXPECT_EQ("y", m_parser.FindNode("/a/x/y", m_null).Name());
    EXPECT_EQ("y", m_parser.FindNode("/a/x/y", m_root.FirstChild()).Name());
}

TEST_F(QueryTest, ExpressionIsNotPrefixed)
{
    EXPECT_TRUE(m_parser.FindNode("y", m_root).IsNull());
    EXPECT_EQ("y", m_parser.FindNode("//y", m_root).Name());
}

TEST_F(QueryTest, FindNodeFreesWhatTheEngineMade)
{
    EngineCalls calls;
    const EngineMemory memory;
    for (const char* const expression : {"//b", "//nothing", "count(//b)", "'text'", "//["})
    {
        m_parser.FindNode(expression, m_root);
        m_parser.FindAllNodes(expression, m_root);
        EXPECT_EQ(0, memory.Live()) << expression;
    }
    EXPECT_EQ(0, calls.LiveContexts());
    TakeEngineErrors();
}

TEST_F(QueryTest, ResultThatIsNoNodeSetFindsNothing)
{
    for (const char* const expression : {"count(//b)", "'text'", "true()", "//nothing"})
    {
        EXPECT_TRUE(m_parser.FindNode(expression, m_root).IsNull()) << expression;
        EXPECT_TRUE(m_parser.FindAllNodes(expression, m_root).empty()) << expression;
        ExpectRecords(Traced("FindNode", kMade + kAsked + Records({NoNodes("FindNode")})) + kGone +
                          kGone,
                      [&] { m_parser.FindNode(expression, m_root); });
        ExpectRecords(Traced("FindAllNodes", kAsked + Records({NoNodes("FindAllNodes")})) + kGone,
                      [&] { m_parser.FindAllNodes(expression, m_root); });
    }
}

TEST_F(QueryTest, NodeSetObjectWithoutASetFindsNothing)
{
    for (int i = 0; i < 2; ++i)
    {
        // Some engines answer so where there is no context node, others with an empty set.
        const EngineMemory memory;
        const xmlXPathObjectPtr result = xmlXPathNewNodeSet(nullptr);
        xmlXPathFreeNodeSet(result->nodesetval);
        result->nodesetval = nullptr;
        AnswerNextXPath(result);
        const bool none = i == 0 ? m_parser.FindNode("b", m_null).IsNull()
                                 : m_parser.FindAllNodes("b", m_null).empty();
        EXPECT_TRUE(none);
        EXPECT_EQ(0, memory.Live());
    }
}

TEST_F(QueryTest, MalformedExpressionIsLoggedTwice)
{
    EXPECT_TRUE(m_parser.FindNode("//[", m_root).IsNull());
    EXPECT_TRUE(m_parser.FindAllNodes("//[", m_root).empty());
    const Records failed =
        Traced("GetNodeSet", {XPath("GetNodeSet", "Unable to evaluate nodepath :: \"//[\"")}) +
        kGone;
    ExpectRecords(Traced("FindNode", kMade + failed + Records({NoResult("FindNode")})) + kGone +
                      kGone,
                  [&] { m_parser.FindNode("//[", m_root); });
    ExpectRecords(Traced("FindAllNodes", failed + Records({NoResult("FindAllNodes")})) + kGone,
                  [&] { m_parser.FindAllNodes("//[", m_root); });
    TakeEngineErrors();
}

TEST_F(QueryTest, MissingDocumentIsLoggedTwice)
{
    EXPECT_TRUE(m_empty.FindNode("//b", m_null).IsNull());
    EXPECT_TRUE(m_empty.FindAllNodes("//b", m_null).empty());
    ExpectRecords(Traced("FindNode", kMade + kNoDocument + Records({NoResult("FindNode")})) +
                      kGone + kGone,
                  [&] { m_empty.FindNode("//b", m_null); });
    ExpectRecords(Traced("FindAllNodes", kNoDocument + Records({NoResult("FindAllNodes")})) + kGone,
                  [&] { m_empty.FindAllNodes("//b", m_null); });
}

TEST_F(QueryTest, NamespaceIsNeverHandedOut)
{
    Load("<a xmlns:p='urn:p'><b/></a>");
    EXPECT_TRUE(m_parser.FindNode("//namespace::p", m_null).IsNull());
    EXPECT_TRUE(m_parser.FindAllNodes("/a/namespace::*", m_null).empty());
    ExpectRecords(Traced("FindNode", kMade + kAsked + kSet) + kGone + kGone,
                  [&] { m_parser.FindNode("/a/namespace::p", m_root); });
    ExpectRecords(
        Traced("FindAllNodes", kAsked + Records({XPath("FindAllNodes", "node pointer is NULL")})) +
            kGone,
        [&] { m_parser.FindAllNodes("/a/namespace::p", m_root); });
    EXPECT_EQ(std::vector<std::string>({"a", "b"}),
              Names(m_parser.FindAllNodes("//* | //namespace::p", m_null)));
}

// --- FindAllNodes

TEST_F(QueryTest, AllNodesAreFoundInDocumentOrder)
{
    std::list<CXmlNode> found = m_parser.FindAllNodes("//b", m_null);
    ASSERT_EQ(2u, found.size());
    EXPECT_EQ("1", Attribute(found.front(), "n"));
    EXPECT_EQ("2", Attribute(found.back(), "n"));
    ExpectRecords(Traced("FindAllNodes", kAsked + kAppended + kAppended) + kGone + kGone + kGone,
                  [&] { m_parser.FindAllNodes("//b", m_null); });
}

TEST_F(QueryTest, NullEntryIsReportedAndSkipped)
{
    const auto withGap = [&]
    {
        const xmlXPathObjectPtr result = xmlXPathNewNodeSet(Node("//net"));
        xmlXPathNodeSetAddUnique(result->nodesetval, Node("//name"));
        xmlXPathNodeSetAddUnique(result->nodesetval, Node("//last"));
        result->nodesetval->nodeTab[1] = nullptr;
        return result;
    };
    AnswerNextXPath(withGap());
    EXPECT_EQ(std::vector<std::string>({"net", "last"}), Names(m_parser.FindAllNodes("x", m_null)));
    const Records gap = {XPath("FindAllNodes", "node pointer is NULL")};
    ExpectRecords(Traced("FindAllNodes", kAsked + kAppended + gap + kAppended) + kGone + kGone +
                      kGone,
                  [&]
                  {
                      AnswerNextXPath(withGap());
                      m_parser.FindAllNodes("x", m_null);
                  });
}

TEST_F(QueryTest, NullEntryInFrontIsANullHandle)
{
    const xmlXPathObjectPtr result = xmlXPathNewNodeSet(Node("//net"));
    result->nodesetval->nodeTab[0] = nullptr;
    AnswerNextXPath(result);
    LogRecorder log;
    CXmlNode found = m_parser.FindNode("x", m_null);
    EXPECT_EQ(Traced("FindNode", kMade + kAsked + kSet) + kGone, log.Take());
    EXPECT_TRUE(found.IsNull());
}

TEST_F(QueryTest, Up255NodesAreListedOnceEach)
{
    for (const int count : {1, 254, 255})
    {
        LoadItems(count);
        std::list<CXmlNode> found = m_parser.FindAllNodes("//i", m_null);
        ASSERT_EQ(static_cast<std::size_t>(count), found.size());
        CXmlNode expected = m_root.FirstChild();
        for (CXmlNode& node : found)
        {
            ASSERT_EQ(0, node.AddNewAttribute("seen", ""));
        }
        EXPECT_TRUE(m_parser.FindNode("//i[count(@seen) != 1]", m_null).IsNull());
    }
}

TEST_F(QueryTest, From256NodesOnOnlyAnExceptionEndsTheWalk)
{
    for (const int count : {256, 257, 511})
    {
        LoadItems(count);
        const NewCounter heap;
        const EngineMemory memory;
        NewCounter::FailAt(5000);
        EXPECT_THROW(m_parser.FindAllNodes("//i", m_null), std::bad_alloc);
        NewCounter::FailAt(0);
        EXPECT_LE(5000u, heap.Requests());
        // The list is destroyed; the engine's result, and only that, stays.
        EXPECT_EQ(0, heap.Live());
        EXPECT_LT(0, memory.Live());
        xmlXPathFreeObject(LastXPath());
        EXPECT_EQ(0, memory.Live());
    }
}

TEST_F(QueryTest, CallThatAnExceptionLeavesLogsNoExit)
{
    LoadItems(256);
    LogRecorder log(kMaskTrace);
    NewCounter::FailAt(20000);
    EXPECT_THROW(m_parser.FindAllNodes("//i", m_null), std::bad_alloc);
    NewCounter::FailAt(0);
    const Records records = log.Take();
    EXPECT_EQ(1, std::count(records.begin(), records.end(), Trace("FindAllNodes", "+")));
    EXPECT_EQ(0, std::count(records.begin(), records.end(), Trace("FindAllNodes", "-")));
    xmlXPathFreeObject(LastXPath());
}

TEST_F(QueryTest, WalkOf256NodesStartsOverAtTheFirst)
{
    LoadItems(256);
    // Entry 0 is visited a second time after entry 255: a gap in front is reported twice.
    const xmlXPathObjectPtr result = m_parser.GetNodeSet("//i", m_null);
    result->nodesetval->nodeTab[0] = nullptr;
    AnswerNextXPath(result);
    LogRecorder log(kMaskXPath);
    LogRecorder::ThrowAt(3);
    EXPECT_THROW(m_parser.FindAllNodes("//i", m_null), LogFailure);
    LogRecorder::ThrowAt(0);
    EXPECT_EQ(2u, log.Take().size());
    xmlXPathFreeObject(result);
}

// --- AddNewNode

TEST_F(QueryTest, NewNodeIsTheParentsLastChildAndIsFound)
{
    CXmlNode added = m_parser.AddNewNode(m_root, "new", "text");
    EXPECT_EQ("new", added.Name());
    EXPECT_EQ("text", added.GetContent());
    EXPECT_EQ("new", m_root.LastChild().Name());
    EXPECT_EQ("text", m_parser.FindNode("/a/new", m_null).GetContent());
}

TEST_F(QueryTest, NewNodeIsMadeByTheParent)
{
    ExpectRecords(
        Traced("AddNewNode", kMade + Traced("IsNull") + Traced("AddChildNode", kFound) + kGone) +
            kGone + kGone,
        [&] { m_parser.AddNewNode(m_root, "new", ""); });
}

TEST_F(QueryTest, NullParentGetsNoNode)
{
    const std::string before = Saved();
    EXPECT_TRUE(m_parser.AddNewNode(m_null, "new", "").IsNull());
    EXPECT_EQ(before, Saved());
    ExpectRecords(Traced("AddNewNode", kMade + Traced("IsNull")) + kGone + kGone,
                  [&] { m_parser.AddNewNode(m_null, "new", ""); });
}

TEST_F(QueryTest, EmptyNameGivesNoNode)
{
    EXPECT_TRUE(m_parser.AddNewNode(m_root, "", "text").IsNull());
    ExpectRecords(
        Traced("AddNewNode", kMade + Traced("IsNull") + Traced("AddChildNode", kMade) + kGone) +
            kGone + kGone,
        [&] { m_parser.AddNewNode(m_root, "", ""); });
}

TEST_F(QueryTest, NewNodeGoesWhereverTheParentIs)
{
    m_empty.AddNewNode(m_root, "fromEmpty", "");
    EXPECT_EQ("fromEmpty", m_root.LastChild().Name());
    m_parser.AddNewNode(Node("/*"), "elsewhere", "");
    EXPECT_EQ("elsewhere", CXmlNode(Node("/*")).LastChild().Name());
}

// --- RemoveNode

TEST_F(QueryTest, RemovedNodeIsGoneFromTheSavedFileWithAllBelow)
{
    EXPECT_EQ(0, m_parser.RemoveNode(m_parser.FindNode("//x", m_null)));
    EXPECT_EQ(
        "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n<a>\n  <b n=\"1\"/>\n  <b n=\"2\"/>\n</a>\n",
        Saved());
}

TEST_F(QueryTest, RemovedNodeIsFreed)
{
    const EngineMemory memory;
    CXmlNode added = m_parser.AddNewNode(m_root, "new", "text");
    added.AddNewAttribute("a", "1");
    added.AddChildNode("below", "text");
    EXPECT_LT(0, memory.Live());
    LogRecorder log;
    EXPECT_EQ(0, m_parser.RemoveNode(added));
    EXPECT_EQ(Traced("RemoveNode", Traced("IsNull")) + kGone, log.Take());
    EXPECT_EQ(0, memory.Live());
}

TEST_F(QueryTest, RemovingANullHandleAnswers22)
{
    EXPECT_EQ(22, m_parser.RemoveNode(m_null));
    ExpectRecords(Traced("RemoveNode", Traced("IsNull")) + kGone,
                  [&] { m_parser.RemoveNode(m_null); });
}

TEST_F(QueryTest, NodeOfAnotherDocumentIsRemovedThere)
{
    EXPECT_EQ(0, m_empty.RemoveNode(Node("//net")));
    EXPECT_EQ(nullptr, Node("//net"));
}
