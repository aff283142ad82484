// Every operation on every kind of node that a handle can stand on.

#include "CXmlParser.h"
#include "DomTest.h"

#include <libxml/HTMLtree.h>
#include <libxml/parser.h>
#include <libxml/xpath.h>

#include <map>
#include <memory>
#include <optional>

using namespace kxtest;

namespace
{

const char* const kXml = "<!DOCTYPE a [\n"
                         "<!--in the DTD-->\n"
                         "<!ELEMENT a ANY>\n"
                         "<!ATTLIST a id ID #IMPLIED d CDATA \"dflt\">\n"
                         "<!ENTITY e \"words\">\n"
                         "<!ENTITY m \"<x>one</x>\">\n"
                         "]>\n"
                         "<a id=\"i1\" q=\"v &e; w\" xmlns:p=\"urn:p\" "
                         "p:r=\"s\"><b>text</b>piece<!--comment--><?pi data?>"
                         "<![CDATA[cdata]]>&m;<c/></a>\n";

/** What the operations answer that depend on the kind of node. */
struct Answers
{
    int type;
    const char* name;
    int setContent = 0;
    int clear = 0;
    int remove = 0;
    bool addsChild = true;
    bool addsSibling = false;
    bool hasAttributes = false;
    const char* parent = "";
    const char* firstChild = "";
    const char* next = "";
    const char* previous = "";
    const char* content = "";
};

struct Kind
{
    const char* title;
    Answers answers;
};

std::ostream& operator<<(std::ostream& out, const Kind& kind)
{
    return out << kind.title;
}

const int kRefused = 22;

const Kind kKinds[] = {
    {"Element", {1, "a", 0, 0, 0, true, false, true, "", "b"}},
    {"InnerElement", {1, "b", 0, 0, 0, true, true, false, "a", "", "c", "", "text"}},
    {"Attribute", {2, "r", 0, 0, 0, true, false, false, "a", "", "", "", "s"}},
    {"IdAttribute", {2, "id", 0, 0, 0, true, false, false, "a", "", "", "", "i1"}},
    {"AttributeText", {3, "text", 0, 0, 0, true, false}},
    {"IdAttributeText", {3, "text", 0, 0, 0, true, false}},
    {"AttributeEntityReference", {5, "e", kRefused, kRefused, 0, false, false}},
    {"Text", {3, "text", 0, 0, 0, true, true, false, "a", "", "c", "b"}},
    {"Cdata", {4, "", 0, 0, 0, true, true, false, "a", "", "c", "b"}},
    {"EntityReference", {5, "m", kRefused, kRefused, 0, false, true, false, "a", "", "c", "b"}},
    {"ProcessingInstruction", {7, "pi", 0, 0, 0, true, true, false, "a", "", "c", "b"}},
    {"Comment", {8, "comment", 0, 0, 0, true, true, false, "a", "", "c", "b"}},
    {"Document", {9, "", kRefused, kRefused, kRefused, true, false, false, "", "a"}},
    {"DocumentWithoutEntities", {9, "", kRefused, kRefused, kRefused, true, false, false, "", "a"}},
    {"HtmlDocument", {13, "", kRefused, kRefused, kRefused, true, false, false, "", "html"}},
    {"Fragment", {11, "", 0, 0, 0, true, false, false, "", "f"}},
    {"Dtd", {14, "a", kRefused, kRefused, kRefused, true, false, false, "", "", "a"}},
    {"DtdWithoutEntities",
     {14, "a", kRefused, kRefused, kRefused, true, false, false, "", "", "a"}},
    {"EmptyDtd", {14, "a", kRefused, kRefused, kRefused, true, false, false, "", "", "a"}},
    {"CommentInDtd", {8, "comment", 0, 0, 0, true, false}},
    {"ElementDeclaration", {15, "a", kRefused, kRefused, kRefused, false, false}},
    {"AttributeDeclaration", {16, "id", kRefused, kRefused, kRefused, false, false}},
    {"EntityDeclaration", {17, "m", kRefused, kRefused, kRefused, false, false, false, "", "x"}},
    {"EntityContent", {1, "x", 0, 0, 0, true, false, false, "", "", "", "", "one"}},
    {"Namespace", {18, "", kRefused, kRefused, kRefused, false, false}},
    {"XIncludeStart", {19, "include", 0, 0, 0, true, true, false, "b"}},
    {"XIncludeEnd", {20, "include", 0, 0, 0, true, true, false, "b"}},
};

/** A document and one node of it; all is freed with the object, as a client's document would be. */
class Subject
{
public:
    explicit Subject(const std::string& title)
    {
        if (title == "HtmlDocument")
        {
            m_document = htmlNewDocNoDtD(nullptr, nullptr);
            xmlDocSetRootElement(m_document, xmlNewNode(nullptr, Name("html")));
        }
        else if (title == "DtdWithoutEntities" || title == "DocumentWithoutEntities")
        {
            m_document = ParseText("<!DOCTYPE a [<!ELEMENT a ANY>]><a/>");
        }
        else if (title == "EmptyDtd")
        {
            m_document = ParseText("<!DOCTYPE a SYSTEM 'a.dtd'><a/>");
        }
        else
        {
            m_document = ParseText(kXml);
        }
        m_node = Find(title);
    }

    ~Subject()
    {
        xmlFreeNode(m_fragment);
        xmlXPathFreeObject(m_namespaces);
        xmlFreeDoc(m_document);
    }

    Subject(const Subject&) = delete;
    Subject& operator=(const Subject&) = delete;

    xmlDocPtr Document() const { return m_document; }
    xmlNodePtr Node() const { return m_node; }

    /** To be called when the node was freed. */
    void NodeIsGone()
    {
        if (m_node == m_fragment)
        {
            m_fragment = nullptr;
        }
    }

private:
    static const xmlChar* Name(const char* name) { return reinterpret_cast<const xmlChar*>(name); }

    xmlXPathObjectPtr Select(const char* xpath) const
    {
        const xmlXPathContextPtr context = xmlXPathNewContext(m_document);
        const xmlXPathObjectPtr result = xmlXPathEvalExpression(Name(xpath), context);
        xmlXPathFreeContext(context);
        return result;
    }

    xmlNodePtr First(const char* xpath) const
    {
        const xmlXPathObjectPtr result = Select(xpath);
        const xmlNodePtr node = xmlXPathNodeSetItem(result->nodesetval, 0);
        xmlXPathFreeObject(result);
        return node;
    }

    xmlNodePtr Root() const { return xmlDocGetRootElement(m_document); }

    xmlNodePtr Child(xmlNodePtr parent, xmlElementType type) const
    {
        xmlNodePtr child = parent->children;
        while (child != nullptr && child->type != type)
        {
            child = child->next;
        }
        return child;
    }

    xmlNodePtr Dtd() const { return reinterpret_cast<xmlNodePtr>(m_document->intSubset); }

    xmlNodePtr Entity() const
    {
        return reinterpret_cast<xmlNodePtr>(xmlGetDocEntity(m_document, Name("m")));
    }

    xmlNodePtr XInclude(xmlElementType type) const
    {
        const xmlNodePtr mark = xmlNewDocNode(m_document, nullptr, Name("include"), nullptr);
        mark->type = type;
        return xmlAddChild(First("/a/b"), mark);
    }

    xmlNodePtr Fragment()
    {
        m_fragment = xmlNewDocFragment(m_document);
        xmlAddChild(m_fragment, xmlNewDocNode(m_document, nullptr, Name("f"), nullptr));
        return m_fragment;
    }

    xmlNodePtr Namespace()
    {
        m_namespaces = Select("/a/namespace::p");
        return m_namespaces->nodesetval->nodeTab[0];
    }

    xmlNodePtr Find(const std::string& title)
    {
        const std::map<std::string, std::function<xmlNodePtr()>> finders = {
            {"Element", [&] { return Root(); }},
            {"InnerElement", [&] { return First("/a/b"); }},
            {"Attribute", [&] { return First("/a/@*[local-name() = 'r']"); }},
            {"IdAttribute", [&] { return First("/a/@id"); }},
            {"AttributeText", [&] { return First("/a/@*[local-name() = 'r']")->children; }},
            {"IdAttributeText", [&] { return First("/a/@id")->children; }},
            {"AttributeEntityReference",
             [&] { return Child(First("/a/@q"), XML_ENTITY_REF_NODE); }},
            {"Text", [&] { return Child(Root(), XML_TEXT_NODE); }},
            {"Cdata", [&] { return Child(Root(), XML_CDATA_SECTION_NODE); }},
            {"EntityReference", [&] { return Child(Root(), XML_ENTITY_REF_NODE); }},
            {"ProcessingInstruction", [&] { return Child(Root(), XML_PI_NODE); }},
            {"Comment", [&] { return Child(Root(), XML_COMMENT_NODE); }},
            {"Document", [&] { return First("/"); }},
            {"DocumentWithoutEntities", [&] { return First("/"); }},
            {"HtmlDocument", [&] { return reinterpret_cast<xmlNodePtr>(m_document); }},
            {"Fragment", [&] { return Fragment(); }},
            {"Dtd", [&] { return Dtd(); }},
            {"DtdWithoutEntities", [&] { return Dtd(); }},
            {"EmptyDtd", [&] { return Dtd(); }},
            {"CommentInDtd", [&] { return Child(Dtd(), XML_COMMENT_NODE); }},
            {"ElementDeclaration", [&] { return Child(Dtd(), XML_ELEMENT_DECL); }},
            {"AttributeDeclaration", [&] { return Child(Dtd(), XML_ATTRIBUTE_DECL); }},
            {"EntityDeclaration", [&] { return Entity(); }},
            {"EntityContent", [&] { return Entity()->children; }},
            {"Namespace", [&] { return Namespace(); }},
            {"XIncludeStart", [&] { return XInclude(XML_XINCLUDE_START); }},
            {"XIncludeEnd", [&] { return XInclude(XML_XINCLUDE_END); }},
        };
        return finders.at(title)();
    }

    xmlDocPtr m_document = nullptr;
    xmlNodePtr m_node = nullptr;
    xmlNodePtr m_fragment = nullptr;
    xmlXPathObjectPtr m_namespaces = nullptr;
};

class NodeKindTest : public testing::TestWithParam<Kind>
{
protected:
    NodeKindTest() : m_answers(GetParam().answers)
    {
        // What the engine sets up once is not in the balance.
        m_subject = Renew();
        ExpectSound();
        m_subject.reset();
        m_memory.emplace();
        m_subject = Renew();
    }

    ~NodeKindTest() override
    {
        ExpectSound();
        m_subject.reset();
        EXPECT_EQ(m_kept, m_memory->Live()) << "every node is freed with its document";
    }

    std::unique_ptr<Subject> Renew() { return std::make_unique<Subject>(GetParam().title); }

    CXmlNode Handle() { return CXmlNode(m_subject->Node()); }

    /** The document can be saved and walked from end to end, whatever was done to it. */
    void ExpectSound()
    {
        Serialized(m_subject->Document());
        const xmlXPathContextPtr context = xmlXPathNewContext(m_subject->Document());
        for (const char* const xpath :
             {"string(/)", "count(//node() | //@* | //namespace::*)", "id('i1') | id('x')"})
        {
            xmlXPathFreeObject(
                xmlXPathEvalExpression(reinterpret_cast<const xmlChar*>(xpath), context));
        }
        xmlXPathFreeContext(context);
    }

    void ExpectUnchanged()
    {
        const std::string now = Serialized(m_subject->Document());
        EXPECT_EQ(Serialized(Renew()->Document()), now);
    }

    std::optional<EngineMemory> m_memory;
    const Answers m_answers;
    std::unique_ptr<Subject> m_subject;
    CXmlParser m_parser;
    long m_kept = 0; ///< buffers that GetContent leaves behind by contract
};

} // namespace

TEST_P(NodeKindTest, IsToldByTypeAndName)
{
    ASSERT_NE(nullptr, m_subject->Node());
    EXPECT_FALSE(Handle().IsNull());
    EXPECT_EQ(m_answers.type, Handle().Type());
    EXPECT_EQ(m_answers.name, Handle().Name());
}

TEST_P(NodeKindTest, IsNavigatedFrom)
{
    EXPECT_EQ(m_answers.parent, Handle().Parent().Name());
    EXPECT_EQ(m_answers.firstChild, Handle().FirstChild().Name());
    EXPECT_EQ(m_answers.next, Handle().NextSibling().Name());
    EXPECT_EQ(m_answers.previous, Handle().PrevSibling().Name());
    EXPECT_EQ(*m_answers.firstChild == '\0', Handle().LastChild().IsNull());
    EXPECT_EQ(*m_answers.firstChild == '\0', Handle().Children().empty());
}

TEST_P(NodeKindTest, IsSearchedForChildrenByName)
{
    const bool isElement = Handle().Type() == NODE_ELEMENT;
    for (const char* const name : {"a", "b", "x", "m", "e", "text", ""})
    {
        CXmlNode found = Handle().FindChildNode(name);
        EXPECT_TRUE(isElement || found.IsNull()) << name;
        EXPECT_EQ(found.IsNull(), Handle().FindAllChildNodes(name).empty());
        std::string value = "before";
        EXPECT_EQ(found.IsNull() ? -2 : 0, Handle().GetContentOfChildNode(name, value));
        m_kept += value == "text" ? 1 : 0;
    }
    ExpectUnchanged();
}

TEST_P(NodeKindTest, IsReadForContent)
{
    EXPECT_EQ(m_answers.content, Handle().GetContent());
    m_kept = *m_answers.content == '\0' ? 0 : 1;
}

TEST_P(NodeKindTest, TakesContentOrRefusesIt)
{
    EXPECT_EQ(m_answers.setContent, Handle().SetContent("new &amp; text"));
    if (m_answers.setContent != 0)
    {
        ExpectUnchanged();
    }
}

TEST_P(NodeKindTest, TakesEmptyContentAndNewContentAgain)
{
    Handle().SetContent("");
    EXPECT_EQ(m_answers.setContent, Handle().SetContent("x"));
    Handle().ClearNode();
}

TEST_P(NodeKindTest, IsClearedOrRefusesIt)
{
    EXPECT_EQ(m_answers.clear, Handle().ClearNode());
    if (m_answers.clear != 0)
    {
        ExpectUnchanged();
    }
    else
    {
        EXPECT_TRUE(Handle().FirstChild().IsNull());
        EXPECT_TRUE(Handle().GetAttributeItems().empty());
    }
    EXPECT_EQ(m_answers.clear, Handle().ClearNode());
}

TEST_P(NodeKindTest, IsAddedAChildOrRefusesIt)
{
    for (const char* const content : {"", "text"})
    {
        CXmlNode child = Handle().AddChildNode("child", content);
        ASSERT_EQ(m_answers.addsChild, !child.IsNull());
        if (m_answers.addsChild)
        {
            EXPECT_EQ("child", Handle().LastChild().Name());
            EXPECT_EQ(content, std::string(content).empty() ? child.GetContent() : "text");
            child.AddChildNode("below", "").AddSiblingNode("beside", "");
        }
        else
        {
            ExpectUnchanged();
        }
    }
}

TEST_P(NodeKindTest, GivesUpAnAddedChild)
{
    CXmlNode child = m_parser.AddNewNode(Handle(), "child", "text");
    ASSERT_EQ(m_answers.addsChild, !child.IsNull());
    EXPECT_EQ(m_answers.addsChild ? 0 : 22, m_parser.RemoveNode(child));
    ExpectUnchanged();
}

TEST_P(NodeKindTest, IsGoneWithItsAddedChildren)
{
    Handle().AddChildNode("child", "text");
    EXPECT_EQ(m_answers.remove, m_parser.RemoveNode(Handle()));
    if (m_answers.remove == 0)
    {
        m_subject->NodeIsGone();
    }
}

TEST_P(NodeKindTest, IsAddedASiblingOrRefusesIt)
{
    CXmlNode sibling = Handle().AddSiblingNode("sibling", "text");
    ASSERT_EQ(m_answers.addsSibling, !sibling.IsNull());
    if (m_answers.addsSibling)
    {
        EXPECT_EQ("sibling", Handle().Parent().LastChild().Name());
    }
    else
    {
        ExpectUnchanged();
    }
}

TEST_P(NodeKindTest, IsRemovedOrRefusesIt)
{
    EXPECT_EQ(m_answers.remove, m_parser.RemoveNode(Handle()));
    if (m_answers.remove != 0)
    {
        ExpectUnchanged();
    }
    else
    {
        m_subject->NodeIsGone();
    }
}

TEST_P(NodeKindTest, IsRemovedAfterItsContentWasReplaced)
{
    Handle().SetContent("other");
    EXPECT_EQ(m_answers.remove, m_parser.RemoveNode(Handle()));
    if (m_answers.remove == 0)
    {
        m_subject->NodeIsGone();
    }
}

TEST_P(NodeKindTest, LosesItsChildrenByName)
{
    const bool isElement = Handle().Type() == NODE_ELEMENT;
    for (const char* const name : {"a", "b", "m", "text", "one", "e", "x"})
    {
        const bool removed = Handle().RemoveChildNode(name) == 0;
        EXPECT_TRUE(isElement || !removed) << name;
    }
}

TEST_P(NodeKindTest, HasAttributesOnlyIfItIsAnElement)
{
    std::string value = "before";
    const bool isElement = Handle().Type() == NODE_ELEMENT;
    EXPECT_EQ(m_answers.hasAttributes, !Handle().GetAttributeItems().empty());
    EXPECT_EQ(m_answers.hasAttributes ? 0 : 22, Handle().GetAttributeValue("id", value));
    EXPECT_EQ(isElement ? 0 : 22, Handle().AddNewAttribute("new", "1"));
    EXPECT_EQ(isElement ? 0 : 22, Handle().GetAttributeValue("new", value));
    EXPECT_EQ(0, Handle().RemoveAttribute("new"));
    EXPECT_EQ(0, Handle().SetAttributeValue("new", "2"));
    EXPECT_EQ(isElement ? "1" : "before", value);
    if (!isElement)
    {
        ExpectUnchanged();
    }
}

TEST_P(NodeKindTest, IsAContextForQueries)
{
    TemporaryFolder folder;
    CXmlParser parser;
    ASSERT_EQ(0, parser.ParseXml(folder.Write("a.xml", "<a/>")));
    for (const char* const expression : {".", "..", "*", "@*", "node()", "//b", "ancestor::*"})
    {
        parser.FindNode(expression, Handle());
        parser.FindAllNodes(expression, Handle());
    }
    TakeEngineErrors();
    parser.ClearDocument();
    // The parser's own document is not in the balance of the subject.
    m_subject.reset();
    xmlInitParser();
    m_memory.emplace();
    m_subject = Renew();
}

TEST_P(NodeKindTest, RefusesQuietly)
{
    LogRecorder log(kMaskAll & ~kMaskTrace);
    if (m_answers.setContent != 0)
    {
        Handle().SetContent("x");
    }
    if (m_answers.clear != 0)
    {
        Handle().ClearNode();
    }
    if (m_answers.remove != 0)
    {
        m_parser.RemoveNode(Handle());
    }
    if (!m_answers.addsChild)
    {
        Handle().AddChildNode("child", "");
    }
    if (!m_answers.addsSibling)
    {
        Handle().AddSiblingNode("sibling", "");
    }
    EXPECT_EQ(Records(), log.Take());
}

// --- What the kind alone does not tell

class NodeTest : public DomTest
{
protected:
    CXmlParser m_parser;
};

TEST_F(NodeTest, EntityWhoseContentLiesInTheDocumentIsNotCleared)
{
    // As some engines leave it when they replace references while parsing.
    const xmlDocPtr document = Parse(kXml);
    const auto entity = xmlGetDocEntity(document, reinterpret_cast<const xmlChar*>("m"));
    const xmlNodePtr own = entity->children;
    entity->children = entity->last = NodeOf(document, "/a/b");
    const std::string before = Serialized(document);
    EXPECT_EQ(22, CXmlNode(reinterpret_cast<xmlNodePtr>(entity)).ClearNode());
    EXPECT_EQ(before, Serialized(document));
    entity->children = entity->last = own;
}

TEST_F(NodeTest, AttributeThatTheEngineDoesNotRemoveEndsTheClearing)
{
    const xmlDocPtr document = Parse("<a x='1' y='2'/>");
    const xmlAttrPtr attribute = document->children->properties;
    attribute->parent = nullptr; // as no sound tree has it
    EXPECT_EQ(0, CXmlNode(document->children).ClearNode());
    EXPECT_EQ(attribute, document->children->properties);
    attribute->parent = document->children;
}

TEST_F(NodeTest, ChildUnderTheDocumentIsSavedWithoutANamespace)
{
    const xmlDocPtr document = xmlNewDoc(nullptr);
    CXmlNode handle(reinterpret_cast<xmlNodePtr>(document));
    CXmlNode root = handle.AddChildNode("root", "text");
    EXPECT_EQ("<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n<root>text</root>\n",
              Serialized(document));
    EXPECT_EQ(nullptr, document->children->ns);
    EXPECT_EQ(document->children, xmlDocGetRootElement(document));
    EXPECT_TRUE(root.Parent().IsNull());
    xmlFreeDoc(document);
}

TEST_F(NodeTest, ChildOfAnAttributeTakesItsNamespace)
{
    const xmlDocPtr document = Parse("<a xmlns:p='urn:p' p:r='s'/>");
    CXmlNode attribute(NodeOf(document, "/a/@*"));
    EXPECT_FALSE(attribute.AddChildNode("c", "").IsNull());
    EXPECT_EQ(document->children->nsDef, document->children->properties->last->ns);
    EXPECT_EQ("<a xmlns:p=\"urn:p\" p:r=\"s\"/>", TextOf(document->children));
}

INSTANTIATE_TEST_SUITE_P(All, NodeKindTest, testing::ValuesIn(kKinds),
                         [](const testing::TestParamInfo<Kind>& kind)
                         { return std::string(kind.param.title); });
