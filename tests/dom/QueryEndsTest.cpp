// Queries that the engine would evaluate forever: they fail, and no other does.

#include "CXmlParser.h"
#include "DomTest.h"

#include <libxml/HTMLparser.h>
#include <libxml/entities.h>
#include <libxml/xinclude.h>
#include <libxml/xpath.h>

#include <sys/resource.h>
#include <unistd.h>

#include <csignal>
#include <cstring>
#include <set>

using namespace kxtest;

namespace
{

// --- Single queries

const char* const kPlain = "<!DOCTYPE a [<!ENTITY e 'text'>]><a><b/><c/>&e;<d/></a>";
const char* const kInAttribute = "<!DOCTYPE a [<!ENTITY e 'text'>]><a n='&e;'><b/><c/></a>";
const char* const kToEarlier =
    "<!DOCTYPE a [<!ENTITY e 'text'><!ENTITY f '<x/>&e;'>]><a><b/>&f;<c/></a>";
const char* const kToLater =
    "<!DOCTYPE a [<!ENTITY f '<x/>&e;'><!ENTITY e 'text'>]><a><y/><b/>&f;<c/></a>";

class QueryEndsTest : public DomTest
{
protected:
    QueryEndsTest() { LowerStepLimits(100000); }
    ~QueryEndsTest() override { LowerStepLimits(0); }

    /** @return whether a query of @p document, which is freed, succeeds. */
    static bool Answers(xmlDocPtr document, const char* expression, const CXmlNode& context)
    {
        CXmlParser parser;
        const TemporaryFolder folder;
        AnswerNextParse(document);
        EXPECT_EQ(0, parser.ParseXml(folder.Write("a.xml", "")));
        const xmlXPathObjectPtr result = parser.GetNodeSet(expression, context);
        xmlXPathFreeObject(result);
        TakeEngineErrors();
        return result != nullptr;
    }

    static bool Answers(const char* xml, const char* expression, const CXmlNode& context)
    {
        return Answers(ParseText(xml), expression, context);
    }

    static bool Answers(const char* xml, const char* expression)
    {
        return Answers(xml, expression, CXmlNode());
    }

    /** The query fails; not before the engine has made some steps, if it can count them. */
    static void ExpectLimit(const char* xml, const char* expression, const CXmlNode& context)
    {
        EXPECT_FALSE(Answers(xml, expression, context)) << expression;
        EXPECT_EQ(CanLimit() ? 1000000000u : 0u, LastStepLimit()) << expression;
    }

    static void ExpectLimit(const char* xml, const char* expression)
    {
        ExpectLimit(xml, expression, CXmlNode());
    }

    static void ExpectNoLimit(const char* xml, const char* expression, const CXmlNode& context)
    {
        EXPECT_TRUE(Answers(xml, expression, context)) << expression;
        EXPECT_EQ(0u, LastStepLimit()) << expression;
    }

    static void ExpectNoLimit(const char* xml, const char* expression)
    {
        ExpectNoLimit(xml, expression, CXmlNode());
    }

    static bool CanLimit() { return EngineVersion() >= 20910 && LIBXML_VERSION >= 20910; }
};

class QueryEndsWithOldEngineTest : public QueryEndsTest
{
protected:
    void SetUp() override
    {
        if (EngineVersion() >= 21400)
        {
            GTEST_SKIP() << "the library does not ask for the version of these engines";
        }
    }

    const PretendedVersion m_pretended{"20708"};
};

// --- Every kind of node

const char* g_query = "";
const char* g_kind = "";

/** Ends the process with the query that takes so long. */
void ReportQuery(int)
{
    for (const char* const text : {g_query, " from kind ", g_kind})
    {
        static_cast<void>(!write(STDERR_FILENO, text, std::strlen(text)));
    }
    _exit(1);
}

std::vector<std::string> AxisQueries()
{
    std::vector<std::string> queries = {"following::*[1]", "preceding::*[1]",
                                        "(preceding::node())[last()]", "//b/following::nosuch",
                                        "//c/preceding::nosuch"};
    for (const char* const axis :
         {"ancestor", "ancestor-or-self", "attribute", "child", "descendant", "descendant-or-self",
          "following", "following-sibling", "namespace", "parent", "preceding", "preceding-sibling",
          "self"})
    {
        queries.push_back(axis + std::string("::node()"));
        queries.push_back(axis + std::string("::nosuch"));
    }
    return queries;
}

const std::vector<std::string> kTextQueries = {
    "string(.)", "//*[.='t']", "id(.)", "lang('en')", "//b|.", "//node()[string(.)='q']"};

/** A document and the nodes of it, or beside it, that are a context. */
struct Contexts
{
    void Add(xmlNodePtr node) { nodes.push_back(node); }

    /** Adds the nodes from @p first on, and all below them. */
    void AddAll(xmlNodePtr first)
    {
        for (xmlNodePtr node = first; node != nullptr; node = node->next)
        {
            Add(node);
            AddBelow(node);
        }
    }

    void AddBelow(xmlNodePtr node)
    {
        if (node->type == XML_ELEMENT_NODE || node->type == XML_XINCLUDE_START)
        {
            AddAll(reinterpret_cast<xmlNodePtr>(node->properties));
        }
        if (node->type != XML_ENTITY_REF_NODE)
        {
            AddAll(node->children);
        }
    }

    void AddTree(xmlDocPtr document) { AddAll(reinterpret_cast<xmlNodePtr>(document)); }

    std::vector<xmlNodePtr> nodes;
};

/** Runs each of @p queries from each of @p contexts; ends the process if that takes long. */
void RunQueries(CXmlParser& parser, const Contexts& contexts,
                const std::vector<std::string>& queries)
{
    for (const xmlNodePtr node : contexts.nodes)
    {
        const std::string kind = std::to_string(node->type);
        g_kind = kind.c_str();
        for (const std::string& query : queries)
        {
            g_query = query.c_str();
            xmlXPathFreeObject(parser.GetNodeSet(query, CXmlNode(node)));
        }
    }
}

[[noreturn]] void EndAfterQueries(CXmlParser& parser, const Contexts& contexts,
                                  const std::vector<std::string>& queries)
{
    const rlimit seconds = {60, 70}; // of processor time, of which the queries take less than one
    setrlimit(RLIMIT_CPU, &seconds);
    std::signal(SIGXCPU, ReportQuery);
    RunQueries(parser, contexts, queries);
    _exit(0);
}

class EveryKindOfNodeTest : public QueryEndsTest
{
protected:
    /** Makes @p document that of m_parser, and all its nodes contexts. */
    xmlDocPtr Use(xmlDocPtr document)
    {
        AnswerNextParse(document);
        EXPECT_EQ(0, m_parser.ParseXml(m_folder.Write("used.xml", "")));
        m_contexts.AddTree(document);
        return document;
    }

    void ExpectEnd(const std::vector<std::string>& queries)
    {
        EXPECT_EXIT(EndAfterQueries(m_parser, m_contexts, queries), testing::ExitedWithCode(0), "");
    }

    void ExpectEnd()
    {
        ExpectEnd(AxisQueries());
        ExpectEnd(kTextQueries);
    }

    std::set<int> Kinds() const
    {
        std::set<int> kinds;
        for (const xmlNodePtr node : m_contexts.nodes)
        {
            kinds.insert(node->type);
        }
        return kinds;
    }

    const TemporaryFolder m_folder;
    CXmlParser m_parser;
    Contexts m_contexts;
};

const char* const kBody = "<a xmlns:n='urn:n' i='id' r='x&plain;y'>text<!--c--><?pi x?>"
                          "<![CDATA[cd]]><b><c>t</c></b>";

std::string Document(const std::string& declarations, const std::string& end)
{
    return "<!--p--><!DOCTYPE a [<!ELEMENT a ANY><!ATTLIST a i ID #IMPLIED>"
           "<!ENTITY plain 'text'>" +
           declarations + "<!--d--><?pi d?>]>" + kBody + end + "<d/><e/><c/></a><!--after-->";
}

} // namespace

// --- Queries that may go around in circles

TEST_F(QueryEndsTest, FollowingPastAReferenceIsLimited)
{
    ExpectLimit(kPlain, "//b/following::nosuch");
    ExpectLimit(kPlain, "//b/following::d");
    ExpectLimit(kPlain, "//b[count(following::*) = 2]");
    ExpectLimit(kToEarlier, "//b/following :: *");
}

TEST_F(QueryEndsTest, PrecedingPastAReferenceToALaterEntityIsLimited)
{
    ExpectLimit(kToLater, "//c/preceding::nosuch");
    ExpectNoLimit(kPlain, "//d/preceding::nosuch");
    ExpectNoLimit(kToEarlier, "//c/preceding::nosuch");
}

TEST_F(QueryEndsTest, AnswerThatIsFoundBeforeTheReferenceIsKept)
{
    if (!CanLimit())
    {
        GTEST_SKIP() << "the library refuses the query, because the engine cannot limit it";
    }
    EXPECT_TRUE(Answers(kPlain, "//b/following::c[1]"));
    EXPECT_TRUE(Answers(kToLater, "//b/preceding::y[1]"));
}

TEST_F(QueryEndsTest, OtherQueriesAreNotLimited)
{
    ExpectNoLimit("<a><b/><c/></a>", "//b/following::*");
    ExpectNoLimit("<a><b/><c/></a>", "//c/preceding::*");
    ExpectNoLimit(kInAttribute, "//b/following::*");
    ExpectNoLimit(kPlain, "//b/following-sibling::*");
    ExpectNoLimit(kPlain, "//c/preceding-sibling::*");
    ExpectNoLimit(kPlain, "//c/ancestor::*");
    ExpectNoLimit(kPlain, "'following::*'");
    ExpectNoLimit(kPlain, "//following");
    ExpectNoLimit("<!DOCTYPE a SYSTEM 'a.dtd'><a><b/>&e;<c/></a>", "//b/following::c");
}

TEST_F(QueryEndsTest, DocumentOfTheContextCounts)
{
    const CXmlNode context(NodeOf(Parse(kPlain), "//b"));
    ExpectLimit("<a/>", "following::nosuch", context);
    ExpectNoLimit("<a/>", "following::nosuch", CXmlNode(Node("//net")));
    const xmlNodePtr alone = xmlNewNode(nullptr, reinterpret_cast<const xmlChar*>("alone"));
    ExpectNoLimit("<a/>", "following::nosuch", CXmlNode(alone));
    xmlFreeNode(alone);
}

TEST_F(QueryEndsTest, ExternalSubsetCounts)
{
    const xmlDocPtr document = ParseText("<a><b/><c/></a>");
    const auto text = [](const char* value) { return reinterpret_cast<const xmlChar*>(value); };
    xmlNewDtd(document, text("a"), nullptr, text("a.dtd"));
    xmlAddDtdEntity(document, text("f"), XML_INTERNAL_GENERAL_ENTITY, nullptr, nullptr,
                    text("&e;x"));
    xmlAddDtdEntity(document, text("e"), XML_INTERNAL_GENERAL_ENTITY, nullptr, nullptr, text("y"));
    CXmlNode(NodeOf(document, "//b")).SetContent("&f;");
    EXPECT_FALSE(Answers(document, "//c/preceding::nosuch", CXmlNode()));
}

TEST_F(QueryEndsTest, PrecedingFailsIfAnEntityEndsWithItself)
{
    const xmlDocPtr document = ParseText("<!DOCTYPE a [<!ENTITY e 'x&e;'>]><a><b/><c/></a>");
    CXmlNode(NodeOf(document, "//b")).SetContent("&e;");
    // From 2.15 on the engine leaves such an entity without children.
    EXPECT_EQ(EngineVersion() >= 21500, Answers(document, "//c/preceding::*", CXmlNode()));
}

// --- With old engines

TEST_F(QueryEndsWithOldEngineTest, QueryForAncestorsFromInsideAnAttributeFails)
{
    const xmlNodePtr attribute = Node("//net/@mode");
    const CXmlNode inside(attribute->children);
    for (const char* const expression : {"ancestor::*", "../ancestor-or-self::node()",
                                         "//a[ancestor \t\r\n::b]", "concat('x', ancestor::*)"})
    {
        EXPECT_FALSE(Answers("<a/>", expression, inside)) << expression;
    }
    EXPECT_TRUE(Answers("<a/>", "..", inside));
    EXPECT_TRUE(Answers("<a/>", "ancestor::*", CXmlNode(attribute)));
    EXPECT_TRUE(Answers("<a/>", "//a/ancestor::*"));

    CXmlNode below = CXmlNode(attribute).AddChildNode("below", "");
    EXPECT_EQ("below", below.Name());
    EXPECT_FALSE(Answers("<a/>", "ancestor::*", below));
}

TEST_F(QueryEndsWithOldEngineTest, NameOfAnAxisInALiteralOrANameIsNoAxis)
{
    const CXmlNode inside(Node("//net/@mode")->children);
    for (const char* const expression :
         {"'ancestor::*'", "\"'ancestor::*\"", "concat('ancestor', \"::\")", "//ancestor",
          "//a[.='ancestor::b']", "ancestor-or-self", "string('')", "following::*", "preceding::*"})
    {
        EXPECT_TRUE(Answers("<a/>", expression, inside)) << expression;
    }
    EXPECT_FALSE(Answers("<a/>", "concat('', 'it', ancestor::*)", inside));
    EXPECT_FALSE(Answers("<a/>", "'", inside));
}

TEST_F(QueryEndsWithOldEngineTest, QueryThatMayNotEndFails)
{
    EXPECT_FALSE(Answers(kPlain, "//b/following::c[1]"));
    EXPECT_FALSE(Answers(kToLater, "//b/preceding::*"));
    EXPECT_TRUE(Answers(kPlain, "//d/preceding::b"));
    EXPECT_TRUE(Answers(kInAttribute, "//b/following::c"));
}

TEST_F(QueryEndsWithOldEngineTest, NamespaceIsAContextAsEver)
{
    CXmlParser parser;
    const TemporaryFolder folder;
    ASSERT_EQ(0, parser.ParseXml(folder.Write("a.xml", "<a xmlns:n='urn:n'/>")));
    const xmlXPathObjectPtr spaces = parser.GetNodeSet("/a/namespace::n", CXmlNode());
    const CXmlNode space(xmlXPathNodeSetItem(spaces->nodesetval, 0));
    for (const char* const expression : {"ancestor::*", "following::*"})
    {
        const xmlXPathObjectPtr result = parser.GetNodeSet(expression, space);
        EXPECT_NE(nullptr, result) << expression;
        xmlXPathFreeObject(result);
    }
    xmlXPathFreeObject(spaces);
}

// --- Every kind of node

TEST_F(EveryKindOfNodeTest, QueryEndsInADocumentWithReferences)
{
    const xmlDocPtr document = Use(ParseText(Document("<!ENTITY f '<x/>x&plain;'>", "&plain;&f;")));
    const xmlNodePtr fragment = xmlNewDocFragment(document);
    CXmlNode(fragment).SetContent("x&f;");
    m_contexts.AddAll(fragment);
    const xmlXPathObjectPtr spaces = m_parser.GetNodeSet("/a/namespace::n", CXmlNode());
    m_contexts.Add(xmlXPathNodeSetItem(spaces->nodesetval, 0));
    // Every kind but those that only HTML and XInclude make, and those that no tree has.
    EXPECT_EQ((std::set<int>{1, 2, 3, 4, 5, 7, 8, 9, 11, 14, 15, 16, 17, 18}), Kinds());
    ExpectEnd();
    xmlXPathFreeObject(spaces);
    xmlFreeNode(fragment);
}

TEST_F(EveryKindOfNodeTest, QueryEndsInADocumentWithReferencesInAttributes)
{
    Use(ParseText(Document("", "")));
    ExpectEnd();
}

TEST_F(EveryKindOfNodeTest, QueryEndsInADocumentWithAReferenceToALaterEntity)
{
    Use(ParseText(Document("<!ENTITY f 'x&later;<y/>'><!ENTITY later 'z'>", "&f;")));
    ExpectEnd();
}

TEST_F(EveryKindOfNodeTest, QueryEndsInADocumentWithEntitiesThatContainThemselves)
{
    const char* const entities = "<!ENTITY e 'x&e;y'><!ENTITY f 'z&f;'><!ENTITY g '&h;'>"
                                 "<!ENTITY h '<b/>&g;'>";
    for (const char* const content : {"&e;", "&f;", "&g;"})
    {
        SCOPED_TRACE(content);
        m_contexts.nodes.clear();
        const xmlDocPtr document = ParseText(Document(entities, ""));
        CXmlNode(NodeOf(document, "//d")).SetContent(content);
        Use(document);
        // The text of such an entity has no end.
        ExpectEnd(AxisQueries());
    }
}

TEST_F(EveryKindOfNodeTest, QueryEndsInAnHtmlDocument)
{
    const std::string html = "<html><body a='x&amp;y'><p>t&nbsp;<!--c--></p></body></html>";
    Use(htmlReadMemory(html.data(), static_cast<int>(html.size()), "a.html", nullptr, 0));
    EXPECT_EQ(1u, Kinds().count(XML_HTML_DOCUMENT_NODE));
    ExpectEnd();
}

TEST_F(EveryKindOfNodeTest, QueryEndsInADocumentWithInclusions)
{
    const std::string path = m_folder.Write("included.xml", "<i><j/></i>");
    const xmlDocPtr document = ParseText("<a xmlns:xi='http://www.w3.org/2001/XInclude'><b/>"
                                         "<xi:include href='" +
                                         path + "'/><c/></a>");
    xmlXIncludeProcess(document);
    Use(document);
    EXPECT_EQ(1u, Kinds().count(XML_XINCLUDE_START));
    EXPECT_EQ(1u, Kinds().count(XML_XINCLUDE_END));
    ExpectEnd();
}
