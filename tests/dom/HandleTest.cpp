#include "DomTest.h"

#include <type_traits>

using namespace kxtest;

namespace
{

class HandleTest : public DomTest
{
protected:
    CXmlNode m_null;
};

static_assert(sizeof(CXmlNode) == sizeof(void*), "a handle is one pointer");
static_assert(std::is_convertible<_xmlNode*, CXmlNode>::value, "a node converts to a handle");
static_assert(std::is_copy_constructible<CXmlNode>::value, "");
static_assert(std::is_copy_assignable<CXmlNode>::value, "");
static_assert(!std::is_polymorphic<CXmlNode>::value, "");

const char* const kMixed = "<a>text<!--c--><e1/>more<e2/></a>";

} // namespace

// --- Construction, copies, the pointer

TEST_F(HandleTest, DefaultConstructedHandleIsNull)
{
    CXmlNode node;
    EXPECT_TRUE(node.IsNull());
    ExpectRecords(kMade + kGone, [] { CXmlNode made; });
}

TEST_F(HandleTest, ConstructedOnANodeDesignatesIt)
{
    CXmlNode node(Node("//net"));
    EXPECT_FALSE(node.IsNull());
    EXPECT_EQ("net", node.Name());
    ExpectRecords(kMade + kGone, [&] { CXmlNode made(m_document->children); });
}

TEST_F(HandleTest, ConstructedOnANullPointerIsNull)
{
    CXmlNode node(static_cast<xmlNodePtr>(nullptr));
    EXPECT_TRUE(node.IsNull());
}

TEST_F(HandleTest, NodePointerConvertsToAHandle)
{
    CXmlNode node = Node("//net");
    EXPECT_EQ("net", node.Name());
}

TEST_F(HandleTest, SetXmlNodePtrMakesTheHandleDesignateAnotherNode)
{
    CXmlNode node(Node("//net"));
    const std::string before = Text();
    node.SetXmlNodePtr(Node("//name"));
    EXPECT_EQ("name", node.Name());
    node.SetXmlNodePtr(nullptr);
    EXPECT_TRUE(node.IsNull());
    EXPECT_EQ(before, Text());
    ExpectRecords(kSet, [&] { node.SetXmlNodePtr(nullptr); });
}

TEST_F(HandleTest, IsNullTraces)
{
    CXmlNode node(Node("//net"));
    ExpectRecords(Traced("IsNull"), [&] { node.IsNull(); });
    ExpectRecords(Traced("IsNull"), [&] { m_null.IsNull(); });
}

TEST_F(HandleTest, CopiesDesignateTheSameNodeAndLogNothingWhenMade)
{
    CXmlNode node(Node("//name"));
    LogRecorder log;
    {
        CXmlNode copy(node);
        EXPECT_EQ(Records(), log.Take());
        CXmlNode assigned(node);
        assigned = copy;
        EXPECT_EQ(Records(), log.Take());
        assigned.SetContent("lid");
        EXPECT_EQ("lid", node.GetContent());
        EXPECT_EQ("lid", copy.GetContent());
        log.Take();
    }
    EXPECT_EQ(kGone + kGone, log.Take());
}

TEST_F(HandleTest, DestroyingEveryHandleLeavesTheTreeUntouched)
{
    const std::string before = Text();
    const EngineMemory memory;
    {
        CXmlNode node(Node("//net"));
        CXmlNode copy(node);
        std::list<CXmlNode> list = node.Children();
    }
    EXPECT_EQ(before, Text());
    EXPECT_EQ(0, memory.Live());
}

// --- Type and name

TEST_F(HandleTest, TypeIsTheKindOfNode)
{
    EXPECT_EQ(0, m_null.Type());
    EXPECT_EQ(1, CXmlNode(Node("//net")).Type());
    EXPECT_EQ(2, CXmlNode(Node("//@id")).Type());
    EXPECT_EQ(3, CXmlNode(Node("//name/text()")).Type());
    EXPECT_EQ(7, CXmlNode(Node("//processing-instruction()")).Type());
    EXPECT_EQ(8, CXmlNode(Node("//comment()")).Type());
    EXPECT_EQ(9, CXmlNode(Node("/")).Type());
    CXmlNode node(Node("//net"));
    ExpectRecords(Traced("Type"), [&] { node.Type(); });
    ExpectRecords(Traced("Type"), [&] { m_null.Type(); });
}

TEST_F(HandleTest, TypeEqualsTheEnginesNumberFrom1To20AndIsZeroBeyond)
{
    xmlNode record = {};
    CXmlNode node(&record);
    for (unsigned number = 0; number <= 31; ++number)
    {
        record.type = static_cast<xmlElementType>(number);
        EXPECT_EQ(number <= 20 ? static_cast<int>(number) : 0, node.Type()) << number;
    }
}

TEST_F(HandleTest, EnumeratorsHaveTheEnginesNumbers)
{
    const std::vector<int> numbers = {NODE_NONE,
                                      NODE_ELEMENT,
                                      NODE_ATTRIBUTE,
                                      NODE_TEXT,
                                      NODE_CDATA_SECTION,
                                      NODE_ENTITY_REF,
                                      NODE_ENTITY,
                                      NODE_PI,
                                      NODE_COMMENT,
                                      NODE_DOCUMENT,
                                      NODE_DOCUMENT_TYPE,
                                      NODE_DOCUMENT_FRAG,
                                      NODE_NOTATION,
                                      NODE_HTML_DOCUMENT,
                                      NODE_DTD,
                                      NODE_ELEMENT_DECL,
                                      NODE_ATTRIBUTE_DECL,
                                      NODE_ENTITY_DECL,
                                      NODE_NAMESPACE_DECL,
                                      NODE_XINCLUDE_START,
                                      NODE_XINCLUDE_END};
    for (std::size_t i = 0; i < numbers.size(); ++i)
    {
        EXPECT_EQ(static_cast<int>(i), numbers[i]);
    }
}

TEST_F(HandleTest, NameIsTheStoredNameWithoutPrefix)
{
    CXmlNode node(NodeOf(Parse("<p:item xmlns:p='urn:p'/>"), "/*"));
    EXPECT_EQ("item", node.Name());
    ExpectRecords(Traced("Name"), [&] { node.Name(); });
}

TEST_F(HandleTest, NameOfANullHandleIsEmpty)
{
    EXPECT_EQ("", m_null.Name());
    ExpectRecords(Traced("Name"), [&] { m_null.Name(); });
}

TEST_F(HandleTest, NameOfATextNodeIsTheEnginesNameForText)
{
    EXPECT_EQ(kTextName, CXmlNode(Node("//name/text()")).Name());
    EXPECT_EQ(kCommentName, CXmlNode(Node("//comment()")).Name());
    EXPECT_EQ("target", CXmlNode(Node("//processing-instruction()")).Name());
    EXPECT_EQ("id", CXmlNode(Node("//@id")).Name());
}

TEST_F(HandleTest, NodeWithoutANameHasAnEmptyName)
{
    xmlNode record = {};
    record.type = XML_CDATA_SECTION_NODE;
    EXPECT_EQ("", CXmlNode(&record).Name());
    EXPECT_EQ("", CXmlNode(Node("/")).Name());
}

// --- Navigation

TEST_F(HandleTest, NavigationStepsOverEverythingBetweenElements)
{
    CXmlNode a(NodeOf(Parse(kMixed), "/a"));
    CXmlNode e1 = a.FirstChild();
    CXmlNode e2 = a.LastChild();
    EXPECT_EQ("e1", e1.Name());
    EXPECT_EQ("e2", e2.Name());
    EXPECT_EQ("e2", e1.NextSibling().Name());
    EXPECT_EQ("e1", e2.PrevSibling().Name());
    EXPECT_TRUE(e2.NextSibling().IsNull());
    EXPECT_TRUE(e1.PrevSibling().IsNull());
    EXPECT_TRUE(e1.FirstChild().IsNull());
    EXPECT_TRUE(e1.LastChild().IsNull());
}

TEST_F(HandleTest, SiblingsAreTheNearestElements)
{
    CXmlNode middle(NodeOf(Parse("<a><x/><y/>t<m/>t<v/><w/></a>"), "//m"));
    EXPECT_EQ("y", middle.PrevSibling().Name());
    EXPECT_EQ("v", middle.NextSibling().Name());
}

TEST_F(HandleTest, LastChildSkipsWhatFollowsTheLastElement)
{
    CXmlNode a(NodeOf(Parse("<a><x/><y/>t<!--c--><?p d?></a>"), "/a"));
    EXPECT_EQ("y", a.LastChild().Name());
}

TEST_F(HandleTest, ElementWithTextOnlyHasNoElementChild)
{
    CXmlNode node(Node("//name"));
    EXPECT_TRUE(node.FirstChild().IsNull());
    EXPECT_TRUE(node.LastChild().IsNull());
}

TEST_F(HandleTest, NavigationMayStartOnAnyNode)
{
    CXmlNode comment(Node("/cfg/comment()"));
    EXPECT_EQ("name", comment.NextSibling().Name());
    EXPECT_TRUE(comment.PrevSibling().IsNull());
    EXPECT_EQ("cfg", comment.Parent().Name());
    EXPECT_EQ("net", CXmlNode(Node("/cfg/processing-instruction()")).PrevSibling().Name());
    EXPECT_EQ("cfg", CXmlNode(Node("/")).FirstChild().Name());
    EXPECT_EQ("net", CXmlNode(Node("//@id")).Parent().Name());
}

TEST_F(HandleTest, ParentIsTheParentElement)
{
    EXPECT_EQ("net", CXmlNode(Node("//port")).Parent().Name());
    EXPECT_EQ("cfg", CXmlNode(Node("//net")).Parent().Name());
}

TEST_F(HandleTest, ParentOfTheRootElementIsNull)
{
    EXPECT_TRUE(CXmlNode(Node("/*")).Parent().IsNull());
    EXPECT_TRUE(CXmlNode(Node("/")).Parent().IsNull());
}

TEST_F(HandleTest, NavigationFromANullHandleIsNull)
{
    EXPECT_TRUE(m_null.Parent().IsNull());
    EXPECT_TRUE(m_null.FirstChild().IsNull());
    EXPECT_TRUE(m_null.LastChild().IsNull());
    EXPECT_TRUE(m_null.NextSibling().IsNull());
    EXPECT_TRUE(m_null.PrevSibling().IsNull());
}

TEST_F(HandleTest, NavigationBuildsItsResultInsideItsOwnTrace)
{
    CXmlNode net(Node("//net"));
    ExpectRecords(Traced("Parent", kFound) + kGone, [&] { net.Parent(); });
    ExpectRecords(Traced("FirstChild", kFound) + kGone, [&] { net.FirstChild(); });
    ExpectRecords(Traced("LastChild", kFound) + kGone, [&] { net.LastChild(); });
    ExpectRecords(Traced("NextSibling", kFound) + kGone, [&] { net.NextSibling(); });
    ExpectRecords(Traced("PrevSibling", kFound) + kGone, [&] { net.PrevSibling(); });
}

TEST_F(HandleTest, NavigationThatFindsNothingSetsNoPointer)
{
    CXmlNode lonely(NodeOf(Parse("<a/>"), "/a"));
    for (CXmlNode node : {m_null, lonely})
    {
        ExpectRecords(Traced("Parent", kMade) + kGone, [&] { node.Parent(); });
        ExpectRecords(Traced("FirstChild", kMade) + kGone, [&] { node.FirstChild(); });
        ExpectRecords(Traced("LastChild", kMade) + kGone, [&] { node.LastChild(); });
        ExpectRecords(Traced("NextSibling", kMade) + kGone, [&] { node.NextSibling(); });
        ExpectRecords(Traced("PrevSibling", kMade) + kGone, [&] { node.PrevSibling(); });
    }
}

// Who reads the log of a crash sees which operation was looking.
TEST_F(HandleTest, NavigationLogsItsEntryBeforeItLooks)
{
    xmlNodePtr const lonely = NodeOf(Parse("<lonely/>"), "/lonely");
    xmlNodePtr const middle = NodeOf(Parse("<a><x/><m><c/></m><y/></a>"), "//m");
    const auto found = [&](const std::function<CXmlNode(CXmlNode&)>& operation)
    {
        CXmlNode node(lonely);
        LogRecorder log(kMaskTrace);
        LogRecorder::OnNextCall([&] { node.SetXmlNodePtr(middle); });
        return operation(node).Name();
    };
    EXPECT_EQ("a", found([](CXmlNode& node) { return node.Parent(); }));
    EXPECT_EQ("c", found([](CXmlNode& node) { return node.FirstChild(); }));
    EXPECT_EQ("c", found([](CXmlNode& node) { return node.LastChild(); }));
    EXPECT_EQ("y", found([](CXmlNode& node) { return node.NextSibling(); }));
    EXPECT_EQ("x", found([](CXmlNode& node) { return node.PrevSibling(); }));
    EXPECT_EQ("c", found([](CXmlNode& node) { return node.FindChildNode("c"); }));
}

TEST_F(HandleTest, ReturnedHandleIsTheObjectThatTheCallerReceives)
{
    CXmlNode net(Node("//net"));
    LogRecorder log;
    CXmlNode parent = net.Parent();
    EXPECT_EQ(Traced("Parent", kFound), log.Take());
}

// --- ClearNode

TEST_F(HandleTest, ClearNodeLeavesTheElementEmptyInItsPlace)
{
    const xmlDocPtr document =
        Parse("<r><x/><e a='1' b='2'>text<c><d/></c><!--n--><?p d?><![CDATA[x]]></e><y/></r>");
    CXmlNode node(NodeOf(document, "//e"));
    EXPECT_EQ(0, node.ClearNode());
    EXPECT_EQ("<r><x/><e/><y/></r>", TextOf(document->children));
    EXPECT_EQ("e", node.Name());
    EXPECT_EQ(0, node.ClearNode());
    EXPECT_EQ("<r><x/><e/><y/></r>", TextOf(document->children));
}

namespace
{

std::vector<xmlElementType> g_freed;

void NoteFreed(xmlNodePtr node)
{
    g_freed.push_back(node->type);
}

} // namespace

// A client that has data of its own behind the nodes frees it in this order.
TEST_F(HandleTest, ClearNodeRemovesChildrenBeforeAttributes)
{
    const xmlDocPtr document = Parse("<e a='1' b='2'><c/><d/></e>");
    const auto before = xmlDeregisterNodeDefault(NoteFreed);
    g_freed.clear();
    EXPECT_EQ(0, CXmlNode(document->children).ClearNode());
    xmlDeregisterNodeDefault(before);
    // An attribute is reported before its text.
    EXPECT_EQ((std::vector<xmlElementType>{XML_ELEMENT_NODE, XML_ELEMENT_NODE, XML_ATTRIBUTE_NODE,
                                           XML_TEXT_NODE, XML_ATTRIBUTE_NODE, XML_TEXT_NODE}),
              g_freed);
}

TEST_F(HandleTest, ClearNodeKeepsNamespaceAndItsDeclarations)
{
    const xmlDocPtr document = Parse("<p:e xmlns:p='urn:p' xmlns:q='urn:q' q:a='1'><p:c/></p:e>");
    EXPECT_EQ(0, CXmlNode(document->children).ClearNode());
    EXPECT_EQ("<p:e xmlns:p=\"urn:p\" xmlns:q=\"urn:q\"/>", TextOf(document->children));
}

TEST_F(HandleTest, ClearNodeFreesWhatItRemoves)
{
    const EngineMemory memory;
    const xmlDocPtr document = NewDocument("e");
    const long live = memory.Live();
    CXmlNode node(document->children);
    node.AddNewAttribute("a", "1");
    node.AddNewAttribute("b", "2");
    node.AddChildNode("c", "text").AddChildNode("d", "more");
    EXPECT_LT(live, memory.Live());
    EXPECT_EQ(0, node.ClearNode());
    EXPECT_EQ(live, memory.Live());
    xmlFreeDoc(document);
}

TEST_F(HandleTest, ClearNodeOnANullHandleAnswers22)
{
    EXPECT_EQ(22, m_null.ClearNode());
    ExpectRecords(Traced("ClearNode"), [&] { m_null.ClearNode(); });
}

TEST_F(HandleTest, ClearNodeLogsItsTraceOnly)
{
    CXmlNode net(Node("//net"));
    ExpectRecords(Traced("ClearNode"), [&] { net.ClearNode(); });
}
