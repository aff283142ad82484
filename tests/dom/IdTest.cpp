// Attributes of type ID: the engine keeps a table of them, which must not outlive them.

#include "CXmlParser.h"
#include "DomTest.h"

#include <libxml/hash.h>

using namespace kxtest;

namespace
{

const char* const kXml = "<!DOCTYPE r [<!ENTITY e 'x'> <!ATTLIST b id ID #IMPLIED>]>"
                         "<r><b id='kept'/><a><b id='plain'>one</b><c><d/><b id='i&e;'>two</b></c>"
                         "<b id='after'>three</b></a></r>";
/** Failing this many requests in turn is more than any of the operations asks for. */
const std::size_t kRequests = 20;

class IdTest : public DomTest
{
protected:
    static int Ids(xmlDocPtr document)
    {
        return xmlHashSize(static_cast<xmlHashTablePtr>(document->ids));
    }

    static xmlNodePtr AttributeOf(xmlNodePtr element)
    {
        return reinterpret_cast<xmlNodePtr>(element->properties);
    }

    /** @return how many attributes of @p element and of the elements below it are IDs. */
    static int IdsIn(xmlNodePtr element)
    {
        if (element->type != XML_ELEMENT_NODE)
        {
            return 0;
        }
        const xmlAttrPtr attribute = element->properties;
        int count = attribute != nullptr && attribute->atype == XML_ATTRIBUTE_ID ? 1 : 0;
        for (xmlNodePtr child = element->children; child != nullptr; child = child->next)
        {
            count += IdsIn(child);
        }
        return count;
    }

    /**
     * Expects that @p change, given the element @p xpath, answers 0 and that the IDs of that
     * element and below are none any more, with memory to spare and with any of the engine's
     * requests failing. The engine tells which are IDs: newer ones leave out the value with a
     * reference.
     */
    void ExpectIdsForgotten(const std::string& xpath, int (*change)(xmlNodePtr))
    {
        for (std::size_t failing = 0; failing <= kRequests; ++failing)
        {
            SCOPED_TRACE(xpath + ", request " + std::to_string(failing) + " fails");
            const xmlDocPtr document = Parse(kXml);
            const xmlNodePtr element = NodeOf(document, xpath);
            const int left = Ids(document) - IdsIn(element);
            EngineMemory::FailAt(failing);
            const int status = change(element);
            EngineMemory::FailAt(0);
            EXPECT_EQ(0, status);
            EXPECT_EQ(left, Ids(document));
            EXPECT_NE(nullptr, NodeOf(document, "id('kept')"));
        }
    }
};

} // namespace

TEST_F(IdTest, EngineKnowsTheIdsThatTheSuiteIsAbout)
{
    const xmlDocPtr document = Parse(kXml);
    EXPECT_EQ(1, IdsIn(NodeOf(document, "//b[. = 'one']")));
    EXPECT_LE(2, IdsIn(NodeOf(document, "/r/a")));
    EXPECT_EQ(1 + IdsIn(NodeOf(document, "/r/a")), Ids(document));
}

TEST_F(IdTest, AttributeWhoseValueIsChangedIsNoIdAnyMore)
{
    const auto changes = {
        +[](xmlNodePtr b) { return CXmlNode(AttributeOf(b)).SetContent("other"); },
        +[](xmlNodePtr b) { return CXmlNode(AttributeOf(b)).ClearNode(); },
        +[](xmlNodePtr b) { return CXmlNode(AttributeOf(b)->children).SetContent("other"); },
        +[](xmlNodePtr b) { return CXmlParser().RemoveNode(CXmlNode(AttributeOf(b)->children)); }};
    for (const auto& change : changes)
    {
        ExpectIdsForgotten("//b[. = 'one']", change);
        ExpectIdsForgotten("//b[. = 'two']", change);
    }
}

TEST_F(IdTest, AttributeThatIsFreedIsForgottenFirst)
{
    const auto changes = {+[](xmlNodePtr b)
                          { return CXmlParser().RemoveNode(CXmlNode(AttributeOf(b))); },
                          +[](xmlNodePtr b) { return CXmlParser().RemoveNode(CXmlNode(b)); },
                          +[](xmlNodePtr b) { return CXmlNode(b).ClearNode(); }};
    for (const auto& change : changes)
    {
        ExpectIdsForgotten("//b[. = 'one']", change);
        ExpectIdsForgotten("//b[. = 'two']", change);
    }
}

TEST_F(IdTest, AttributesFarBelowAreForgottenToo)
{
    const auto changes = {+[](xmlNodePtr a) { return CXmlParser().RemoveNode(CXmlNode(a)); },
                          +[](xmlNodePtr a) { return CXmlNode(a).ClearNode(); },
                          +[](xmlNodePtr a) { return CXmlNode(a).SetContent("text"); },
                          +[](xmlNodePtr a) { return CXmlNode(a->parent).RemoveChildNode("a"); }};
    for (const auto& change : changes)
    {
        ExpectIdsForgotten("/r/a", change);
    }
}

TEST_F(IdTest, ValueWithBlanksToStripIsForgottenToo)
{
    const xmlDocPtr document = Parse("<!DOCTYPE r [<!ATTLIST b id ID #IMPLIED>]><r><b/></r>");
    CXmlNode b(NodeOf(document, "//b"));
    EXPECT_EQ(0, b.AddNewAttribute("id", " i  2 "));
    ASSERT_EQ(1, Ids(document));
    EXPECT_EQ(0, b.ClearNode());
    EXPECT_EQ(0, Ids(document));
}

TEST_F(IdTest, AttributeThatCouldNotBeMadeWholeIsForgotten)
{
    bool made = false;
    for (std::size_t failing = 1; !made; ++failing)
    {
        const xmlDocPtr document = Parse("<!DOCTYPE r [<!ATTLIST b id ID #IMPLIED>]><r><b/></r>");
        CXmlNode b(NodeOf(document, "//b"));
        EngineMemory::FailAt(failing);
        const int status = b.AddNewAttribute("id", "a rather long value of it");
        const bool failed = EngineMemory::Failed();
        EngineMemory::FailAt(0);
        EXPECT_TRUE(status == 0 || (failed && status == 22)) << status;
        if (status == 22)
        {
            EXPECT_TRUE(document->ids == nullptr || Ids(document) == 0) << "request " << failing;
        }
        made = !failed;
    }
}

TEST_F(IdTest, ValueCanBeGivenToAnotherOnceItIsForgotten)
{
    const xmlDocPtr document = Parse(kXml);
    EXPECT_EQ(0, CXmlParser().RemoveNode(CXmlNode(NodeOf(document, "id('plain')"))));
    CXmlNode added = CXmlNode(NodeOf(document, "/r/a")).AddChildNode("b", "");
    EXPECT_EQ(0, added.AddNewAttribute("id", "plain"));
    EXPECT_EQ(NodeOf(document, "/r/a/b[last()]"), NodeOf(document, "id('plain')"));
}

TEST_F(IdTest, OtherAttributesWithTheValueOfAnIdLeaveItAlone)
{
    const xmlDocPtr document = Parse("<!DOCTYPE r [<!ATTLIST b id ID #IMPLIED>]>"
                                     "<r><b id='i'/><c q='v'/></r>");
    CXmlNode q(NodeOf(document, "//@q"));
    EXPECT_EQ(0, q.SetContent("i"));
    EXPECT_EQ(0, q.ClearNode());
    EXPECT_EQ(0, CXmlNode(NodeOf(document, "//c")).ClearNode());
    EXPECT_NE(nullptr, NodeOf(document, "id('i')"));
}

TEST_F(IdTest, ElementWhoseContentIsReplacedKeepsItsId)
{
    const xmlDocPtr document = Parse(kXml);
    EXPECT_EQ(0, CXmlNode(NodeOf(document, "//b[. = 'one']")).SetContent("new"));
    EXPECT_NE(nullptr, NodeOf(document, "id('plain')"));
}

TEST_F(IdTest, NodesWithoutADocumentHaveNone)
{
    const auto name = reinterpret_cast<const xmlChar*>("b");
    const xmlNodePtr element = xmlNewNode(nullptr, name);
    xmlNewChild(element, nullptr, name, nullptr);
    xmlNewProp(element, reinterpret_cast<const xmlChar*>("id"), name);
    ASSERT_EQ(nullptr, element->doc);
    CXmlNode handle(element);
    EXPECT_EQ(0, handle.ClearNode());
    EXPECT_EQ(nullptr, element->children);
    EXPECT_EQ(nullptr, element->properties);
    EXPECT_EQ(0, CXmlParser().RemoveNode(handle));
}
