#include "ToolTest.h"

#include <sstream>

using namespace kxtest;

namespace
{

class KxconfigKeys : public ToolTest
{
protected:
    std::string Keys(const std::string& xml) const
    {
        const Outcome outcome = Tool({"keys", m_folder.Write("cfg.xml", xml)});
        EXPECT_EQ(0, outcome.status) << xml << outcome.err;
        EXPECT_EQ("", outcome.err);
        return outcome.out;
    }
};

} // namespace

TEST_F(KxconfigKeys, PrintsKeysAndValuesInDocumentOrder)
{
    EXPECT_EQ("cfg.a.b\t\"1\"\ncfg.a.c\t\"2\"\ncfg.d\t\"3\"\n",
              Keys("<cfg><a><b>1</b><c>2</c></a><d>3</d></cfg>"));
}

TEST_F(KxconfigKeys, LeavesOutWhatHasNoValue)
{
    EXPECT_EQ("cfg.a\t\"1\"\n",
              Keys("<cfg><a>1</a><b/><c><![CDATA[2]]></c><d>3<!--x--></d></cfg>"));
}

TEST_F(KxconfigKeys, TellsElementsOfOneNameApartByAnAttribute)
{
    EXPECT_EQ("cfg.net@id=1.ip\t\"a\"\ncfg.net@id=2.ip\t\"b\"\n",
              Keys("<cfg><net id='1'><ip>a</ip></net><net id='2'><ip>b</ip></net></cfg>"));
    EXPECT_EQ(
        "cfg.net@b=1.ip\t\"a\"\ncfg.net@b=2.ip\t\"b\"\n",
        Keys("<cfg><net a='x' b='1'><ip>a</ip></net><net a='x' b='2'><ip>b</ip></net></cfg>"));
}

TEST_F(KxconfigKeys, AddsNoConditionWhereTheNameTells)
{
    EXPECT_EQ("cfg.net.ip\t\"a\"\n", Keys("<cfg><net id='1'><ip>a</ip></net></cfg>"));
}

TEST_F(KxconfigKeys, PrintsAKeyThatCannotTellOnceWithAllItsValues)
{
    EXPECT_EQ("cfg.a\t\"1\\n2\"\n", Keys("<cfg><a>1</a><a>2</a></cfg>"));
    EXPECT_EQ("cfg.a\t\"1\\n2\"\n", Keys("<cfg><a x='1.5'>1</a><a x='2|3'>2</a></cfg>"));
}

TEST_F(KxconfigKeys, LeavesOutNamesThatAKeyCannotHold)
{
    EXPECT_EQ("cfg.b\t\"2\"\n", Keys("<cfg><a.x>1</a.x><b>2</b></cfg>"));
}

TEST_F(KxconfigKeys, WhatItPrintsCanBeGivenToGet)
{
    // Also where an element of another name in front suspends the condition.
    const std::string awkward = m_folder.Write(
        "awkward.xml",
        "<cfg><z>0</z><a i='1'><b>x\ny</b></a><a i='2'><b>z</b></a><a><b>w</b></a></cfg>");
    for (const std::string& file : {std::string(KX_EXAMPLE_DATA "/gateway.xml"), awkward})
    {
        std::istringstream lines(Tool({"keys", file}).out);
        int keys = 0;
        for (std::string line; std::getline(lines, line); ++keys)
        {
            const std::string::size_type tab = line.find('\t');
            const Outcome outcome = Tool({"get", file, line.substr(0, tab)});
            EXPECT_EQ(0, outcome.status) << line;
            std::string value = outcome.out.substr(0, outcome.out.size() - 1);
            for (std::string::size_type at = 0; (at = value.find('\n', at)) != std::string::npos;)
            {
                value.replace(at, 1, "\\n");
            }
            EXPECT_EQ(line.substr(tab + 1), '"' + value + '"');
        }
        EXPECT_GE(keys, 4);
    }
}

TEST_F(KxconfigKeys, SaysThatThereIsNone)
{
    const std::string empty = m_folder.Write("empty.xml", "<cfg><a/></cfg>");
    ExpectComplaint(Tool({"keys", empty}), 1,
                    "nothing found: " + empty + " holds no value that a key path can name");
    const std::string dotted = m_folder.Write("dotted.xml", "<c.f><a>1</a></c.f>");
    EXPECT_EQ(1, Tool({"keys", dotted}).status);
    EXPECT_EQ(3, Tool({"keys", m_folder.Path("missing.xml")}).status);
}
