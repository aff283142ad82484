#include "CXmlAttr.h"
#include "DomTest.h"

#include <cstddef>
#include <type_traits>

using namespace kxtest;

namespace
{

using Pairs = std::vector<std::pair<std::string, std::string>>;

static_assert(std::is_standard_layout<CXmlAttr>::value && !std::is_polymorphic<CXmlAttr>::value,
              "");
static_assert(sizeof(CXmlAttr) == 2 * sizeof(std::string), "two strings and nothing else");

const Records kAttribute = Traced("CXmlAttr");
const Records kAttributeGone = Traced("~CXmlAttr");
const char* const kNullNode = "Node ptr is NULL";

Pairs Items(CXmlNode node)
{
    Pairs pairs;
    for (const CXmlAttr& item : node.GetAttributeItems())
    {
        pairs.emplace_back(item.m_strName, item.m_strValue);
    }
    return pairs;
}

class AttributeTest : public DomTest
{
protected:
    CXmlNode m_null;
    CXmlNode m_net = CXmlNode(Node("//net"));
    CXmlNode m_last = CXmlNode(Node("//last"));
};

} // namespace

// --- CXmlAttr

TEST_F(AttributeTest, PairIsEmptyByDefault)
{
    CXmlAttr pair;
    EXPECT_EQ("", pair.m_strName);
    EXPECT_EQ("", pair.m_strValue);
    EXPECT_LT(static_cast<void*>(&pair.m_strName), static_cast<void*>(&pair.m_strValue));
    ExpectRecords(kAttribute + kAttributeGone, [] { CXmlAttr made; });
}

TEST_F(AttributeTest, PairTakesNameAndValue)
{
    CXmlAttr pair("id", "7");
    EXPECT_EQ("id", pair.m_strName);
    EXPECT_EQ("7", pair.m_strValue);
    ExpectRecords(kAttribute + kAttributeGone, [] { CXmlAttr made("id", "7"); });
}

TEST_F(AttributeTest, PairsAreCopiedMemberByMemberWithoutRecords)
{
    const CXmlAttr pair("id", "7");
    LogRecorder log;
    CXmlAttr copy(pair);
    CXmlAttr assigned(copy);
    assigned = pair;
    EXPECT_EQ(Records(), log.Take());
    copy.m_strValue = "8";
    EXPECT_EQ("7", pair.m_strValue);
    EXPECT_EQ("id", assigned.m_strName);
}

// --- AddNewAttribute

TEST_F(AttributeTest, AddedAttributeIsTheLastOne)
{
    EXPECT_EQ(0, m_net.AddNewAttribute("speed", "10"));
    EXPECT_EQ(Pairs({{"id", "1"}, {"mode", "on"}, {"speed", "10"}}), Items(m_net));
    ExpectRecords(Traced("AddNewAttribute"), [&] { m_last.AddNewAttribute("a", "1"); });
}

TEST_F(AttributeTest, AddedAttributeHasNoNamespace)
{
    const xmlDocPtr document = Parse("<p:r xmlns:p='urn:p'/>");
    CXmlNode(document->children).AddNewAttribute("a", "1");
    EXPECT_EQ("<p:r xmlns:p=\"urn:p\" a=\"1\"/>", TextOf(document->children));
}

TEST_F(AttributeTest, AddedValueIsSavedEscaped)
{
    EXPECT_EQ(0, m_last.AddNewAttribute("a", "<\"&"));
    EXPECT_EQ("<last a=\"&lt;&quot;&amp;\"/>", TextOf(Node("//last")));
}

TEST_F(AttributeTest, AddingAnAttributeAgainLeavesTwo)
{
    EXPECT_EQ(0, m_net.AddNewAttribute("id", "7"));
    EXPECT_EQ(Pairs({{"id", "1"}, {"mode", "on"}, {"id", "7"}}), Items(m_net));
    std::string value;
    EXPECT_EQ(0, m_net.GetAttributeValue("id", value));
    EXPECT_EQ("1", value);
}

TEST_F(AttributeTest, AddingToANullHandleAnswers22)
{
    EXPECT_EQ(22, m_null.AddNewAttribute("a", "1"));
    ExpectRecords(Traced("AddNewAttribute", {Error("AddNewAttribute", kNullNode)}),
                  [&] { m_null.AddNewAttribute("a", "1"); });
}

TEST_F(AttributeTest, AttributeThatTheEngineRefusesAnswers22)
{
    CXmlNode text(Node("//name/text()"));
    EXPECT_EQ(22, text.AddNewAttribute("100%s", "1"));
    ExpectRecords(Traced("AddNewAttribute",
                         {Error("AddNewAttribute", "Unable to add new property :: 100%s")}),
                  [&] { text.AddNewAttribute("100%s", "1"); });
}

// --- GetAttributeValue

TEST_F(AttributeTest, ValueIsRead)
{
    std::string value = "before";
    EXPECT_EQ(0, m_net.GetAttributeValue("mode", value));
    EXPECT_EQ("on", value);
    ExpectRecords(Traced("GetAttributeValue"), [&] { m_net.GetAttributeValue("mode", value); });
}

TEST_F(AttributeTest, EmptyValueReplacesTheCallersString)
{
    std::string value = "before";
    EXPECT_EQ(0, CXmlNode(NodeOf(Parse("<e a=''/>"), "/e")).GetAttributeValue("a", value));
    EXPECT_EQ("", value);
}

TEST_F(AttributeTest, EnginesBufferIsFreedAfterReading)
{
    std::string value;
    const EngineMemory memory;
    EXPECT_EQ(0, m_net.GetAttributeValue("mode", value));
    EXPECT_EQ(22, m_net.GetAttributeValue("missing", value));
    EXPECT_EQ(0, memory.Live());
}

TEST_F(AttributeTest, EnginesBufferIsFreedWhenTheStringRunsOutOfMemory)
{
    const std::string text(1000, 'x');
    CXmlNode node(NodeOf(Parse("<e a='" + text + "'/>"), "/e"));
    std::string value;
    const EngineMemory memory;
    NewCounter::FailAt(1);
    EXPECT_THROW(node.GetAttributeValue("a", value), std::bad_alloc);
    NewCounter::FailAt(0);
    EXPECT_EQ(0, memory.Live());
}

TEST_F(AttributeTest, MissingAttributeLeavesTheStringAsItWas)
{
    std::string value = "before";
    EXPECT_EQ(22, m_net.GetAttributeValue("missing", value));
    EXPECT_EQ(22, m_net.GetAttributeValue("", value));
    EXPECT_EQ(22, m_net.GetAttributeValue("MODE", value));
    EXPECT_EQ("before", value);
    ExpectRecords(
        Traced("GetAttributeValue", {Error("GetAttributeValue", "Attribute key :: %d not found")}),
        [&] { m_net.GetAttributeValue("%d", value); });
}

TEST_F(AttributeTest, ReadingFromANullHandleLeavesTheStringAsItWas)
{
    std::string value = "before";
    EXPECT_EQ(22, m_null.GetAttributeValue("id", value));
    EXPECT_EQ("before", value);
    ExpectRecords(Traced("GetAttributeValue", {Error("GetAttributeValue", kNullNode)}),
                  [&] { m_null.GetAttributeValue("id", value); });
}

TEST_F(AttributeTest, PrefixIsNoPartOfTheName)
{
    std::string value;
    CXmlNode node(NodeOf(Parse("<e xmlns:p='urn:p' p:a='1'/>"), "/e"));
    EXPECT_EQ(0, node.GetAttributeValue("a", value));
    EXPECT_EQ("1", value);
    EXPECT_EQ(22, node.GetAttributeValue("p:a", value));
    EXPECT_EQ(Pairs({{"a", "1"}}), Items(node));
}

TEST_F(AttributeTest, DeclaredDefaultIsReadButNotListed)
{
    CXmlNode node(NodeOf(Parse("<!DOCTYPE e [<!ATTLIST e a CDATA 'dflt'>]><e/>"), "/e"));
    std::string value;
    EXPECT_EQ(0, node.GetAttributeValue("a", value));
    EXPECT_EQ("dflt", value);
    EXPECT_EQ(Pairs(), Items(node));
}

// --- GetAttributeItems

TEST_F(AttributeTest, AttributesAreListedInDocumentOrder)
{
    EXPECT_EQ(Pairs({{"a", "1"}, {"b", "2"}}),
              Items(CXmlNode(NodeOf(Parse("<e a=\"1\" b=\"2\"/>"), "/e"))));
}

TEST_F(AttributeTest, AttributeWithoutAValueShowsTheOneBeforeIt)
{
    const xmlNodePtr element = NodeOf(Parse("<e a=\"1\"/>"), "/e");
    xmlNewNsProp(element, nullptr, reinterpret_cast<const xmlChar*>("b"), nullptr);
    CXmlNode node(element);
    node.AddNewAttribute("c", "3");
    EXPECT_EQ(Pairs({{"a", "1"}, {"b", "1"}, {"c", "3"}}), Items(node));
}

TEST_F(AttributeTest, FirstAttributeWithoutAValueShowsAnEmptyOne)
{
    const xmlNodePtr element = NodeOf(Parse("<e/>"), "/e");
    xmlNewNsProp(element, nullptr, reinterpret_cast<const xmlChar*>("a"), nullptr);
    EXPECT_EQ(Pairs({{"a", ""}}), Items(element));
}

TEST_F(AttributeTest, EmptiedAttributeShowsTheOneBeforeIt)
{
    const xmlDocPtr document = Parse("<e a='1' b='2' c='3'/>");
    EXPECT_EQ(0, CXmlNode(NodeOf(document, "/e/@b")).SetContent(""));
    EXPECT_EQ(Pairs({{"a", "1"}, {"b", "1"}, {"c", "3"}}), Items(NodeOf(document, "/e")));
    EXPECT_EQ(0, CXmlNode(NodeOf(document, "/e/@c")).ClearNode());
    EXPECT_EQ(Pairs({{"a", "1"}, {"b", "1"}, {"c", "1"}}), Items(NodeOf(document, "/e")));
    std::string value = "before";
    EXPECT_EQ(0, CXmlNode(NodeOf(document, "/e")).GetAttributeValue("b", value));
    EXPECT_EQ("", value);
}

TEST_F(AttributeTest, EmptiedAttributeIsEmptyOnceItIsSavedAndLoaded)
{
    const xmlDocPtr document = Parse("<e a='1' b='2'/>");
    CXmlNode(NodeOf(document, "/e/@b")).SetContent("");
    EXPECT_EQ("<e a=\"1\" b=\"\"/>", TextOf(document->children));
    EXPECT_EQ(Pairs({{"a", "1"}, {"b", ""}}), Items(NodeOf(Parse("<e a='1' b=''/>"), "/e")));
}

TEST_F(AttributeTest, ParsedEmptyValueIsEmpty)
{
    EXPECT_EQ(Pairs({{"a", "1"}, {"b", ""}, {"c", "3"}}),
              Items(NodeOf(Parse("<e a='1' b='' c='3'/>"), "/e")));
}

TEST_F(AttributeTest, OnlyTheFirstPieceOfAValueIsListed)
{
    const xmlNodePtr element =
        NodeOf(Parse("<!DOCTYPE e [<!ENTITY x 'xyz'>]><e a='one &x; two'/>"), "/e");
    EXPECT_EQ(Pairs({{"a", "one "}}), Items(element));
    std::string value;
    EXPECT_EQ(0, CXmlNode(element).GetAttributeValue("a", value));
    EXPECT_EQ("one xyz two", value);
}

TEST_F(AttributeTest, PieceWithoutBytesReadsEmpty)
{
    const xmlNodePtr element = NodeOf(Parse("<e a='1' b='2'/>"), "/e");
    const xmlAttrPtr attribute = element->properties->next;
    xmlFreeNodeList(attribute->children);
    attribute->children = attribute->last = xmlNewDocText(element->doc, nullptr);
    attribute->children->parent = reinterpret_cast<xmlNodePtr>(attribute);
    EXPECT_EQ(Pairs({{"a", "1"}, {"b", ""}}), Items(element));
}

TEST_F(AttributeTest, NothingIsListedWithoutAttributes)
{
    EXPECT_EQ(Pairs(), Items(m_last));
    EXPECT_EQ(Pairs(), Items(m_null));
    ExpectRecords(Traced("GetAttributeItems"), [&] { m_last.GetAttributeItems(); });
    ExpectRecords(Traced("GetAttributeItems"), [&] { m_null.GetAttributeItems(); });
}

TEST_F(AttributeTest, EachListedPairIsAppendedAsATemporary)
{
    const Records each = kAttribute + kAttributeGone;
    ExpectRecords(Traced("GetAttributeItems", each + each) + kAttributeGone + kAttributeGone,
                  [&] { m_net.GetAttributeItems(); });
}

// --- The two that do nothing

TEST_F(AttributeTest, RemoveAttributeAnswersSuccessAndDoesNothing)
{
    const std::string before = Text();
    EXPECT_EQ(0, m_net.RemoveAttribute("id"));
    EXPECT_EQ(0, m_null.RemoveAttribute(""));
    EXPECT_EQ(before, Text());
    const Records records = Traced(
        "RemoveAttribute",
        {Warning("RemoveAttribute", "RemoveAttribute feature is not available, Reason: This API is "
                                    "not supported by libxml2 present in QNX650")});
    ExpectRecords(records, [&] { m_net.RemoveAttribute("id"); });
    ExpectRecords(records, [&] { m_null.RemoveAttribute("id"); });
}

TEST_F(AttributeTest, SetAttributeValueAnswersSuccessAndDoesNothing)
{
    const std::string before = Text();
    EXPECT_EQ(0, m_net.SetAttributeValue("id", "x"));
    EXPECT_EQ(0, m_null.SetAttributeValue("", ""));
    EXPECT_EQ(before, Text());
    const Records records = Traced(
        "SetAttributeValue",
        {Warning("SetAttributeValue", "SetAttributeValue feature is not available, Reason: "
                                      "This API is not supported by libxml2 present in QNX650")});
    ExpectRecords(records, [&] { m_net.SetAttributeValue("id", "x"); });
    ExpectRecords(records, [&] { m_null.SetAttributeValue("id", "x"); });
}

TEST_F(AttributeTest, FirstPieceThatIsAReferenceShowsWhatItStandsFor)
{
    EXPECT_EQ(Pairs({{"a", "xyz"}}),
              Items(NodeOf(Parse("<!DOCTYPE e [<!ENTITY x 'xyz'>]><e a='&x; two'/>"), "/e")));
}
