// Attributes of type ID: the engine keeps a table of them, which must not outlive them.

#include "CXmlParser.h"
#include "DomTest.h"

#include <libxml/hash.h>

using namespace kxtest;

namespace
{

const char* const kDeclaredId =
    "<!DOCTYPE r [<!ENTITY e 'x'> <!ATTLIST b id ID #IMPLIED>]>"
    "<r><b id='kept'/><a><b id='plain'>one</b><c><d/><b id='i&e;'>two</b></c>"
    "<b id='after'>three</b></a></r>";
/** Failing this many requests in turn is more than any of the operations asks for. */
const std::size_t kRequests = 20;

int RemoveNode(xmlNodePtr node)
{
    return CXmlParser().RemoveNode(CXmlNode(node));
}

/** What changes the value of the first attribute of @p b, an element. */
const auto kValueChanges = {
    +[](xmlNodePtr b) { return CXmlNode(xmlNodePtr(b->properties)).SetContent("other"); },
    +[](xmlNodePtr b) { return CXmlNode(xmlNodePtr(b->properties)).SetContent(""); },
    +[](xmlNodePtr b) { return CXmlNode(xmlNodePtr(b->properties)).ClearNode(); },
    +[](xmlNodePtr b) { return CXmlNode(b->properties->children).SetContent("other"); },
    +[](xmlNodePtr b) { return RemoveNode(b->properties->children); }};

class IdTest : public DomTest
{
protected:
    static std::size_t Ids(xmlDocPtr document) { return IdsOf(document).size(); }

    static xmlNodePtr AttributeOf(xmlNodePtr element)
    {
        return reinterpret_cast<xmlNodePtr>(element->properties);
    }

    /** @return how many attributes of @p element and of the elements below it are IDs. */
    static std::size_t IdsIn(xmlNodePtr element)
    {
        if (element->type != XML_ELEMENT_NODE)
        {
            return 0;
        }
        const xmlAttrPtr attribute = element->properties;
        std::size_t count = attribute != nullptr && attribute->atype == XML_ATTRIBUTE_ID ? 1 : 0;
        for (xmlNodePtr child = element->children; child != nullptr; child = child->next)
        {
            count += IdsIn(child);
        }
        return count;
    }

    /**
     * Expects that @p change, given the element @p xpath, answers 0 and leaves @p left IDs of that
     * element and below, with memory to spare and with any of the engine's requests failing. The
     * engine decides which are IDs: newer ones leave out the value with a reference.
     */
    void ExpectIds(const std::string& xpath, int (*change)(xmlNodePtr),
                   const std::function<std::size_t(xmlNodePtr)>& left)
    {
        for (std::size_t failing = 0; failing <= kRequests; ++failing)
        {
            SCOPED_TRACE(xpath + ", request " + std::to_string(failing) + " fails");
            const xmlDocPtr document = Parse(kDeclaredId);
            const xmlNodePtr element = NodeOf(document, xpath);
            const std::size_t expected = Ids(document) - IdsIn(element) + left(element);
            EngineMemory::FailAt(failing);
            const int status = change(element);
            const bool failed = EngineMemory::Failed();
            EngineMemory::FailAt(0);
            EXPECT_EQ(0, status);
            // Short of memory, newer engines leave content as it was, with the IDs in it.
            EXPECT_TRUE(Ids(document) == expected || (failed && Ids(document) > expected));
            EXPECT_NE(nullptr, NodeOf(document, "id('kept')"));
            ExpectSoundIds(document);
        }
    }

    void ExpectIdsForgotten(const std::string& xpath, int (*change)(xmlNodePtr))
    {
        ExpectIds(xpath, change, [](xmlNodePtr) { return 0; });
    }

    /** Gives the attribute @p xpath another value, as a client may do by the engine's own call. */
    static void Change(xmlDocPtr document, const char* xpath)
    {
        xmlNodeSetContent(NodeOf(document, xpath), reinterpret_cast<const xmlChar*>("changed"));
    }

    /** Sets the attribute "id" of @p element by the engine's own call, which enters the value. */
    static void SetId(xmlNodePtr element, const char* value)
    {
        xmlSetProp(element, reinterpret_cast<const xmlChar*>("id"),
                   reinterpret_cast<const xmlChar*>(value));
    }

    using Call = std::function<void(xmlDocPtr)>;

    /** @return a call that does @p operation to the first node that @p xpath selects, if any. */
    static Call OnFirst(const char* xpath, const std::function<void(xmlNodePtr)>& operation)
    {
        return [=](xmlDocPtr document)
        {
            const xmlNodePtr node = NodeOf(document, xpath);
            if (node != nullptr)
            {
                operation(node);
            }
        };
    }

    /**
     * Makes every series of three of @p calls on a new document each, then clears its root: the
     * IDs stay sound.
     */
    static void ExpectSoundIdsInAnyOrder(const std::string& xml, const std::vector<Call>& calls)
    {
        const Call clear = OnFirst("/*", [](xmlNodePtr root) { CXmlNode(root).ClearNode(); });
        const std::size_t count = calls.size();
        for (std::size_t i = 0; i != count * count * count; ++i)
        {
            const xmlDocPtr document = ParseText(xml);
            for (const Call& call :
                 {calls[i % count], calls[i / count % count], calls[i / count / count], clear})
            {
                call(document);
                ExpectSoundIds(document);
            }
            xmlFreeDoc(document);
        }
    }
};

} // namespace

TEST_F(IdTest, EngineKnowsTheIdsThatTheSuiteIsAbout)
{
    const xmlDocPtr document = Parse(kDeclaredId);
    EXPECT_EQ(1u, IdsIn(NodeOf(document, "//b[. = 'one']")));
    EXPECT_LE(2u, IdsIn(NodeOf(document, "/r/a")));
    EXPECT_EQ(1 + IdsIn(NodeOf(document, "/r/a")), Ids(document));
}

TEST_F(IdTest, ChangeOfTheValueLeavesTheTableAlone)
{
    for (const auto& change : kValueChanges)
    {
        ExpectIds("//b[. = 'one']", change, IdsIn);
        ExpectIds("//b[. = 'two']", change, IdsIn);
    }
}

TEST_F(IdTest, ChangedAttributeIsFoundUnderItsOldValueUntilItIsFreed)
{
    for (const auto& change : kValueChanges)
    {
        const xmlDocPtr document = Parse(kDeclaredId);
        const xmlNodePtr b = NodeOf(document, "//b[. = 'one']");
        EXPECT_EQ(0, change(b));
        EXPECT_EQ(b, NodeOf(document, "id('plain')"));
        EXPECT_EQ(nullptr, NodeOf(document, "id('other')"));
        EXPECT_EQ(0, RemoveNode(AttributeOf(b)));
        EXPECT_EQ(nullptr, NodeOf(document, "id('plain')"));
        ExpectSoundIds(document);
    }
}

TEST_F(IdTest, AttributeThatIsFreedIsForgottenFirst)
{
    const auto changes = {+[](xmlNodePtr b) { return RemoveNode(AttributeOf(b)); },
                          +[](xmlNodePtr b) { return RemoveNode(b); },
                          +[](xmlNodePtr b) { return CXmlNode(b).ClearNode(); }};
    for (const auto& change : changes)
    {
        ExpectIdsForgotten("//b[. = 'one']", change);
        ExpectIdsForgotten("//b[. = 'two']", change);
    }
}

TEST_F(IdTest, AttributesFarBelowAreForgottenToo)
{
    const auto changes = {+[](xmlNodePtr a) { return RemoveNode(a); },
                          +[](xmlNodePtr a) { return CXmlNode(a).ClearNode(); },
                          +[](xmlNodePtr a) { return CXmlNode(a).SetContent("text"); },
                          +[](xmlNodePtr a) { return CXmlNode(a->parent).RemoveChildNode("a"); }};
    for (const auto& change : changes)
    {
        ExpectIdsForgotten("/r/a", change);
    }
}

TEST_F(IdTest, AttributeOfAnElementThatHangsBelowAnAttributeIsForgottenToo)
{
    const auto changes = {+[](xmlNodePtr a) { return RemoveNode(a); },
                          +[](xmlNodePtr a) { return CXmlNode(a).ClearNode(); },
                          +[](xmlNodePtr a) { return CXmlNode(a->parent).SetContent("text"); },
                          +[](xmlNodePtr a) { return RemoveNode(AttributeOf(a)); },
                          +[](xmlNodePtr a) { return CXmlNode(AttributeOf(a)).ClearNode(); },
                          +[](xmlNodePtr a) { return CXmlNode(AttributeOf(a)).SetContent("text"); },
                          +[](xmlNodePtr a) { return RemoveNode(a->properties->last); }};
    for (const auto& change : changes)
    {
        const xmlDocPtr document = Parse("<!DOCTYPE r [<!ATTLIST b id ID #IMPLIED>]>"
                                         "<r><b id='kept'/><c><a p='v' q='w'><d/></a></c></r>");
        const xmlNodePtr a = NodeOf(document, "//a");
        CXmlNode hung = CXmlNode(AttributeOf(a)).AddChildNode("b", "");
        EXPECT_EQ(0, hung.AddNewAttribute("id", "old"));
        EXPECT_EQ(0, hung.AddChildNode("b", "").AddNewAttribute("id", "deeper"));
        ASSERT_EQ(3u, Ids(document));
        const xmlNodePtr b = a->properties->last;
        xmlNodeSetContent(AttributeOf(b), reinterpret_cast<const xmlChar*>("changed"));
        SetId(b, "twice");
        EXPECT_EQ(0, change(a));
        EXPECT_EQ(1u, Ids(document));
        EXPECT_EQ(nullptr, NodeOf(document, "id('old') | id('deeper') | id('twice')"));
        EXPECT_NE(nullptr, NodeOf(document, "id('kept')"));
    }
}

TEST_F(IdTest, AllAreForgottenBeforeADocumentIsCleared)
{
    // The DTD goes first, and the value refers to an entity in it.
    const xmlDocPtr document =
        Parse("<!DOCTYPE a [<!ENTITY e 'a longer text'><!ATTLIST a id ID #IMPLIED>]>"
              "<a id='i&e;'>&e;</a>");
    CXmlNode handle(reinterpret_cast<xmlNodePtr>(document));
    EXPECT_EQ(0, handle.ClearNode());
    EXPECT_EQ(0u, Ids(document));
    EXPECT_EQ(nullptr, document->intSubset);
    EXPECT_EQ(nullptr, NodeOf(document, "id('ia longer text')"));
    EXPECT_EQ(0, handle.ClearNode());
}

TEST_F(IdTest, AllAreForgottenBeforeADtdIsRemoved)
{
    const xmlDocPtr document = Parse("<!DOCTYPE r [<!ATTLIST b id ID #IMPLIED>]>"
                                     "<r><b id='i'/><b xml:id='j'/></r>");
    ASSERT_EQ(2u, Ids(document));
    EXPECT_EQ(0, RemoveNode(reinterpret_cast<xmlNodePtr>(document->intSubset)));
    EXPECT_EQ(nullptr, document->intSubset);
    EXPECT_EQ(0u, Ids(document));
    EXPECT_EQ(nullptr, NodeOf(document, "id('i') | id('j')"));
    EXPECT_EQ(0, CXmlNode(NodeOf(document, "//b")).ClearNode());
    EXPECT_EQ("<r><b/><b xml:id=\"j\"/></r>", TextOf(document->children));
}

TEST_F(IdTest, DtdWithoutADocumentIsRemoved)
{
    const auto name = reinterpret_cast<const xmlChar*>("r");
    EXPECT_EQ(0, RemoveNode(reinterpret_cast<xmlNodePtr>(xmlNewDtd(nullptr, name, name, name))));
}

TEST_F(IdTest, NoOrderOfCallsLeavesAFreedAttributeInTheTable)
{
    const auto clear = [](xmlNodePtr node) { CXmlNode(node).ClearNode(); };
    const auto set = [](xmlNodePtr node) { CXmlNode(node).SetContent("plain"); };
    const auto hang = [](xmlNodePtr node)
    { CXmlNode(node).AddChildNode("b", "").AddNewAttribute("id", "hung"); };
    const std::vector<Call> calls = {
        OnFirst("//b[. = 'one']/@id", set),
        OnFirst("//b[. = 'two']/@id", set),
        OnFirst("//b[. = 'two']/@id", hang),
        OnFirst("//b[. = 'two']", RemoveNode),
        OnFirst("//b[. = 'two']", clear),
        OnFirst("/r/a", clear),
        OnFirst("/r/a", hang),
        OnFirst("/r", clear),
        OnFirst("/", clear),
        [](xmlDocPtr document) { RemoveNode(reinterpret_cast<xmlNodePtr>(document->intSubset)); },
        [](xmlDocPtr document) { Change(document, "(//b)[last()]/@id"); }};
    // Without an entity the DTD can be removed.
    for (const char* const xml :
         {kDeclaredId, "<!DOCTYPE r [<!ATTLIST b id ID #IMPLIED>]><r><b id='kept'/>"
                       "<a><b id='plain'>one</b><b id='i'>two</b></a></r>"})
    {
        ExpectSoundIdsInAnyOrder(xml, calls);
    }
}

TEST_F(IdTest, AttributeThatIsInTheTableTwiceIsForgottenUnderBothValues)
{
    // Up to 2.12 the engine does not find the value that it replaces, and leaves it in the table.
    const auto frees = {+[](xmlNodePtr b) { return RemoveNode(AttributeOf(b)); },
                        +[](xmlNodePtr b) { return RemoveNode(b); },
                        +[](xmlNodePtr b) { return RemoveNode(b->parent); },
                        +[](xmlNodePtr b) { return CXmlNode(b).ClearNode(); },
                        +[](xmlNodePtr b) { return CXmlNode(b->parent).ClearNode(); },
                        +[](xmlNodePtr b) { return CXmlNode(b->parent).SetContent("text"); },
                        +[](xmlNodePtr b) { return CXmlNode(b->parent).RemoveChildNode("b"); }};
    for (const auto& change : kValueChanges)
    {
        for (const auto& free : frees)
        {
            for (std::size_t failing = 0; failing <= kRequests; ++failing)
            {
                const xmlDocPtr document = Parse(kDeclaredId);
                const xmlNodePtr b = NodeOf(document, "//b[. = 'one']");
                EXPECT_EQ(0, change(b));
                SetId(b, "second");
                EXPECT_EQ(0, change(b));
                SetId(b, "third");
                EngineMemory::FailAt(failing);
                EXPECT_EQ(0, free(b));
                const bool failed = EngineMemory::Failed();
                EngineMemory::FailAt(0);
                ExpectSoundIds(document);
                EXPECT_NE(nullptr, NodeOf(document, "id('kept')"));
                if (!failed)
                {
                    EXPECT_EQ(nullptr,
                              NodeOf(document, "id('plain') | id('second') | id('third')"));
                }
            }
        }
    }
}

TEST_F(IdTest, NoOrderOfTheEnginesOwnChangesLeavesAFreedAttributeInTheTable)
{
    const auto setBare = [](const char* value)
    { return [value](xmlNodePtr node) { SetId(node, value); }; };
    const auto copy = [](xmlNodePtr node)
    { xmlAddChild(xmlDocGetRootElement(node->doc), xmlDocCopyNode(node, node->doc, 1)); };
    const std::vector<Call> calls = {
        OnFirst("//b/@id", [](xmlNodePtr id) { CXmlNode(id).SetContent("other"); }),
        OnFirst("(//b)[last()]/@id", [](xmlNodePtr id) { CXmlNode(id).ClearNode(); }),
        OnFirst("//b", setBare("other")),
        OnFirst("//b", setBare("third")),
        OnFirst("(//b)[last()]", setBare("third")),
        OnFirst("//b/@id", [](xmlNodePtr id)
                { CXmlNode(id).AddChildNode("b", "").AddNewAttribute("id", "hung"); }),
        OnFirst("//b", copy),
        OnFirst("//b/@id", RemoveNode),
        OnFirst("//b", RemoveNode)};
    ExpectSoundIdsInAnyOrder("<!DOCTYPE r [<!ATTLIST b id ID #IMPLIED>]>"
                             "<r><b id='first'/><b id='last'/></r>",
                             calls);
}

TEST_F(IdTest, RemovalOfManyLeavesTheIdsOfAllOthers)
{
    // Enough for several entries in a row of the engine's table.
    const std::size_t count = 100;
    std::string xml = "<!DOCTYPE r [<!ATTLIST b id ID #IMPLIED>]><r>";
    for (std::size_t i = 0; i != count; ++i)
    {
        const std::string number = std::to_string(i);
        xml.append("<b id='i").append(number).append("'/>");
        xml.append("<a><b id='j").append(number).append("'/></a>");
    }
    const xmlDocPtr document = Parse(xml + "</r>");
    CXmlNode root(xmlDocGetRootElement(document));
    ASSERT_EQ(2 * count, Ids(document));
    for (std::size_t left = count; left != 0; --left)
    {
        EXPECT_EQ(0, CXmlNode(NodeOf(document, "/r/a/b/@id")).SetContent("changed"));
        EXPECT_EQ(0, root.RemoveChildNode("a"));
        EXPECT_EQ(count + left - 1, Ids(document));
    }
    ExpectSoundIds(document);
}

TEST_F(IdTest, AttributeThatAClientFreedIsNotRead)
{
    // Up to 2.12 the engine's own call leaves the former value in the table.
    const xmlDocPtr document = Parse(kDeclaredId);
    EXPECT_EQ(0, CXmlNode(NodeOf(document, "//b/@id")).SetContent("other"));
    EXPECT_EQ(0, xmlRemoveProp(NodeOf(document, "//b")->properties));
    EXPECT_EQ(0, CXmlNode(NodeOf(document, "/r/a")).ClearNode());
    EXPECT_EQ(nullptr, NodeOf(document, "id('plain')"));
}

TEST_F(IdTest, EntryWithoutAnAttributeStays)
{
    // A reader that validates frees the attributes on its way, and keeps the values.
    const xmlDocPtr document = Parse(kDeclaredId);
    const auto kept = reinterpret_cast<const xmlChar*>("kept");
    static_cast<xmlIDPtr>(xmlHashLookup(static_cast<xmlHashTablePtr>(document->ids), kept))->attr =
        nullptr;
    EXPECT_EQ(0, RemoveNode(NodeOf(document, "id('plain')")));
    EXPECT_NE(nullptr, xmlHashLookup(static_cast<xmlHashTablePtr>(document->ids), kept));
}

TEST_F(IdTest, ValueWithBlanksToStripIsForgottenToo)
{
    const xmlDocPtr document = Parse("<!DOCTYPE r [<!ATTLIST b id ID #IMPLIED>]><r><b/></r>");
    CXmlNode b(NodeOf(document, "//b"));
    EXPECT_EQ(0, b.AddNewAttribute("id", " i  2 "));
    ASSERT_EQ(1u, Ids(document));
    EXPECT_EQ(0, b.ClearNode());
    EXPECT_EQ(0u, Ids(document));
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
            EXPECT_EQ(0u, Ids(document)) << "request " << failing;
        }
        made = !failed;
    }
}

TEST_F(IdTest, ValueCanBeGivenToAnotherOnceItIsForgotten)
{
    const xmlDocPtr document = Parse(kDeclaredId);
    EXPECT_EQ(0, RemoveNode(NodeOf(document, "id('plain')")));
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
    const xmlDocPtr document = Parse(kDeclaredId);
    EXPECT_EQ(0, CXmlNode(NodeOf(document, "//b[. = 'one']")).SetContent("new"));
    EXPECT_NE(nullptr, NodeOf(document, "id('plain')"));
}

TEST_F(IdTest, AttributesOfAnXIncludeMarkAreForgottenToo)
{
    // The mark is the element that it replaces, with all its fields.
    const xmlDocPtr document = Parse(kDeclaredId);
    const xmlNodePtr mark = NodeOf(document, "id('plain')");
    mark->type = XML_XINCLUDE_START;
    EXPECT_EQ(0, CXmlNode(AttributeOf(mark)).SetContent("other"));
    EXPECT_EQ(1u, CXmlNode(mark).GetAttributeItems().size());
    EXPECT_EQ(0, RemoveNode(mark->parent));
    ExpectSoundIds(document);
    EXPECT_EQ(nullptr, xmlGetID(document, reinterpret_cast<const xmlChar*>("plain")));
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
