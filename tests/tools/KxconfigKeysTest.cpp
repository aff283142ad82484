#include "RandomDocument.h"
#include "ToolTest.h"

#include "CXMLReader.h"

#include <nlohmann/json.hpp>

#include <set>
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

    /** Expects each key once, and with it exactly what the library gives for it. @return their
     * number. */
    static int ExpectValuesOfTheLibrary(const std::string& file)
    {
        const Outcome outcome = Tool({"--json", "keys", "--all", file});
        const nlohmann::json answer = nlohmann::json::parse(outcome.out);
        CXMLReader reader(file);
        std::set<std::string> keys;
        for (const nlohmann::json& result : answer.at("results"))
        {
            const std::string key = result.at("key");
            EXPECT_TRUE(keys.insert(key).second) << key;
            std::string value;
            EXPECT_EQ(0, reader.GetValue(key, value)) << key;
            EXPECT_EQ(value, result.at("value").get<std::string>()) << key;
        }
        return static_cast<int>(keys.size());
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

TEST_F(KxconfigKeys, DistinguishesElementsOfOneNameByAnAttribute)
{
    EXPECT_EQ("cfg.net@id=1.ip\t\"a\"\ncfg.net@id=2.ip\t\"b\"\n",
              Keys("<cfg><net id='1'><ip>a</ip></net><net id='2'><ip>b</ip></net></cfg>"));
    EXPECT_EQ(
        "cfg.net@b=1.ip\t\"a\"\ncfg.net@b=2.ip\t\"b\"\n",
        Keys("<cfg><net a='x' b='1'><ip>a</ip></net><net a='x' b='2'><ip>b</ip></net></cfg>"));
}

TEST_F(KxconfigKeys, AddsNoConditionWhereTheNameSuffices)
{
    EXPECT_EQ("cfg.net.ip\t\"a\"\n", Keys("<cfg><net id='1'><ip>a</ip></net></cfg>"));
}

TEST_F(KxconfigKeys, PrintsAKeyThatCannotTellOnceWithAllItsValues)
{
    EXPECT_EQ("cfg.a\t\"1\\n2\"\n", Keys("<cfg><a>1</a><a>2</a></cfg>"));
    EXPECT_EQ("cfg.a\t\"1\\n2\"\n", Keys("<cfg><a x='1.5'>1</a><a x='2|3'>2</a></cfg>"));
}

TEST_F(KxconfigKeys, ShowsNoControlCharactersToATerminal)
{
    // U+009B starts a command to a terminal, as ESC [ does; the letters around it stay.
    EXPECT_EQ("cfg.a\t\"x\\xc2\\x9b31m\xC2\xA0\xC3\xA4\\x7f\\x0d\"\n",
              Keys("<cfg><a>x&#x9B;31m&#xA0;&#xE4;&#x7F;&#13;</a></cfg>"));
}

TEST_F(KxconfigKeys, PrintsTheTextOfAnyEncodingInUtf8)
{
    EXPECT_EQ("cfg.a\t\"gr\xC3\xBCn\"\n",
              Keys("<?xml version='1.0' encoding='ISO-8859-1'?><cfg><a>gr\xFCn</a></cfg>"));
    EXPECT_EQ("cfg.a\t\"1\"\n", Keys("\xEF\xBB\xBF<cfg><a>1</a></cfg>"));
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

TEST_F(KxconfigKeys, PrintsNamesWithoutValues)
{
    const std::string file =
        m_folder.Write("cfg.xml", "<cfg><a>1</a><a>2</a><n i='1'>x</n><n i='2'>y</n></cfg>");
    EXPECT_EQ("cfg.a\ncfg.n@i=1\ncfg.n@i=2\n", Tool({"keys", "--names", file}).out);
    const nlohmann::json answer =
        nlohmann::json::parse(Tool({"--json", "keys", "--names", file}).out);
    const nlohmann::json names = {
        {{"key", "cfg.a"}}, {{"key", "cfg.n@i=1"}}, {{"key", "cfg.n@i=2"}}};
    EXPECT_EQ(names, answer.at("results"));
    EXPECT_EQ(2, Tool({"keys", "--names", "--all", file}).status);
}

TEST_F(KxconfigKeys, PrintsThoseBelowAPrefix)
{
    const std::string file =
        m_folder.Write("cfg.xml", "<cfg><net id='1'><ip>a</ip></net><net id='1@x'><ip>b</ip></net>"
                                  "<network>c</network><n>d</n><n.o>e</n.o></cfg>");
    const std::string first = "cfg.net@id=1.ip\t\"a\"\n";
    const std::string second = "cfg.net@id=1@x.ip\t\"b\"\n";
    EXPECT_EQ(first, Tool({"keys", file, "cfg.net@id=1"}).out);
    EXPECT_EQ(first, Tool({"keys", file, "cfg.net@id=1.ip"}).out);
    EXPECT_EQ(first + second, Tool({"keys", file, "cfg.net"}).out);
    EXPECT_EQ("cfg.n\n", Tool({"keys", "--names", file, "cfg.n"}).out);
    EXPECT_EQ(Tool({"keys", file}).out, Tool({"keys", file, "cfg"}).out);
    EXPECT_EQ("cfg.n\n",
              ToolWithInput({"keys", "--names", "-", "cfg.n"}, "<cfg><n>1</n></cfg>").out);
}

TEST_F(KxconfigKeys, ReportsThatNothingIsBelowAPrefix)
{
    const std::string file = m_folder.Write("cfg.xml", "<cfg><net>1</net></cfg>");
    for (const std::string prefix : {"cfg.ne", "cfg.net.", "cfg.net@id=1", "other"})
    {
        ExpectComplaint(Tool({"keys", file, prefix}), 1,
                        "nothing found: " + file +
                            " has no value that a key path can name below \"" + prefix + "\"");
    }
}

TEST_F(KxconfigKeys, GivesWhatTheLibraryGivesForEveryKey)
{
    int keys = 0;
    for (unsigned seed = 1; seed != 61; ++seed)
    {
        const std::string xml = RandomDocument(seed).Make();
        SCOPED_TRACE(xml);
        keys += ExpectValuesOfTheLibrary(m_folder.Write("random.xml", xml));
    }
    EXPECT_GT(keys, 600);
}

TEST_F(KxconfigKeys, TakesTheTextsOnTheWayToAnElement)
{
    // The first a holds a text and ends the way there; a lookup gives it all the same.
    EXPECT_EQ("cfg.a\t\"1\"\ncfg.a.b\t\"1\\n2\"\n", Keys("<cfg><a>1</a><a><b>2</b></a></cfg>"));
}

TEST_F(KxconfigKeys, DistinguishesByAnAttributeWithAPrefix)
{
    // A condition finds it by its name without the prefix.
    EXPECT_EQ("cfg.a@i=1\t\"x\"\ncfg.a@i=2\t\"y\"\n",
              Keys("<cfg xmlns:p='urn:p'><a p:i='1'>x</a><a p:i='2'>y</a></cfg>"));
    // Of two with that name it finds the first.
    EXPECT_EQ("cfg.a@i=1\t\"x\"\ncfg.a@i=3\t\"y\"\n",
              Keys("<cfg xmlns:p='urn:p'><a p:i='1' i='2'>x</a><a i='3' p:i='1'>y</a></cfg>"));
}

TEST_F(KxconfigKeys, DistinguishesByTheDefaultOfAnAttribute)
{
    EXPECT_EQ("cfg.a@i=1\t\"x\"\ncfg.a@i=2\t\"y\"\n",
              Keys("<!DOCTYPE cfg [<!ATTLIST a i CDATA '1'>]>"
                   "<cfg><a>x</a><a i='2'>y</a></cfg>"));
    // A default that another element bears as its own distinguishes neither.
    EXPECT_EQ("cfg.a\t\"x\\ny\\nz\"\ncfg.a@i=2\t\"z\"\n",
              Keys("<!DOCTYPE cfg [<!ATTLIST a i CDATA '1'>]>"
                   "<cfg><a>x</a><a i='1'>y</a><a i='2'>z</a></cfg>"));
    EXPECT_EQ("cfg.a\t\"x\\ny\"\n", Keys("<!DOCTYPE cfg [<!ATTLIST a i CDATA #IMPLIED>]>"
                                         "<cfg><a>x</a><a>y</a></cfg>"));
}

TEST_F(KxconfigKeys, DoesNotTellApartByTheDefaultOfAnAttributeWithAPrefix)
{
    const std::string xml = "<!DOCTYPE cfg [<!ATTLIST a p:i CDATA '1'>]>"
                            "<cfg xmlns:p='urn:p'><a>x</a><a p:i='2'>y</a></cfg>";
    EXPECT_EQ("cfg.a\t\"x\\ny\"\ncfg.a@i=2\t\"y\"\n", Keys(xml));
    // The default is found by the whole name only, and then also where another text stands.
    const std::string file = m_folder.Write("cfg.xml", xml);
    EXPECT_EQ("x\ny\n", Tool({"get", file, "cfg.a@p:i=1"}).out);
    EXPECT_EQ(1, Tool({"get", file, "cfg.a@p:i=2"}).status);
    EXPECT_EQ(1, Tool({"get", file, "cfg.a@i=1"}).status);
}

TEST_F(KxconfigKeys, ListsManyElementsAfterOneOfAnotherName)
{
    // The element in front suspends the condition for the first net: no key is free of it. Looking
    // each key up would take minutes, until the test is stopped.
    std::string xml = "<cfg><name>box</name>";
    for (int i = 0; i != 20000; ++i)
    {
        xml += "<net id='" + std::to_string(i) + "'><ip>x</ip></net>";
    }
    const std::string file = m_folder.Write("many.xml", xml + "</cfg>");
    const Outcome outcome = Tool({"keys", file});
    EXPECT_EQ(0, outcome.status);
    EXPECT_THAT(outcome.out, testing::EndsWith("\ncfg.net@id=19999.ip\t\"x\\nx\"\n"));
}

TEST_F(KxconfigKeys, CountsTheValuesAfterTheTenth)
{
    std::string ten;
    std::string xml = "<cfg>";
    for (int i = 1; i != 11; ++i)
    {
        xml += "<a>" + std::to_string(i) + "</a>";
        ten += (i == 1 ? "" : "\\n") + std::to_string(i);
    }
    EXPECT_EQ("cfg.a\t\"" + ten + "\"\n", Keys(xml + "</cfg>"));
    const std::string file = m_folder.Write("many.xml", xml + "<a>11</a><a>12</a></cfg>");
    EXPECT_EQ("cfg.a\t\"" + ten + "\" ... 2 more\n", Tool({"keys", file}).out);
    EXPECT_EQ("cfg.a\t\"" + ten + "\\n11\\n12\"\n", Tool({"keys", "--all", file}).out);
    const Outcome outcome = Tool({"--json", "keys", file});
    EXPECT_EQ(2, nlohmann::json::parse(outcome.out).at("results").at(0).at("more"));
}

TEST_F(KxconfigKeys, CutsSeveralLongValuesButNoSingleOne)
{
    const std::string half(500, 'x');
    EXPECT_EQ("cfg.a\t\"" + half + "\\n" + half + "\" ... 1 more\n",
              Keys("<cfg><a>" + half + "</a><a>" + half + "</a><a>y</a></cfg>"));
    EXPECT_EQ("cfg.a\t\"\" ... 2 more\n", Keys("<cfg><a>" + half + half + "x</a><a>y</a></cfg>"));
    EXPECT_EQ("cfg.a\t\"" + half + half + half + "\"\n",
              Keys("<cfg><a>" + half + half + half + "</a></cfg>"));
}

TEST_F(KxconfigKeys, PrintsAtMostAHundredTimesTheFile)
{
    // Each title suspends the condition for the next net, so that every key matches every net.
    const std::string longValue(10000, 'x');
    for (const std::string& value : {std::string("1"), longValue})
    {
        std::string xml = "<cfg><title/><net id='x'><ip>" + value + "</ip></net>";
        for (int i = 0; i != 300; ++i)
        {
            xml += "<title/><net id='" + std::to_string(i) + "'><ip>1</ip></net>";
        }
        const std::string file = m_folder.Write("cfg.xml", xml + "</cfg>");
        EXPECT_LT(Tool({"keys", file}).out.size(), 100 * xml.size());
        EXPECT_LT(Tool({"--json", "keys", file}).out.size(), 100 * xml.size());
    }
}

TEST_F(KxconfigKeys, SaysThatThereIsNone)
{
    const std::string empty = m_folder.Write("empty.xml", "<cfg><a/></cfg>");
    ExpectComplaint(Tool({"keys", empty}), 1,
                    "nothing found: " + empty + " has no value that a key path can name");
    const std::string dotted = m_folder.Write("dotted.xml", "<c.f><a>1</a></c.f>");
    EXPECT_EQ(1, Tool({"keys", dotted}).status);
    EXPECT_EQ(3, Tool({"keys", m_folder.Path("missing.xml")}).status);
}

TEST_F(KxconfigKeys, ListsManyElementsOfDifferentNames)
{
    std::string xml;
    std::string lines;
    for (const char name : std::string("abcdefghij"))
    {
        xml += std::string("<") + name + ">1</" + name + ">";
        lines += std::string("cfg.") + name + "\t\"1\"\n";
    }
    EXPECT_EQ(lines, Tool({"keys", m_folder.Write("many.xml", "<cfg>" + xml + "</cfg>")}).out);
}

TEST_F(KxconfigKeys, AnAttributeWithADotInItsNameDistinguishesNoElements)
{
    const std::string file =
        m_folder.Write("dot.xml", "<cfg><a x.y='1'>p</a><a x.y='2'>q</a></cfg>");
    EXPECT_EQ("cfg.a\t\"p\\nq\"\n", Tool({"keys", file}).out);
}

TEST_F(KxconfigKeys, EscapesADelete)
{
    EXPECT_EQ("cfg.a\t\"x\\x7fy\"\n",
              Tool({"keys", m_folder.Write("del.xml", "<cfg><a>x&#127;y</a></cfg>")}).out);
}

TEST_F(KxconfigKeys, LeavesOutTheElementsOfAnEntity)
{
    const std::string file = m_folder.Write(
        "entity.xml", "<!DOCTYPE cfg [<!ENTITY e '<x>1</x>'>]><cfg><a>&e;</a><b>2</b></cfg>");
    EXPECT_EQ("cfg.b\t\"2\"\n", Tool({"keys", file}).out);
}
