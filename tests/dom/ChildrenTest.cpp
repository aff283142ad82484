#include "DomTest.h"

using namespace kxtest;

namespace
{

using Strings = std::vector<std::string>;

class ChildrenTest : public DomTest
{
protected:
    /** What FindChildNode logs when it finds a child, and when it finds none. */
    const Records m_childFound = Traced("FindChildNode", kFound);
    const Records m_childMissed = Traced("FindChildNode", kMade);

    CXmlNode m_null;
    CXmlNode m_root = CXmlNode(Node("/*"));
    CXmlNode m_net = CXmlNode(Node("//net"));
};

} // namespace

// --- GetContent

TEST_F(ChildrenTest, SingleTextChildIsTheContent)
{
    CXmlNode node(NodeOf(Parse("<e>42</e>"), "/e"));
    EXPECT_EQ("42", node.GetContent());
    ExpectRecords(Traced("GetContent"), [&] { node.GetContent(); });
}

TEST_F(ChildrenTest, ContentKeepsItsWhiteSpaceAndUtf8)
{
    EXPECT_EQ(" a\n\xC3\xA4 & < ",
              CXmlNode(NodeOf(Parse("<e> a\n\xC3\xA4 &amp; &lt; </e>"), "/e")).GetContent());
}

TEST_F(ChildrenTest, NullHandleHasNoContent)
{
    EXPECT_EQ("", m_null.GetContent());
    ExpectRecords(Traced("GetContent"), [&] { m_null.GetContent(); });
}

TEST_F(ChildrenTest, EmptyElementHasNoContent)
{
    EXPECT_EQ("", CXmlNode(Node("//last")).GetContent());
}

TEST_F(ChildrenTest, CommentBesideTextMeansNoContent)
{
    EXPECT_EQ("", CXmlNode(NodeOf(Parse("<e>a<!--c-->b</e>"), "/e")).GetContent());
    EXPECT_EQ("", CXmlNode(NodeOf(Parse("<e><!--c-->b</e>"), "/e")).GetContent());
    EXPECT_EQ("", CXmlNode(NodeOf(Parse("<e>a<!--c--></e>"), "/e")).GetContent());
}

TEST_F(ChildrenTest, ChildElementMeansNoContent)
{
    EXPECT_EQ("", CXmlNode(NodeOf(Parse("<e><c>x</c></e>"), "/e")).GetContent());
    EXPECT_EQ("", CXmlNode(NodeOf(Parse("<e>a<c/></e>"), "/e")).GetContent());
}

TEST_F(ChildrenTest, TextInSeveralPiecesMeansNoContent)
{
    const xmlDocPtr document = Parse("<e>a<c/>b</e>");
    CXmlNode node(document->children);
    node.RemoveChildNode("c");
    ASSERT_EQ("<e>ab</e>", TextOf(document->children));
    EXPECT_EQ("", node.GetContent());
}

TEST_F(ChildrenTest, CdataSectionIsNoContent)
{
    EXPECT_EQ("", CXmlNode(NodeOf(Parse("<e><![CDATA[x]]></e>"), "/e")).GetContent());
}

TEST_F(ChildrenTest, TextAndCommentNodesThemselvesHaveNoContent)
{
    EXPECT_EQ("", CXmlNode(Node("//name/text()")).GetContent());
    EXPECT_EQ("", CXmlNode(Node("//comment()")).GetContent());
}

TEST_F(ChildrenTest, AttributeWithASingleTextHasContent)
{
    EXPECT_EQ("on", CXmlNode(Node("//@mode")).GetContent());
}

TEST_F(ChildrenTest, TextChildWithoutBytesReadsEmpty)
{
    const xmlDocPtr document = Parse("<e/>");
    xmlAddChild(document->children, xmlNewDocText(document, nullptr));
    EXPECT_EQ("", CXmlNode(document->children).GetContent());
}

TEST_F(ChildrenTest, GetContentKeepsTheEnginesBuffer)
{
    CXmlNode node(Node("//name"));
    const EngineMemory memory;
    node.GetContent();
    EXPECT_EQ(1, memory.Live());
    node.GetContent();
    EXPECT_EQ(2, memory.Live());
    m_net.GetContent();
    EXPECT_EQ(2, memory.Live());
}

// --- SetContent

TEST_F(ChildrenTest, SetContentReplacesTheText)
{
    CXmlNode node(Node("//name"));
    EXPECT_EQ(0, node.SetContent("lid"));
    EXPECT_EQ("<name>lid</name>", TextOf(Node("//name")));
    ExpectRecords(Traced("SetContent"), [&] { node.SetContent("x"); });
}

TEST_F(ChildrenTest, SetContentRemovesChildElements)
{
    EXPECT_EQ(0, m_net.SetContent("flat"));
    EXPECT_EQ("<net id=\"1\" mode=\"on\">flat</net>", TextOf(Node("//net")));
}

TEST_F(ChildrenTest, SetContentRecognisesEntityReferences)
{
    CXmlNode node(Node("//name"));
    EXPECT_EQ(0, node.SetContent("a &lt; b &amp; c"));
    EXPECT_EQ("a < b & c", node.GetContent());
}

TEST_F(ChildrenTest, EmptyContentLeavesNoChildren)
{
    EXPECT_EQ(0, m_net.SetContent(""));
    EXPECT_EQ("<net id=\"1\" mode=\"on\"/>", TextOf(Node("//net")));
    EXPECT_EQ(nullptr, Node("//net")->children);
}

TEST_F(ChildrenTest, SetContentOnTextReplacesItsOwnText)
{
    EXPECT_EQ(0, CXmlNode(Node("//name/text()")).SetContent("lid"));
    EXPECT_EQ(0, CXmlNode(Node("//comment()")).SetContent("remark"));
    EXPECT_EQ("<name>lid</name>", TextOf(Node("//name")));
    EXPECT_EQ("<!--remark-->", TextOf(Node("//comment()")));
}

TEST_F(ChildrenTest, SetContentOnANullHandleAnswers22)
{
    EXPECT_EQ(22, m_null.SetContent("x"));
    ExpectRecords(Traced("SetContent"), [&] { m_null.SetContent("x"); });
}

// --- GetContentOfChildNode

TEST_F(ChildrenTest, ContentOfAChildIsRead)
{
    std::string value = "before";
    EXPECT_EQ(0, m_root.GetContentOfChildNode("name", value));
    EXPECT_EQ("box", value);
    ExpectRecords(Traced("GetContentOfChildNode", m_childFound + Traced("GetContent")) + kGone,
                  [&] { m_root.GetContentOfChildNode("name", value); });
}

TEST_F(ChildrenTest, ContentOfAMissingChildLeavesTheStringAsItWas)
{
    std::string value = "before";
    EXPECT_EQ(-2, m_root.GetContentOfChildNode("missing", value));
    EXPECT_EQ(-2, m_null.GetContentOfChildNode("name", value));
    EXPECT_EQ("before", value);
    for (CXmlNode node : {m_root, m_null})
    {
        ExpectRecords(Traced("GetContentOfChildNode", m_childMissed) + kGone,
                      [&] { node.GetContentOfChildNode("missing", value); });
    }
}

TEST_F(ChildrenTest, ContentOfAChildWithoutTextIsEmpty)
{
    std::string value = "before";
    EXPECT_EQ(0, m_root.GetContentOfChildNode("last", value));
    EXPECT_EQ("", value);
    value = "before";
    EXPECT_EQ(0, m_root.GetContentOfChildNode("net", value));
    EXPECT_EQ("", value);
}

TEST_F(ChildrenTest, ContentIsThatOfTheFirstOfSeveralChildren)
{
    std::string value;
    EXPECT_EQ(0, m_net.GetContentOfChildNode("port", value));
    EXPECT_EQ("1", value);
}

TEST_F(ChildrenTest, OneStringMayBeNameAndValue)
{
    std::string text = "name";
    EXPECT_EQ(0, m_root.GetContentOfChildNode(text, text));
    EXPECT_EQ("box", text);
}

// --- Children

TEST_F(ChildrenTest, ChildrenAreTheElementsInDocumentOrder)
{
    EXPECT_EQ(Strings({"name", "net", "last"}), Names(m_root.Children()));
    EXPECT_EQ(Strings({"a", "b"}),
              Names(CXmlNode(NodeOf(Parse("<r>t<a/>t<b/></r>"), "/r")).Children()));
}

TEST_F(ChildrenTest, ChildrenOfNothingAreNone)
{
    EXPECT_TRUE(m_null.Children().empty());
    EXPECT_TRUE(CXmlNode(Node("//last")).Children().empty());
    EXPECT_TRUE(CXmlNode(Node("//name")).Children().empty());
}

TEST_F(ChildrenTest, ChildrenMayBeListedUnderAnyNode)
{
    EXPECT_EQ(Strings({"cfg"}), Names(CXmlNode(Node("/")).Children()));
}

TEST_F(ChildrenTest, EachListedChildIsAppendedAsATemporary)
{
    const Records destroyed = kGone + kGone + kGone;
    ExpectRecords(Traced("Children", kAppended + kAppended + kAppended) + destroyed,
                  [&] { m_root.Children(); });
    ExpectRecords(Traced("Children"), [&] { m_null.Children(); });
}

// --- FindChildNode and FindAllChildNodes

TEST_F(ChildrenTest, FirstChildOfTheNameIsFound)
{
    EXPECT_EQ("1", m_net.FindChildNode("port").GetContent());
    ExpectRecords(m_childFound + kGone, [&] { m_net.FindChildNode("port"); });
}

TEST_F(ChildrenTest, AllChildrenOfTheNameAreFoundInDocumentOrder)
{
    std::list<CXmlNode> ports = m_net.FindAllChildNodes("port");
    ASSERT_EQ(2u, ports.size());
    EXPECT_EQ("1", ports.front().GetContent());
    EXPECT_EQ("2", ports.back().GetContent());
    ExpectRecords(Traced("FindAllChildNodes", kAppended + kAppended) + kGone + kGone,
                  [&] { m_net.FindAllChildNodes("port"); });
}

TEST_F(ChildrenTest, NamesAreComparedByteByByte)
{
    EXPECT_EQ("3", m_net.FindChildNode("Port").GetContent());
    for (const char* const name : {"PORT", "por", "ports", " port", "port ", ""})
    {
        EXPECT_TRUE(m_net.FindChildNode(name).IsNull()) << name;
        EXPECT_TRUE(m_net.FindAllChildNodes(name).empty()) << name;
    }
    EXPECT_TRUE(m_net.FindChildNode(std::string("port\0", 5)).IsNull());
    EXPECT_TRUE(CXmlNode(NodeOf(Parse("<n><Port/></n>"), "/n")).FindChildNode("port").IsNull());
}

TEST_F(ChildrenTest, OnlyDirectChildrenAreFound)
{
    EXPECT_TRUE(m_root.FindChildNode("port").IsNull());
    EXPECT_TRUE(m_root.FindChildNode("cfg").IsNull());
}

TEST_F(ChildrenTest, ChildrenOfEveryKindAreFoundUnderTheEnginesNames)
{
    CXmlNode text = m_root.FindChildNode(kTextName);
    EXPECT_EQ(NODE_TEXT, text.Type());
    EXPECT_EQ("name", text.NextSibling().Name());
    EXPECT_EQ(2u, m_root.FindAllChildNodes(kTextName).size());
    EXPECT_EQ(NODE_COMMENT, m_root.FindChildNode(kCommentName).Type());
    EXPECT_EQ(NODE_PI, m_root.FindChildNode("target").Type());
}

TEST_F(ChildrenTest, EmptyNameFindsOnlyAChildWithAnEmptyName)
{
    const xmlDocPtr document = Parse("<e><![CDATA[nameless]]></e>");
    CXmlNode node(document->children);
    document->children->children->name = nullptr;
    EXPECT_TRUE(node.FindChildNode("").IsNull());
    EXPECT_TRUE(node.FindAllChildNodes("").empty());
    CXmlNode(m_root.FirstChild()).AddSiblingNode("", "x");
    EXPECT_EQ("x", m_root.FindChildNode("").GetContent());
    EXPECT_EQ(1u, m_root.FindAllChildNodes("").size());
}

TEST_F(ChildrenTest, NothingIsFoundUnderANodeThatIsNoElement)
{
    CXmlNode document(Node("/"));
    EXPECT_TRUE(document.FindChildNode("cfg").IsNull());
    EXPECT_TRUE(document.FindAllChildNodes("cfg").empty());
    CXmlNode attribute(Node("//@id"));
    EXPECT_TRUE(attribute.FindChildNode(kTextName).IsNull());
    ExpectRecords(m_childMissed + kGone, [&] { document.FindChildNode("cfg"); });
}

TEST_F(ChildrenTest, NothingIsFoundUnderANullHandleOrAnEmptyElement)
{
    for (CXmlNode node : {m_null, CXmlNode(Node("//last"))})
    {
        EXPECT_TRUE(node.FindChildNode("a").IsNull());
        EXPECT_TRUE(node.FindAllChildNodes("a").empty());
        ExpectRecords(m_childMissed + kGone, [&] { node.FindChildNode("a"); });
        ExpectRecords(Traced("FindAllChildNodes"), [&] { node.FindAllChildNodes("a"); });
    }
}

// --- AddChildNode

TEST_F(ChildrenTest, AddedChildIsTheLastOne)
{
    const xmlDocPtr document = Parse("<r><a/><b/></r>");
    CXmlNode root(document->children);
    CXmlNode added = root.AddChildNode("c", "text");
    EXPECT_EQ("c", added.Name());
    EXPECT_EQ("text", added.GetContent());
    EXPECT_EQ("<r><a/><b/><c>text</c></r>", TextOf(document->children));
    EXPECT_EQ("b", added.PrevSibling().Name());
    EXPECT_EQ("r", added.Parent().Name());
    EXPECT_EQ("c", root.LastChild().Name());
    EXPECT_EQ(document, document->children->last->doc);
}

TEST_F(ChildrenTest, AddedChildCanBeTheOnlyOne)
{
    CXmlNode last(Node("//last"));
    CXmlNode added = last.AddChildNode("only", "");
    EXPECT_EQ("<last><only/></last>", TextOf(Node("//last")));
    EXPECT_EQ("only", last.FirstChild().Name());
    EXPECT_EQ("only", last.LastChild().Name());
    EXPECT_EQ(nullptr, Node("//only")->children);
    ExpectRecords(Traced("AddChildNode", kFound) + kGone, [&] { last.AddChildNode("x", ""); });
}

TEST_F(ChildrenTest, AddedChildFollowsTextWithoutMerging)
{
    CXmlNode name(Node("//name"));
    name.AddChildNode("c", "");
    EXPECT_EQ("<name>box<c/></name>", TextOf(Node("//name")));
}

TEST_F(ChildrenTest, AddedChildTakesTheParentsNamespace)
{
    const xmlDocPtr document = Parse("<p:r xmlns:p='urn:p' xmlns='urn:d'><e/></p:r>");
    CXmlNode root(document->children);
    root.AddChildNode("c", "");
    root.FirstChild().AddChildNode("d", "");
    EXPECT_EQ("<p:r xmlns:p=\"urn:p\" xmlns=\"urn:d\"><e><d/></e><p:c/></p:r>",
              TextOf(document->children));
    EXPECT_EQ(document->children->ns, document->children->last->ns);
}

TEST_F(ChildrenTest, ContentOfAnAddedChildMayHoldEntityReferences)
{
    EXPECT_EQ("a < b", m_root.AddChildNode("c", "a &lt; b").GetContent());
}

TEST_F(ChildrenTest, EmptyNameAddsNoChild)
{
    const std::string before = Text();
    EXPECT_TRUE(m_root.AddChildNode("", "text").IsNull());
    EXPECT_EQ(before, Text());
    ExpectRecords(Traced("AddChildNode", kMade) + kGone, [&] { m_root.AddChildNode("", "x"); });
}

TEST_F(ChildrenTest, NullHandleAddsNoChild)
{
    EXPECT_TRUE(m_null.AddChildNode("c", "").IsNull());
    ExpectRecords(Traced("AddChildNode", kMade) + kGone, [&] { m_null.AddChildNode("c", ""); });
}

// --- AddSiblingNode

TEST_F(ChildrenTest, AddedSiblingGoesLast)
{
    const xmlDocPtr document = Parse("<r><a/><b/><c/></r>");
    CXmlNode first = CXmlNode(document->children).FirstChild();
    CXmlNode added = first.AddSiblingNode("d", "text");
    EXPECT_EQ("d", added.Name());
    EXPECT_EQ("<r><a/><b/><c/><d>text</d></r>", TextOf(document->children));
    EXPECT_EQ("r", added.Parent().Name());
    EXPECT_EQ(document, document->children->last->doc);
}

TEST_F(ChildrenTest, AddedSiblingLogsTheParentItAsksFor)
{
    CXmlNode name(Node("//name"));
    ExpectRecords(Traced("AddSiblingNode", kMade + Traced("Parent", kFound) + kSet) + kGone + kGone,
                  [&] { name.AddSiblingNode("x", "y"); });
}

TEST_F(ChildrenTest, AddedSiblingHasNoNamespaceOfItsOwn)
{
    const xmlDocPtr document = Parse("<p:r xmlns:p='urn:p'><p:e/></p:r>");
    CXmlNode(document->children).FirstChild().AddSiblingNode("s", "");
    EXPECT_EQ("<p:r xmlns:p=\"urn:p\"><p:e/><s/></p:r>", TextOf(document->children));
    EXPECT_EQ(nullptr, document->children->last->ns);
}

TEST_F(ChildrenTest, SiblingMayBeAddedToTextAndComments)
{
    CXmlNode(Node("/cfg/comment()")).AddSiblingNode("x", "");
    CXmlNode(Node("/cfg/text()")).AddSiblingNode("y", "");
    EXPECT_EQ(Strings({"name", "net", "last", "x", "y"}), Names(m_root.Children()));
}

TEST_F(ChildrenTest, RootElementGetsNoSibling)
{
    const std::string before = Serialized(m_document);
    EXPECT_TRUE(m_root.AddSiblingNode("x", "").IsNull());
    EXPECT_EQ(before, Serialized(m_document));
    ExpectRecords(Traced("AddSiblingNode", kMade + Traced("Parent", kMade)) + kGone + kGone,
                  [&] { m_root.AddSiblingNode("x", ""); });
}

TEST_F(ChildrenTest, EmptyNameAddsASiblingWithAnEmptyName)
{
    CXmlNode added = CXmlNode(Node("//name")).AddSiblingNode("", "text");
    EXPECT_FALSE(added.IsNull());
    EXPECT_EQ(NODE_ELEMENT, added.Type());
    EXPECT_EQ("", added.Name());
    EXPECT_EQ("text", added.GetContent());
}

TEST_F(ChildrenTest, ContentOfAnAddedSiblingMayHoldEntityReferences)
{
    EXPECT_EQ("a < b", CXmlNode(Node("//name")).AddSiblingNode("c", "a &lt; b").GetContent());
}

TEST_F(ChildrenTest, SiblingWithoutContentHasNoChildren)
{
    CXmlNode(Node("//name")).AddSiblingNode("c", "");
    EXPECT_EQ(nullptr, Node("//c")->children);
}

TEST_F(ChildrenTest, NullHandleAddsNoSiblingAndAsksForNoParent)
{
    EXPECT_TRUE(m_null.AddSiblingNode("x", "").IsNull());
    ExpectRecords(Traced("AddSiblingNode", kMade) + kGone, [&] { m_null.AddSiblingNode("x", ""); });
}

TEST_F(ChildrenTest, SiblingThatTheEngineDoesNotLinkIsFreed)
{
    CXmlNode name(Node("//name"));
    const std::string before = Text();
    const EngineMemory memory;
    RefuseNextSibling();
    EXPECT_TRUE(name.AddSiblingNode("x", "text").IsNull());
    EXPECT_EQ(0, memory.Live());
    EXPECT_EQ(before, Text());
}

// --- RemoveChildNode

TEST_F(ChildrenTest, OneChildOfTheNameIsRemovedAtATime)
{
    EXPECT_EQ(0, m_net.RemoveChildNode("port"));
    EXPECT_EQ("2", m_net.FindChildNode("port").GetContent());
    EXPECT_EQ(0, m_net.RemoveChildNode("port"));
    EXPECT_EQ(22, m_net.RemoveChildNode("port"));
    EXPECT_EQ("<net id=\"1\" mode=\"on\"><Port>3</Port><empty/></net>", TextOf(Node("//net")));
}

TEST_F(ChildrenTest, RemovedChildIsFreedWithAllBelowIt)
{
    const EngineMemory memory;
    const xmlDocPtr document = NewDocument("r");
    CXmlNode root(document->children);
    const long live = memory.Live();
    CXmlNode child = root.AddChildNode("c", "text");
    child.AddChildNode("d", "text");
    child.AddNewAttribute("a", "1");
    EXPECT_EQ(0, root.RemoveChildNode("c"));
    EXPECT_EQ(live, memory.Live());
    xmlFreeDoc(document);
}

TEST_F(ChildrenTest, RemoveChildNodeLooksForTheChild)
{
    m_net.AddChildNode("x", "");
    LogRecorder log;
    m_net.RemoveChildNode("x");
    EXPECT_EQ(Traced("RemoveChildNode", m_childFound) + kGone, log.Take());
}

TEST_F(ChildrenTest, RemovingAMissingChildAnswers22)
{
    for (CXmlNode node : {m_null, m_net, CXmlNode(Node("//last")), CXmlNode(Node("/"))})
    {
        EXPECT_EQ(22, node.RemoveChildNode("cfg"));
        ExpectRecords(Traced("RemoveChildNode", m_childMissed) + kGone,
                      [&] { node.RemoveChildNode("cfg"); });
    }
}

TEST_F(ChildrenTest, AddedChildTakesADefaultNamespace)
{
    const xmlDocPtr document = Parse("<r xmlns='urn:d'/>");
    CXmlNode(document->children).AddChildNode("c", "");
    EXPECT_EQ(document->children->ns, document->children->children->ns);
}

TEST_F(ChildrenTest, ContentOfAnAddedChildIsMadeForTheDocument)
{
    const xmlDocPtr document = Parse("<!DOCTYPE r [<!ENTITY e 'words'>]><r/>");
    CXmlNode root(xmlDocGetRootElement(document));
    root.AddChildNode("c", "x &e; y").AddSiblingNode("s", "x &e; y");
    EXPECT_NE(nullptr, NodeOf(document, "/r/c[. = 'x words y']"));
    EXPECT_NE(nullptr, NodeOf(document, "/r/s[. = 'x words y']"));
}
