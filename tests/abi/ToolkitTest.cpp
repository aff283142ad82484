#include "CXmlParser.h"

#include "support/Files.h"
#include "support/Layout.h"

#include <libxml/tree.h>

#include <gtest/gtest.h>

#include <type_traits>

using namespace kxtest;

TEST(ToolkitLayout, HasNoTables)
{
    EXPECT_FALSE(std::is_polymorphic<CXmlParser>::value);
    EXPECT_FALSE(std::is_polymorphic<CXmlNode>::value);
    EXPECT_FALSE(std::is_polymorphic<CXmlAttr>::value);
}

TEST(ToolkitLayout, AnAttributeIsItsNameAndItsValue)
{
    const CXmlAttr attribute("name", "value");
    EXPECT_EQ(2 * sizeof(std::string), sizeof attribute);
    EXPECT_EQ(static_cast<const void*>(&attribute), &attribute.m_strName);
    EXPECT_EQ(&attribute.m_strName + 1, &attribute.m_strValue);
}

TEST(ToolkitLayout, AHandleIsItsNode)
{
    xmlNode node = {};
    const CXmlNode handle(&node);
    EXPECT_EQ(sizeof(void*), sizeof handle);
    EXPECT_EQ(&node, PointerAt(&handle, 0));
}

TEST(ToolkitLayout, AParserIsItsDocumentItsPathAndItsRoot)
{
    const TemporaryFolder folder;
    const std::string file = folder.Write("cfg.xml", "<cfg/>");
    CXmlParser parser;
    EXPECT_EQ(2 * sizeof(void*) + sizeof(std::string), sizeof parser);
    ASSERT_EQ(0, parser.ParseXml(file));
    const auto document = static_cast<xmlDocPtr>(PointerAt(&parser, 0));
    const char* const bytes = reinterpret_cast<const char*>(&parser);
    EXPECT_EQ(file, *reinterpret_cast<const std::string*>(bytes + sizeof(void*)));
    EXPECT_EQ(xmlDocGetRootElement(document),
              PointerAt(&parser, sizeof(void*) + sizeof(std::string)));
}
