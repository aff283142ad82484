// Conditions on attributes of every shape: reader and writer answer as xmlGetProp() does.

#include "CXMLReader.h"
#include "CXMLWriter.h"

#include "support/Engine.h"
#include "support/Memory.h"

#include <gtest/gtest.h>

#include <functional>
#include <optional>

using namespace kxtest;

namespace
{

const xmlChar* Text(const std::string& text)
{
    return reinterpret_cast<const xmlChar*>(text.c_str());
}

/** A document with an element "e" below its root, which holds "v". */
class AttributeTest : public testing::Test
{
protected:
    explicit AttributeTest(const std::string& xml = "<cfg><e>v</e></cfg>") { Load(xml); }
    ~AttributeTest() override { xmlFreeDoc(m_document); }

    void Load(const std::string& xml)
    {
        xmlFreeDoc(m_document);
        m_document = ParseText(xml);
        ASSERT_NE(nullptr, m_document) << xml;
        m_element = xmlDocGetRootElement(m_document)->children;
    }

    void LoadElement(const std::string& attributes, const std::string& head = "")
    {
        Load(head + "<cfg><e " + attributes + ">v</e></cfg>");
    }

    xmlAttrPtr Add(const std::string& name) const
    {
        return xmlNewProp(m_element, Text(name), nullptr);
    }

    static void AddChild(xmlAttrPtr attribute, xmlNodePtr child)
    {
        child->parent = reinterpret_cast<xmlNodePtr>(attribute);
        child->prev = attribute->last;
        (attribute->last != nullptr ? attribute->last->next : attribute->children) = child;
        attribute->last = child;
    }

    void AddText(xmlAttrPtr attribute, const std::string& text) const
    {
        AddChild(attribute, xmlNewDocText(m_document, Text(text)));
    }

    std::optional<std::string> EngineValue(const std::string& name) const
    {
        xmlChar* const value = xmlGetProp(m_element, Text(name));
        if (value == nullptr)
        {
            return std::nullopt;
        }
        const std::string text = reinterpret_cast<const char*>(value);
        xmlFree(value);
        return text;
    }

    bool ReaderAccepts(const std::string& condition) const
    {
        unsigned found = 0;
        std::string value;
        CXMLReader().XMLGetValue(m_element->parent, "e@" + condition, value, found);
        EXPECT_EQ(found != 0 ? "v" : "", value) << condition;
        return found != 0;
    }

    bool WriterAccepts(const std::string& condition) const
    {
        unsigned updated = 0;
        std::string value = "v";
        CXMLWriter().XMLSetValue(m_element->parent, "e@" + condition, value, updated);
        return updated != 0;
    }

    /** Expects that a condition on @p name holds for the engine's value and for no other one. */
    void ExpectAsTheEngine(const std::string& name) const
    {
        const std::optional<std::string> engines = EngineValue(name);
        std::vector<std::string> values = {"", "1", "12", "mid", "x", "1mid2", "default", "<"};
        values.push_back(engines.value_or("") + "x");
        values.push_back(engines.value_or("x").substr(0, engines.value_or("x").size() / 2));
        values.push_back(engines.value_or(""));
        for (const std::string& value : values)
        {
            const std::string condition = name + '=' + value;
            EXPECT_EQ(engines == value, ReaderAccepts(condition)) << condition;
            EXPECT_EQ(engines == value, WriterAccepts(condition)) << condition;
        }
    }

    void ExpectValue(const std::optional<std::string>& value, const std::string& name = "a") const
    {
        EXPECT_EQ(value, EngineValue(name));
        ExpectAsTheEngine(name);
    }

    xmlDocPtr m_document = nullptr;
    xmlNodePtr m_element = nullptr;
};

const char* const kEntity = "<!DOCTYPE cfg [<!ENTITY e 'mid'>]>";
const char* const kDefault = "<!DOCTYPE cfg [<!ATTLIST e a CDATA 'default'>]>";

} // namespace

// --- As the parser makes them

TEST_F(AttributeTest, OneText)
{
    LoadElement("a='1'");
    ExpectValue("1");
    LoadElement("a='&lt;&#120;'");
    ExpectValue("<x");
}

TEST_F(AttributeTest, EmptyText)
{
    LoadElement("a=''");
    ExpectValue("");
}

TEST_F(AttributeTest, EntityReference)
{
    LoadElement("a='&e;'", kEntity);
    ExpectValue("mid");
}

TEST_F(AttributeTest, TextAndEntityReference)
{
    LoadElement("a='1&e;2'", kEntity);
    ExpectValue("1mid2");
}

TEST_F(AttributeTest, Absent)
{
    LoadElement("b='1'");
    ExpectValue(std::nullopt);
    LoadElement("b='1'", kEntity);
    ExpectValue(std::nullopt);
}

TEST_F(AttributeTest, AnyPrefix)
{
    LoadElement("xmlns:p='urn:p' p:a='1'");
    ExpectValue("1");
    ExpectAsTheEngine("p:a");
}

TEST_F(AttributeTest, FirstOfTwoOfOneName)
{
    LoadElement("xmlns:p='urn:p' p:a='1' a='12'");
    ExpectValue("1");
    LoadElement("xmlns:p='urn:p' a='12' p:a='1'");
    ExpectValue("12");
}

TEST_F(AttributeTest, NameIsComparedWhole)
{
    LoadElement("ab='1' abc='12'");
    ExpectValue(std::nullopt, "a");
    ExpectValue("1", "ab");
    ExpectValue("12", "abc");
    ExpectValue(std::nullopt, "abcd");
}

TEST_F(AttributeTest, DefaultOfTheInternalSubset)
{
    LoadElement("", kDefault);
    ExpectValue("default");
    LoadElement("a='1'", kDefault);
    ExpectValue("1");
}

TEST_F(AttributeTest, DefaultForANameOfAnyLength)
{
    for (const std::size_t length : {1u, 62u, 63u, 64u, 65u, 1000u})
    {
        const std::string name(length, 'n');
        LoadElement("", "<!DOCTYPE cfg [<!ATTLIST e " + name + " CDATA 'default'>]>");
        ExpectValue("default", name);
        ExpectValue(std::nullopt, name + "n");
    }
}

TEST_F(AttributeTest, DefaultOfAnotherElement)
{
    LoadElement("", "<!DOCTYPE cfg [<!ATTLIST f a CDATA 'default'>]>");
    ExpectValue(std::nullopt);
}

TEST_F(AttributeTest, DeclaredWithoutADefault)
{
    LoadElement("", "<!DOCTYPE cfg [<!ATTLIST e a CDATA #IMPLIED>]>");
    ExpectValue(std::nullopt);
}

// --- As a client can make them

TEST_F(AttributeTest, DefaultOfTheExternalSubset)
{
    for (const bool hasInternal : {true, false})
    {
        LoadElement("", hasInternal ? "<!DOCTYPE cfg>" : "");
        const xmlDtdPtr external = xmlNewDtd(nullptr, Text("cfg"), nullptr, nullptr);
        xmlAddAttributeDecl(nullptr, external, Text("e"), Text("a"), nullptr, XML_ATTRIBUTE_CDATA,
                            XML_ATTRIBUTE_NONE, Text("default"), nullptr);
        m_document->extSubset = external;
        external->doc = m_document;
        ExpectAsTheEngine("a"); // without an internal subset, the engine decides
        if (hasInternal)
        {
            ExpectValue("default");
        }
    }
}

TEST_F(AttributeTest, ElementWithoutADocument)
{
    LoadElement("", kDefault);
    xmlNodePtr const root = xmlNewNode(nullptr, Text("cfg"));
    m_element = xmlNewChild(root, nullptr, Text("e"), Text("v"));
    ExpectValue(std::nullopt);
    xmlNewProp(m_element, Text("a"), Text("1"));
    ExpectValue("1");
    xmlFreeNode(root);
}

TEST_F(AttributeTest, NoChild)
{
    ASSERT_EQ(nullptr, Add("a")->children);
    ExpectValue("");
}

TEST_F(AttributeTest, TextWithoutContent)
{
    const xmlAttrPtr attribute = Add("a");
    AddChild(attribute, xmlNewDocText(m_document, nullptr));
    ASSERT_EQ(nullptr, attribute->children->content);
    ExpectAsTheEngine("a");
}

TEST_F(AttributeTest, SeveralTexts)
{
    const xmlAttrPtr attribute = Add("a");
    AddText(attribute, "1");
    AddText(attribute, "2");
    ExpectValue("12");
}

TEST_F(AttributeTest, CDataSection)
{
    const xmlAttrPtr attribute = Add("a");
    AddChild(attribute, xmlNewCDataBlock(m_document, Text("1"), 1));
    ExpectValue("1");
    AddText(attribute, "2");
    ExpectAsTheEngine("a");
}

TEST_F(AttributeTest, ReferenceToAnUndeclaredEntity)
{
    const xmlAttrPtr attribute = Add("a");
    AddChild(attribute, xmlNewReference(m_document, Text("nowhere")));
    ExpectAsTheEngine("a");
}

TEST_F(AttributeTest, FirstOfTwoCountsWhateverItHolds)
{
    const xmlAttrPtr first = Add("a");
    const xmlAttrPtr second = Add("b");
    AddText(second, "1");
    ASSERT_TRUE(xmlDictOwns(m_document->dict, first->name)); // so that neither frees the name
    second->name = first->name;
    ExpectValue("");
}

TEST_F(AttributeTest, WithoutAName)
{
    const xmlAttrPtr attribute = Add("b");
    const xmlChar* const name = attribute->name;
    attribute->name = nullptr;
    ExpectValue(std::nullopt);
    attribute->name = name;
}

TEST_F(AttributeTest, EmptyNameNamesNoneEvenIfThereIsOne)
{
    AddText(Add(""), "1");
    EXPECT_FALSE(ReaderAccepts("=1"));
    EXPECT_FALSE(WriterAccepts("=1"));
}

TEST_F(AttributeTest, NameWithANulNamesNone)
{
    LoadElement("", kDefault);
    EXPECT_FALSE(ReaderAccepts(std::string("a\0=default", 10)));
    EXPECT_FALSE(WriterAccepts(std::string("a\0=default", 10)));
}

// --- What the engine is asked for

TEST_F(AttributeTest, OneTextIsComparedInPlace)
{
    LoadElement("a='1' b=''");
    const EngineCalls calls;
    const EngineMemory memory;
    EXPECT_TRUE(ReaderAccepts("a=1&b="));
    EXPECT_FALSE(ReaderAccepts("a=2|absent=1"));
    EXPECT_EQ(0u, memory.Requests());
    EXPECT_FALSE(WriterAccepts("a=2"));
    EXPECT_EQ(0u, memory.Requests());
    EXPECT_EQ(std::vector<std::string>(), calls.PropertiesRead());
}

TEST_F(AttributeTest, AnyOtherValueIsReadByTheEngine)
{
    LoadElement("a='&e;' b='1&e;'", kEntity);
    Add("c");
    const EngineCalls calls;
    EXPECT_TRUE(ReaderAccepts("a=mid&b=1mid&c="));
    EXPECT_EQ(std::vector<std::string>({"a", "b", "c"}), calls.PropertiesRead());
}

TEST_F(AttributeTest, AbsentOneIsAskedForOnlyInADocumentWithADtd)
{
    {
        const EngineCalls calls;
        EXPECT_FALSE(ReaderAccepts("a=1"));
        EXPECT_EQ(std::vector<std::string>(), calls.PropertiesRead());
    }
    LoadElement("b='1'", kEntity);
    {
        const EngineCalls calls;
        const EngineMemory memory;
        EXPECT_TRUE(ReaderAccepts("a=1|b=1"));
        EXPECT_EQ(std::vector<std::string>({"a"}), calls.PropertiesRead());
        EXPECT_EQ(0u, memory.Requests()); // nor is its name copied to the heap
    }
}

TEST_F(AttributeTest, ShortOfMemoryAValueInPlaceMatches)
{
    LoadElement("a='1'");
    EngineMemory memory;
    memory.FailAt(1);
    EXPECT_TRUE(ReaderAccepts("a=1"));
    EXPECT_FALSE(memory.Failed());
    memory.FailAt(0);
}

TEST_F(AttributeTest, ShortOfMemoryAValueThatIsCopiedDoesNotMatch)
{
    const std::string name(100, 'n');
    LoadElement("a='1&e;'",
                "<!DOCTYPE cfg [<!ENTITY e 'mid'><!ATTLIST e " + name + " CDATA '1'>]>");
    for (const std::string& condition : {std::string("a=1mid"), name + "=1"})
    {
        ASSERT_TRUE(ReaderAccepts(condition));
        std::size_t failures = 0;
        for (bool failed = true; failed; ++failures)
        {
            EngineMemory memory;
            memory.FailAt(failures + 1);
            const bool accepted = ReaderAccepts(condition);
            failed = memory.Failed();
            memory.FailAt(0);
            EXPECT_EQ(!failed, accepted) << condition << ' ' << failures;
            EXPECT_EQ(0, memory.Live());
        }
        EXPECT_GT(failures, 1u) << condition;
    }
}

TEST_F(AttributeTest, CopiesAreReleased)
{
    LoadElement("a='1&e;'", kEntity);
    const EngineMemory memory;
    EXPECT_TRUE(ReaderAccepts("a=1|a=1mid"));
    EXPECT_FALSE(WriterAccepts(std::string(1000, 'n') + "=1"));
    EXPECT_EQ(0, memory.Live());
}
