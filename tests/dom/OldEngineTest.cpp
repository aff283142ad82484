// What the library does with engines before 2.9.10, whose own calls crash, do not return or answer
// differently. Any engine up to 2.9 serves: the test program answers the question for the version.

#include "CXMLWriter.h"
#include "DomTest.h"

#include <gmock/gmock.h>

#include <libxml/entities.h>

#include <algorithm>
#include <functional>

using namespace kxtest;

namespace
{

const char* const kOld = "20708";
const char* const kNew = "20914";

const char* const kEntities[] = {"plain", "nothing", "outer", "self", "one", "two", "open", "far"};
const char* const kXml = "<!DOCTYPE cfg [<!ENTITY plain 'text'><!ENTITY nothing ''>"
                         "<!ENTITY outer 'a&plain;b&#65;&lt;'><!ENTITY self 'a&self;b'>"
                         "<!ENTITY one 'a&two;'><!ENTITY two '&one;b'><!ENTITY open "
                         "'a&#38;plain'><!ENTITY far SYSTEM 'far.xml'>"
                         "]><cfg><a b=\"old\">old</a><c/><!--old--></cfg>";

const char* const kTexts[] = {
    "",       "text",        "&plain;",   "&nothing;",   "x&outer;y&outer;", "&open;", "&far;",
    "&self;", "&two;x&one;", "&unknown;", "&lt;&amp;",   "&#65;&#",          "a&b",    "&",
    "&;x",    "a&plain",     "&&self;",   "a&#x;&self;", "&self;&plain;b&c",
};

std::string Text(const xmlChar* text)
{
    return text != nullptr ? reinterpret_cast<const char*>(text) : "(none)";
}

std::string Describe(const xmlNode* node)
{
    const std::string content = node->type == XML_TEXT_NODE ? "=" + Text(node->content) : "";
    return Text(node->name) + content;
}

std::string DescribeAll(const xmlNode* first)
{
    std::string text;
    for (const xmlNode* node = first; node != nullptr; node = node->next)
    {
        text += Describe(node) + " ";
    }
    return text;
}

class OldEngineTest : public DomTest
{
protected:
    using Change = std::function<void(CXmlNode)>;

    void SetUp() override
    {
        if (EngineVersion() >= 21000)
        {
            GTEST_SKIP() << "these engines mark an entity that has children in their own way";
        }
    }

    /** @return the document and the children of its entities after @p change of the selected node.
     */
    static std::string After(const char* version, const char* xpath, const Change& change)
    {
        const PretendedVersion pretended(version);
        const EngineMemory memory;
        const xmlDocPtr document = ParseText(kXml);
        change(CXmlNode(NodeOf(document, xpath)));
        std::string seen = Serialized(document) + DescribeAll(NodeOf(document, "/cfg/a")->children);
        for (const char* const name : kEntities)
        {
            const auto entity = xmlGetDocEntity(document, reinterpret_cast<const xmlChar*>(name));
            seen += std::string("\n") + name + ": " + DescribeAll(entity->children);
        }
        xmlFreeDoc(document);
        TakeEngineErrors();
        EXPECT_EQ(0, memory.Live());
        return seen;
    }

    /** @return the most blocks that leak when one request fails while a child gets @p content. */
    static long MostLost(const char* version, const std::string& content)
    {
        const PretendedVersion pretended(version);
        long most = 0;
        FailInTurn(
            [&](std::size_t n)
            {
                const EngineMemory memory;
                const xmlDocPtr document = ParseText(kXml);
                CXmlNode node(NodeOf(document, "/cfg/c"));
                const bool failed =
                    Failing<EngineMemory>(n, [&] { node.AddChildNode("new", content); });
                Serialized(document);
                xmlFreeDoc(document);
                TakeEngineErrors();
                most = std::max(most, memory.Live());
                return failed;
            });
        return most;
    }

    /** Newer engines survive each of these texts; with an older one there is nothing to compare. */
    static void ExpectNoDifference(const char* xpath, const Change& change)
    {
        if (EngineVersion() >= 20910)
        {
            EXPECT_EQ(After(kNew, xpath, change), After(kOld, xpath, change));
        }
    }
};

} // namespace

TEST_F(OldEngineTest, EveryContentBecomesWhatNewerEnginesMakeOfIt)
{
    for (const std::string text : kTexts)
    {
        SCOPED_TRACE(text);
        const auto set = [&](CXmlNode node) { EXPECT_EQ(0, node.SetContent(text)); };
        ExpectNoDifference("/cfg/a", set);
        ExpectNoDifference("/cfg/a/@b", set);
        ExpectNoDifference("/cfg/comment()", set);
        ExpectNoDifference("/cfg/c", [&](CXmlNode node) { node.AddChildNode("new", text); });
        ExpectNoDifference("/cfg/c", [&](CXmlNode node) { node.AddSiblingNode("new", text); });
    }
}

TEST_F(OldEngineTest, EntityThatContainsItselfIsStored)
{
    const Change set = [](CXmlNode node) { EXPECT_EQ(0, node.SetContent("x&self;&one;")); };
    const std::string seen = After(kOld, "/cfg/a", set);
    EXPECT_THAT(seen, testing::HasSubstr("<a b=\"old\">x&self;&one;</a>"));
    EXPECT_THAT(seen, testing::HasSubstr("\nself: text=a self text=b "));
    EXPECT_THAT(seen, testing::HasSubstr("\none: text=a two \ntwo: one text=b "));
}

TEST_F(OldEngineTest, EmptyTextLeavesNoChild)
{
    const PretendedVersion pretended(kOld);
    const xmlDocPtr document = Parse("<cfg><a b=\"old\">old</a></cfg>");
    const xmlNodePtr element = NodeOf(document, "/cfg/a");
    EXPECT_EQ(0, CXmlNode(element).SetContent(""));
    EXPECT_EQ(nullptr, element->children);
    const xmlNodePtr attribute = NodeOf(document, "/cfg/a/@b");
    EXPECT_EQ(0, CXmlNode(attribute).SetContent(""));
    EXPECT_EQ(nullptr, attribute->children);
}

TEST_F(OldEngineTest, FragmentsHoldContentToo)
{
    const PretendedVersion pretended(kOld);
    const xmlNodePtr fragment = xmlNewDocFragment(m_document);
    EXPECT_EQ(0, CXmlNode(fragment).SetContent("text"));
    EXPECT_EQ("text=text ", DescribeAll(fragment->children));
    xmlFreeNode(fragment);
}

TEST_F(OldEngineTest, UpdateStoresAnEntityThatContainsItself)
{
    const PretendedVersion pretended(kOld);
    const xmlDocPtr document = Parse(kXml);
    CXMLWriter writer;
    writer.SetDataPtr(document);
    EXPECT_EQ(0, writer.SetValue("cfg.a", "&self;"));
    writer.SetDataPtr(nullptr);
    EXPECT_EQ("self ", DescribeAll(NodeOf(document, "/cfg/a")->children));
}

TEST_F(OldEngineTest, NothingMoreIsLostWhenMemoryRunsOut)
{
    EXPECT_EQ(0, MostLost(kOld, "text"));
    // The engine's own reading of references leaks, and with 2.9.1 writes to null.
    if (EngineVersion() >= 20910)
    {
        EXPECT_EQ(MostLost(kNew, "x&outer;"), MostLost(kOld, "x&outer;"));
    }
}
