#include "ToolTest.h"

#include <algorithm>

using namespace kxtest;

namespace
{

class KxconfigFind : public ToolTest
{
protected:
    const std::string m_file = m_folder.Write(
        "cfg.xml", "<cfg xmlns:p='urn:p'><!-- c --><net id='1' on=''><ip>a</ip></net>"
                   "<net id='2'>x<ip>b\nc</ip></net><p:e/><d><![CDATA[<]]></d><?pi data?></cfg>");

    std::string Find(const std::string& expression) const
    {
        const Outcome outcome = Tool({"find", m_file, expression});
        EXPECT_EQ(0, outcome.status) << expression << outcome.err;
        EXPECT_EQ("", outcome.err);
        return outcome.out;
    }
};

} // namespace

TEST_F(KxconfigFind, PrintsElementsWithLocationAttributesAndText)
{
    EXPECT_EQ("/cfg/net[1] element id=\"1\" on=\"\"\n/cfg/net[2] element id=\"2\"\n",
              Find("/cfg/net"));
    EXPECT_EQ("/cfg/net[1]/ip element \"a\"\n/cfg/net[2]/ip element \"b\\nc\"\n", Find("//ip"));
}

TEST_F(KxconfigFind, PrintsEveryKindOfNode)
{
    EXPECT_EQ("/ document\n", Find("/"));
    EXPECT_EQ("/cfg/net[1]/@id attribute \"1\"\n", Find("//net[1]/@id"));
    EXPECT_EQ("/cfg/net[2]/text() text \"x\"\n", Find("//net/text()"));
    EXPECT_EQ("/cfg/comment() comment \" c \"\n", Find("//comment()"));
    EXPECT_EQ("/cfg/processing-instruction('pi') processing-instruction \"data\"\n",
              Find("//processing-instruction()"));
    EXPECT_EQ("/cfg/d/text() cdata \"<\"\n", Find("//d/text()"));
    EXPECT_EQ("/cfg/namespace::p namespace \"urn:p\"\n", Find("/cfg/namespace::p"));
    EXPECT_EQ("/cfg/p:e element\n", Find("/cfg/*[3]"));
}

TEST_F(KxconfigFind, PrintsThePrefixOfAnAttribute)
{
    const std::string file = m_folder.Write("prefix.xml", "<a xmlns:p='urn:p' p:id='1' id='2'/>");
    EXPECT_EQ("/a element p:id=\"1\" id=\"2\"\n", Tool({"find", file, "/a"}).out);
}

TEST_F(KxconfigFind, BlamesTheExpressionAndNotTheFile)
{
    const std::string file = m_folder.Write("undeclared.xml", "<a><p:b/></a>");
    const Outcome outcome = Tool({"find", file, "//["});
    EXPECT_EQ(2, outcome.status);
    EXPECT_EQ(std::string::npos, outcome.err.find("prefix")) << outcome.err;
}

TEST_F(KxconfigFind, PrintsNumbersStringsAndBooleansAsSuch)
{
    EXPECT_EQ("2\n", Find("count(//net)"));
    EXPECT_EQ("0.5\n", Find("1 div 2"));
    EXPECT_EQ("a\n", Find("string(//ip)"));
    EXPECT_EQ("true\n", Find("//net/@id = 2"));
    EXPECT_EQ("false\n", Find("1 = 2"));
}

TEST_F(KxconfigFind, TakesRelativeExpressionsFromTheDocument)
{
    EXPECT_EQ("/cfg/net[1]/ip element \"a\"\n", Find("cfg/net[1]/ip"));
}

TEST_F(KxconfigFind, PrintsMoreThan255Nodes)
{
    std::string xml = "<cfg>";
    for (int i = 0; i != 1000; ++i)
    {
        xml += "<a/>";
    }
    const Outcome outcome = Tool({"find", m_folder.Write("many.xml", xml + "</cfg>"), "//a"});
    EXPECT_EQ(0, outcome.status);
    EXPECT_EQ(1000, std::count(outcome.out.begin(), outcome.out.end(), '\n'));
    EXPECT_THAT(outcome.out, testing::EndsWith("/cfg/a[1000] element\n"));
}

TEST_F(KxconfigFind, SaysWhatWasNotFound)
{
    ExpectComplaint(Tool({"find", m_file, "//nothing"}), 1,
                    "nothing found: \"//nothing\" selects no node of " + m_file);
}

TEST_F(KxconfigFind, RefusesAMalformedExpression)
{
    for (const std::string expression : {"//[", "", "q:x", "f()"})
    {
        const Outcome outcome = Tool({"find", m_file, expression});
        EXPECT_EQ(2, outcome.status) << expression;
        EXPECT_EQ("", outcome.out);
        // What follows is the engine's own text.
        EXPECT_THAT(outcome.err,
                    testing::StartsWith("kxconfig: malformed expression \"" + expression + "\""));
        EXPECT_EQ(1, std::count(outcome.err.begin(), outcome.err.end(), '\n'));
    }
}

TEST_F(KxconfigFind, SaysWhyAFileCannotBeRead)
{
    const std::string missing = m_folder.Path("missing.xml");
    ExpectComplaint(Tool({"find", missing, "/"}), 3,
                    "cannot read " + missing + ": No such file or directory");
    const std::string bad = m_folder.Write("bad.xml", "<a>\n</b>");
    const Outcome outcome = Tool({"find", bad, "/"});
    EXPECT_EQ(3, outcome.status);
    EXPECT_THAT(outcome.err, testing::StartsWith("kxconfig: " + bad + ":2: "));
}
