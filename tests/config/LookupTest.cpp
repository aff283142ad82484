#include "CXMLReader.h"

#include "Messages.h"

#include "support/Engine.h"
#include "support/Expect.h"
#include "support/Files.h"
#include "support/Log.h"
#include "support/Memory.h"

#include <gtest/gtest.h>

#include <cerrno>
#include <memory>

using namespace kxtest;

namespace
{

// The document that the suite talks about.
const char* const kNets = "<cfg>"
                          "<net id='1'><ip>10.0.0.1</ip></net>"
                          "<net id='2'><ip>10.0.0.2</ip></net>"
                          "<name>box</name>"
                          "</cfg>";

struct Answer
{
    std::string text;     // of the one-argument form
    int status;           // of the two-argument form, called with an empty string
    std::string appended; // and what that string then holds
};

bool operator==(const Answer& left, const Answer& right)
{
    return left.text == right.text && left.status == right.status &&
           left.appended == right.appended;
}

std::ostream& operator<<(std::ostream& out, const Answer& answer)
{
    return out << '"' << answer.text << "\" / " << answer.status << " \"" << answer.appended << '"';
}

Answer Found(const std::string& text)
{
    return {text, 0, text};
}
Answer Found(const std::string& text, const std::string& appended)
{
    return {text, 0, appended};
}
Answer Nothing(int status)
{
    return {"", status, ""};
}

class LookupTest : public testing::Test
{
protected:
    explicit LookupTest(const std::string& xml = kNets) { Load(xml); }

    void Load(const std::string& xml)
    {
        m_reader = std::make_unique<CXMLReader>(m_folder.Write("cfg.xml", xml));
        ASSERT_NE(nullptr, m_reader->GetDataPtr()) << xml;
    }

    Answer Ask(const std::string& key)
    {
        Answer answer;
        answer.text = m_reader->GetValue(key);
        answer.status = m_reader->GetValue(key, answer.appended);
        return answer;
    }

    Answer Ask(const std::string& xml, const std::string& key)
    {
        Load(xml);
        return Ask(key);
    }

    xmlNodePtr Root() const
    {
        return xmlDocGetRootElement(static_cast<xmlDocPtr>(m_reader->GetDataPtr()));
    }

    /**
     * Expects that both forms find nothing and answer so, with these records under every mask.
     */
    static void ExpectMissing(CXMLReader& reader, const std::string& key,
                              const Records& oneArgument, const Records& twoArguments)
    {
        ExpectRecords(oneArgument, [&] { EXPECT_EQ("", reader.GetValue(key)); });
        std::string value = "old";
        ExpectRecords(twoArguments, [&] { EXPECT_EQ(22, reader.GetValue(key, value)); });
        EXPECT_EQ("old", value);
    }

    TemporaryFolder m_folder;
    std::unique_ptr<CXMLReader> m_reader;
};

class ConditionTest : public LookupTest
{
protected:
    /** @return whether the lookup accepts an element with these attributes under the condition. */
    bool Accepts(const std::string& attributes, const std::string& condition)
    {
        const Answer answer = Ask("<cfg><e " + attributes + ">v</e></cfg>", "cfg.e@" + condition);
        EXPECT_TRUE(answer == Found("v") || answer == Nothing(-2)) << answer;
        return answer == Found("v");
    }
};

} // namespace

// --- One level, two levels

TEST_F(LookupTest, FindsTheTextOfAnElement)
{
    EXPECT_EQ(Found("box"), Ask("cfg.name"));
}

TEST_F(LookupTest, SeparatesTheValuesOfDifferentBranches)
{
    EXPECT_EQ(Found("10.0.0.1\n10.0.0.2"), Ask("cfg.net.ip"));
}

TEST_F(LookupTest, RunsTheValuesOfOneParentTogetherInTheOneArgumentForm)
{
    EXPECT_EQ(Found("12", "1\n2"), Ask("<cfg><net><ip>1</ip><ip>2</ip></net></cfg>", "cfg.net.ip"));
    EXPECT_EQ(Found("12\n34", "1\n2\n3\n4"),
              Ask("<cfg><net><ip>1</ip><ip>2</ip></net><net><ip>3</ip><ip>4</ip></net></cfg>",
                  "cfg.net.ip"));
    EXPECT_EQ(Found("12", "1\n2"), Ask("<cfg><a>1</a><a>2</a></cfg>", "cfg.a"));
}

TEST_F(LookupTest, SeparatesBranchesOnlyWhereBothSidesHoldText)
{
    const std::string xml = "<cfg><a><b/></a><a><b>1</b></a><a><x/></a><a><b>2</b></a><a/></cfg>";
    EXPECT_EQ(Found("1\n2"), Ask(xml, "cfg.a.b"));
}

TEST_F(LookupTest, SeparatesBranchesOnEveryLevelOnce)
{
    const std::string xml = "<cfg>"
                            "<a><b><c>1</c><c>2</c></b><b><c>3</c></b></a>"
                            "<a><b><c/></b><b><c>4</c></b></a>"
                            "<a><b><c>5</c></b></a>"
                            "</cfg>";
    EXPECT_EQ(Found("12\n3\n4\n5", "1\n2\n3\n4\n5"), Ask(xml, "cfg.a.b.c"));
}

TEST_F(LookupTest, AnElementInTheMiddleOfThePathContributesItsOwnText)
{
    EXPECT_EQ(Found("t\nv"), Ask("<cfg><a>t</a><a><b>v</b></a></cfg>", "cfg.a.b"));
    // Its text joins what was found so far without a separator in the one-argument form.
    EXPECT_EQ(Found("vt", "v\nt"), Ask("<cfg><a><b>v</b></a><a>t</a></cfg>", "cfg.a.b"));
}

TEST_F(LookupTest, ComparesOnEachLevelInDocumentOrder)
{
    EXPECT_EQ(Found("132", "1\n3\n2"), Ask("<cfg><a>1</a><b/><a>3</a><a>2</a></cfg>", "cfg.a"));
}

TEST_F(LookupTest, SkipsEverythingThatIsNoElement)
{
    EXPECT_EQ(Found("v"), Ask("<cfg>text<!--a--><?a b?><![CDATA[a]]><a>v</a></cfg>", "cfg.a"));
    EXPECT_EQ(Nothing(-2), Ask("<cfg><!--x--></cfg>", "cfg.comment"));
    EXPECT_EQ(Nothing(-2), Ask("<cfg>t</cfg>", "cfg.text"));
    EXPECT_EQ(Nothing(-2), Ask("<cfg><?pi x?></cfg>", "cfg.pi"));
}

TEST_F(LookupTest, ComparesNamesAsWholeCaseSensitiveByteStrings)
{
    const std::string xml = "<cfg><port>1</port></cfg>";
    for (const char* const key : {"cfg.por", "cfg.ports", "cfg.Port", "cfg. port", "cfg.port "})
    {
        EXPECT_EQ(Nothing(-2), Ask(xml, key)) << key;
    }
    EXPECT_EQ(Found("v"), Ask("<cfg><\xC3\xBC>v</\xC3\xBC></cfg>", "cfg.\xC3\xBC"));
    EXPECT_EQ(Nothing(-2), Ask("<cfg><\xC3\xBC>v</\xC3\xBC></cfg>", "cfg.\xC3"));
    EXPECT_EQ(Nothing(-2), Ask("<cfg><\xC3\xBC>v</\xC3\xBC></cfg>", "cfg.\xFC"));
}

TEST_F(LookupTest, TakesNoNoticeOfNamespaces)
{
    const std::string xml = "<p:cfg xmlns:p='urn:p'><p:a>1</p:a><a>2</a></p:cfg>";
    EXPECT_EQ(Found("12", "1\n2"), Ask(xml, "cfg.a"));
    EXPECT_EQ(Nothing(-2), Ask(xml, "cfg.p:a"));
}

// --- What has a value

TEST_F(LookupTest, ElementWithSeveralChildrenHasNoValue)
{
    EXPECT_EQ(Nothing(-2), Ask("cfg.net"));
    EXPECT_EQ(Nothing(-2), Ask("<cfg><a>1<b/></a></cfg>", "cfg.a"));
    EXPECT_EQ(Nothing(-2), Ask("<cfg><a><b/>1</a></cfg>", "cfg.a"));
}

TEST_F(LookupTest, EmptyElementHasNoValue)
{
    EXPECT_EQ(Nothing(-2), Ask("<cfg><a/></cfg>", "cfg.a"));
    EXPECT_EQ(Nothing(-2), Ask("<cfg><a></a></cfg>", "cfg.a"));
}

TEST_F(LookupTest, CommentBesideTextMeansNoValue)
{
    EXPECT_EQ(Nothing(-2), Ask("<cfg><a>1<!--c-->2</a></cfg>", "cfg.a"));
    EXPECT_EQ(Nothing(-2), Ask("<cfg><a>1<!--c--></a></cfg>", "cfg.a"));
    EXPECT_EQ(Nothing(-2), Ask("<cfg><a><!--c-->1</a></cfg>", "cfg.a"));
}

TEST_F(LookupTest, CDataSectionMeansNoValue)
{
    EXPECT_EQ(Nothing(-2), Ask("<cfg><a><![CDATA[1]]></a></cfg>", "cfg.a"));
    EXPECT_EQ(Nothing(-2), Ask("<cfg><a>1<![CDATA[2]]></a></cfg>", "cfg.a"));
}

TEST_F(LookupTest, EntityReferenceMeansNoValue)
{
    const std::string head = "<!DOCTYPE cfg [<!ENTITY e 'x'>]>";
    EXPECT_EQ(Nothing(-2), Ask(head + "<cfg><a>&e;</a></cfg>", "cfg.a"));
    EXPECT_EQ(Found("<&"), Ask("<cfg><a>&lt;&#38;</a></cfg>", "cfg.a"));
}

TEST_F(LookupTest, BlankTextIsAValue)
{
    EXPECT_EQ(Found(" \n "), Ask("<cfg><a> \n </a></cfg>", "cfg.a"));
}

TEST_F(LookupTest, IndentationAroundChildElementsIsNone)
{
    EXPECT_EQ(Found("v"), Ask("<cfg>\n <a>\n  <b>v</b>\n </a>\n</cfg>", "cfg.a.b"));
}

TEST_F(LookupTest, ValueIsTakenAsTheEngineHoldsIt)
{
    EXPECT_EQ(Found(" \xC3\xBC  "), Ask("<?xml version='1.0' encoding='ISO-8859-1'?>"
                                        "<cfg><a> \xFC  </a></cfg>",
                                        "cfg.a"));
}

TEST_F(LookupTest, TextNodeWithoutContentIsAnEmptyValue)
{
    Load("<cfg><a>x</a><a>1</a></cfg>");
    const xmlNodePtr text = Root()->children->children;
    xmlNodeSetContent(text, nullptr);
    ASSERT_EQ(nullptr, text->content);

    EXPECT_EQ(Found("1"), Ask("cfg.a"));
    std::string value = "old";
    EXPECT_EQ(0, m_reader->GetValue("cfg.a", value));
    EXPECT_EQ("old\n\n1", value); // the empty value is appended like any other
}

TEST_F(LookupTest, EmptyValueOfAnotherBranchIsNotSeparated)
{
    Load("<cfg><a><b>1</b></a><a><b>x</b></a><a><b>3</b></a></cfg>");
    const xmlNodePtr second = Root()->children->next->children;
    xmlNodeSetContent(second->children, nullptr);
    EXPECT_EQ(Found("1\n3", "1\n\n3"), Ask("cfg.a.b"));
}

TEST_F(LookupTest, EmptyValueAloneCountsAsFound)
{
    Load("<cfg><a>x</a></cfg>");
    xmlNodeSetContent(Root()->children->children, nullptr);
    EXPECT_EQ(Found(""), Ask("cfg.a"));
}

// --- Keys that name nothing

TEST_F(LookupTest, ForeignRootIsSuccessWithTheValueUntouched)
{
    EXPECT_EQ(Nothing(0), Ask("other.name"));
    std::string value = "old";
    EXPECT_EQ(0, m_reader->GetValue("other.name", value));
    EXPECT_EQ("old", value);
    EXPECT_EQ(Nothing(0), Ask("cf.name"));
    EXPECT_EQ(Nothing(0), Ask("cfgs.name"));
    EXPECT_EQ(Nothing(0), Ask("CFG.name"));
    EXPECT_EQ(Nothing(0), Ask(".name"));
}

TEST_F(LookupTest, NoConditionIsRecognisedOnTheRoot)
{
    EXPECT_EQ(Nothing(0), Ask("<cfg id='1'><name>box</name></cfg>", "cfg@id=1.name"));
}

TEST_F(LookupTest, KeyWithoutDotIsABadArgument)
{
    EXPECT_EQ(Nothing(7), Ask("cfg"));
    EXPECT_EQ(Nothing(7), Ask("other"));
    EXPECT_EQ(Nothing(7), Ask("@"));
}

TEST_F(LookupTest, MissingElementIsNotFound)
{
    EXPECT_EQ(Nothing(-2), Ask("cfg.missing"));
}

TEST_F(LookupTest, NothingAfterTheDotIsNotFound)
{
    EXPECT_EQ(Nothing(-2), Ask("cfg."));
}

TEST_F(LookupTest, TrailingDotStillFindsTheLevelAbove)
{
    EXPECT_EQ(Found("box"), Ask("cfg.name."));
    EXPECT_EQ(Nothing(-2), Ask("cfg.net."));
}

TEST_F(LookupTest, EmptySegmentNamesNoElement)
{
    EXPECT_EQ(Nothing(-2), Ask("cfg..name"));
    EXPECT_EQ(Nothing(-2), Ask("cfg.net..ip"));
    EXPECT_EQ(Nothing(-2), Ask("cfg.@id=1"));
    EXPECT_EQ(Nothing(-2), Ask("cfg.."));
    EXPECT_EQ(Nothing(0), Ask("."));
    EXPECT_EQ(Nothing(0), Ask(".."));
}

TEST_F(LookupTest, DotInAConditionValueEndsTheSegment)
{
    const std::string xml = "<cfg><a v='1.5'>x</a><a v='1'>y</a></cfg>";
    EXPECT_EQ(Found("y"), Ask(xml, "cfg.a@v=1.5"));
}

TEST_F(LookupTest, ElementNameWithADotCannotBeExpressed)
{
    EXPECT_EQ(Nothing(-2), Ask("<cfg><a.b>v</a.b></cfg>", "cfg.a.b"));
}

// --- Conditions

TEST_F(LookupTest, ConditionNarrowsTheElementsOfAName)
{
    EXPECT_EQ(Found("10.0.0.2"), Ask("cfg.net@id=2.ip"));
    EXPECT_EQ(Found("10.0.0.1"), Ask("cfg.net@id=3|id=1.ip"));
    EXPECT_EQ(Nothing(-2), Ask("cfg.net@id=3.ip"));
}

TEST_F(LookupTest, ElementOfAnotherNameSuspendsTheConditionUntilTheNextMatch)
{
    const std::string nets = "<net id='1'><ip>10.0.0.1</ip></net>"
                             "<net id='2'><ip>10.0.0.2</ip></net>";
    EXPECT_EQ(Found("10.0.0.1"), Ask("<cfg><name>box</name>" + nets + "</cfg>", "cfg.net@id=3.ip"));
    EXPECT_EQ(Found("10.0.0.1\n10.0.0.1"),
              Ask("<cfg><x/>" + nets + "<x/>" + nets + "</cfg>", "cfg.net@id=3.ip"));
    EXPECT_EQ(Found("10.0.0.1\n10.0.0.2"),
              Ask("<cfg><x/>" + nets + "<x/></cfg>", "cfg.net@id=2.ip"));
}

TEST_F(LookupTest, RejectedElementDoesNotSuspendTheCondition)
{
    EXPECT_EQ(Found("3"),
              Ask("<cfg><a i='1'>1</a><a i='2'>2</a><a i='3'>3</a></cfg>", "cfg.a@i=3"));
}

TEST_F(LookupTest, CommentsAndTextDoNotSuspendTheCondition)
{
    EXPECT_EQ(Found("2"),
              Ask("<cfg>t<!--c--><?p?><a i='1'>1</a>t<a i='2'>2</a></cfg>", "cfg.a@i=2"));
}

TEST_F(LookupTest, EachLevelHasAConditionOfItsOwn)
{
    const std::string xml = "<cfg>"
                            "<a i='1'><b j='1'>11</b><b j='2'>12</b></a>"
                            "<a i='2'><b j='1'>21</b><b j='2'>22</b></a>"
                            "</cfg>";
    EXPECT_EQ(Found("12"), Ask(xml, "cfg.a@i=1.b@j=2"));
    EXPECT_EQ(Found("12\n22"), Ask(xml, "cfg.a.b@j=2"));
}

TEST_F(LookupTest, EmptyConditionNarrowsNothing)
{
    EXPECT_EQ(Found("10.0.0.1\n10.0.0.2"), Ask("cfg.net@.ip"));
    EXPECT_EQ(Found("box"), Ask("cfg.name@"));
}

TEST_F(ConditionTest, ComparesTheAttributesWholeText)
{
    EXPECT_TRUE(Accepts("a='1'", "a=1"));
    EXPECT_FALSE(Accepts("a='12'", "a=1"));
    EXPECT_FALSE(Accepts("a='1'", "a=12"));
    EXPECT_FALSE(Accepts("a='x'", "a=X"));
    EXPECT_FALSE(Accepts("A='1'", "a=1"));
    EXPECT_FALSE(Accepts("a='1'", "a= 1"));
    EXPECT_FALSE(Accepts("b='1'", "a=1"));
}

TEST_F(ConditionTest, ValueMayBeEmpty)
{
    EXPECT_TRUE(Accepts("a=''", "a="));
    EXPECT_FALSE(Accepts("a='1'", "a="));
    EXPECT_FALSE(Accepts("b=''", "a="));
}

TEST_F(ConditionTest, ValueMayContainFurtherEqualsSignsAndAts)
{
    EXPECT_TRUE(Accepts("a='b=c'", "a=b=c"));
    EXPECT_FALSE(Accepts("a='b'", "a=b=c"));
    EXPECT_TRUE(Accepts("a='x@y@z'", "a=x@y@z"));
}

TEST_F(ConditionTest, TermWithoutEqualsSignNeverHolds)
{
    EXPECT_FALSE(Accepts("a='1'", "a"));
    EXPECT_FALSE(Accepts("a=''", "a"));
    EXPECT_TRUE(Accepts("a='1'", "a|a=1"));
}

TEST_F(ConditionTest, EmptyAttributeNameNeverHolds)
{
    EXPECT_FALSE(Accepts("a='1'", "=1"));
    EXPECT_FALSE(Accepts("a='1'", "="));
    EXPECT_FALSE(Accepts("a=''", "="));
}

TEST_F(ConditionTest, AttributeNameMayHaveAnyLength)
{
    for (const std::size_t length : {1u, 62u, 63u, 64u, 65u, 1000u})
    {
        const std::string name(length, 'n');
        EXPECT_TRUE(Accepts(name + "='1'", name + "=1")) << length;
        EXPECT_FALSE(Accepts(name + "='2'", name + "=1")) << length;
        EXPECT_FALSE(Accepts(name + "n='1'", name + "=1")) << length;
        EXPECT_TRUE(Accepts("a='1' " + name + "='1'", "a=1&" + name + "=1")) << length;
        EXPECT_FALSE(Accepts("a='1' " + name + "='2'", "a=1&" + name + "=1")) << length;
    }
}

TEST_F(ConditionTest, OrNeedsOneTerm)
{
    EXPECT_TRUE(Accepts("a='1' b='x'", "a=1|b=2"));
    EXPECT_TRUE(Accepts("a='x' b='2'", "a=1|b=2"));
    EXPECT_FALSE(Accepts("a='x' b='x'", "a=1|b=2"));
}

TEST_F(ConditionTest, AndNeedsBothTerms)
{
    EXPECT_TRUE(Accepts("a='1' b='2'", "a=1&b=2"));
    EXPECT_FALSE(Accepts("a='1' b='x'", "a=1&b=2"));
    EXPECT_FALSE(Accepts("a='x' b='2'", "a=1&b=2"));
}

TEST_F(ConditionTest, AndBeforeAnOrBelongsToTheTermsValue)
{
    // Read as: a has the value "1&b=2", or c has the value 3.
    EXPECT_TRUE(Accepts("a='1&amp;b=2'", "a=1&b=2|c=3"));
    EXPECT_TRUE(Accepts("c='3'", "a=1&b=2|c=3"));
    EXPECT_FALSE(Accepts("a='1' b='2'", "a=1&b=2|c=3"));
}

TEST_F(ConditionTest, TermsCombineFromLeftToRight)
{
    // (a or b) and c
    EXPECT_TRUE(Accepts("a='1' c='1'", "a=1|b=1&c=1"));
    EXPECT_TRUE(Accepts("b='1' c='1'", "a=1|b=1&c=1"));
    EXPECT_FALSE(Accepts("a='1'", "a=1|b=1&c=1"));
    EXPECT_FALSE(Accepts("c='1'", "a=1|b=1&c=1"));
    // a and b, rejected at once when it fails; otherwise (a and b) and c
    EXPECT_TRUE(Accepts("a='1' b='1' c='1'", "a=1&b=1&c=1"));
    EXPECT_FALSE(Accepts("a='1' b='1'", "a=1&b=1&c=1"));
    // ((a or b) or c)
    EXPECT_TRUE(Accepts("c='1'", "a=1|b=1|c=1"));
    EXPECT_TRUE(Accepts("a='1'", "a=1|b=1|c=1"));
}

TEST_F(ConditionTest, SeparatorAtTheEndAddsNoTerm)
{
    EXPECT_TRUE(Accepts("a='1'", "a=1|"));
    EXPECT_FALSE(Accepts("a='2'", "a=1|"));
    EXPECT_TRUE(Accepts("a='1'", "a=1&"));
    EXPECT_FALSE(Accepts("a='2'", "a=1&"));
}

TEST_F(ConditionTest, SeparatorAtTheFrontMakesATermThatFails)
{
    EXPECT_TRUE(Accepts("a='1'", "|a=1"));
    EXPECT_FALSE(Accepts("a='1'", "&a=1"));
    EXPECT_FALSE(Accepts("a='1'", "|"));
    EXPECT_FALSE(Accepts("a='1'", "&"));
    EXPECT_TRUE(Accepts("a='1'", "||a=1"));
}

TEST_F(ConditionTest, AttributesAreReadTermByTermUntilOneRejects)
{
    // Values that the engine has to put together: reading them shows.
    Load("<!DOCTYPE cfg [<!ENTITY i '1'>]><cfg><e a='&i;' b='2&i;' c='3&i;'>v</e></cfg>");
    {
        EngineCalls calls;
        m_reader->GetValue("cfg.e@a=1&b=x&c=31");
        EXPECT_EQ(std::vector<std::string>({"a", "b"}), calls.PropertiesRead());
    }
    {
        EngineCalls calls;
        m_reader->GetValue("cfg.e@a=1|b=x|c=31");
        EXPECT_EQ(std::vector<std::string>({"a", "b", "c"}), calls.PropertiesRead());
    }
}

TEST_F(ConditionTest, AttributeIsFoundWhateverItsPrefixAndByItsDefault)
{
    EXPECT_EQ(Found("v"), Ask("<cfg xmlns:p='urn:p'><e p:a='1'>v</e></cfg>", "cfg.e@a=1"));
    const std::string head = "<!DOCTYPE cfg [<!ATTLIST e a CDATA 'x'>]>";
    EXPECT_EQ(Found("v"), Ask(head + "<cfg><e>v</e></cfg>", "cfg.e@a=x"));
    EXPECT_EQ(Nothing(-2), Ask(head + "<cfg><e a='y'>v</e></cfg>", "cfg.e@a=x"));
}

TEST_F(ConditionTest, AttributeTextIsComparedWithItsEntitiesReplaced)
{
    EXPECT_TRUE(Accepts("a='&lt;x&#33;'", "a=<x!"));
    const std::string head = "<!DOCTYPE cfg [<!ENTITY e 'mid'>]>";
    EXPECT_EQ(Found("v"), Ask(head + "<cfg><e a='x&e;y'>v</e></cfg>", "cfg.e@a=xmidy"));
}

TEST_F(ConditionTest, ManyTermsAreEvaluated)
{
    std::string ors;
    std::string ands;
    for (int i = 0; i != 10000; ++i)
    {
        ors += "a=0|";
        ands += "a=1&";
    }
    EXPECT_TRUE(Accepts("a='1'", ors + "a=1"));
    EXPECT_FALSE(Accepts("a='2'", ors + "a=1"));
    EXPECT_TRUE(Accepts("a='1'", ands + "a=1"));
    EXPECT_FALSE(Accepts("a='1'", ands + "a=2"));
}

// --- Appending

TEST_F(LookupTest, AppendsToWhatTheCallerPassedIn)
{
    std::string value = "old";
    EXPECT_EQ(0, m_reader->GetValue("cfg.name", value));
    EXPECT_EQ("old\nbox", value);
    EXPECT_EQ(0, m_reader->GetValue("cfg.net.ip", value));
    EXPECT_EQ("old\nbox\n10.0.0.1\n10.0.0.2", value);
}

TEST_F(LookupTest, LeavesTheCallersStringAloneWhenNothingIsFound)
{
    for (const char* const key : {"", "cfg", "cfg.", "cfg.missing", "cfg.net", "other.name"})
    {
        std::string value = "old";
        m_reader->GetValue(key, value);
        EXPECT_EQ("old", value) << key;
    }
}

TEST_F(LookupTest, KeyAndValueMayBeOneString)
{
    Load("<cfg><net><ip>" + std::string(100, 'a') + "</ip></net><net><ip>b</ip></net></cfg>");
    std::string both = "cfg.net.ip";
    EXPECT_EQ(0, m_reader->GetValue(both, both));
    EXPECT_EQ("cfg.net.ip\n" + std::string(100, 'a') + "\nb", both);

    std::string rest = "net.ip";
    unsigned found = 0;
    EXPECT_EQ(-2, m_reader->XMLGetValue(Root(), rest, rest, found));
    EXPECT_EQ("net.ip\n" + std::string(100, 'a') + "\nb", rest);
    EXPECT_EQ(1u, found);
}

// --- Without a document, without a root element

TEST_F(LookupTest, WithoutADocumentIsMissing)
{
    CXMLReader reader;
    ExpectMissing(
        reader, "cfg.name",
        {Trace("GetValue", "Key cfg.name"), Error("GetValue", kNoMemberDocument)},
        {Trace("GetValue", "+"), Error("GetValue", kNoMemberDocument), Trace("GetValue", "-")});
}

TEST_F(LookupTest, EmptyKeyIsMissing)
{
    ExpectMissing(
        *m_reader, "", {Trace("GetValue", "Key "), Error("GetValue", kNoMemberDocument)},
        {Trace("GetValue", "+"), Error("GetValue", kNoMemberDocument), Trace("GetValue", "-")});
}

TEST_F(LookupTest, WithoutARootElementIsMissing)
{
    const xmlNodePtr root = Root();
    xmlUnlinkNode(root);
    xmlFreeNode(root);
    for (const char* const key : {"cfg.name", "cfg"})
    {
        ExpectMissing(
            *m_reader, key,
            {Trace("GetValue", std::string("Key ") + key), Value("GetValue", "Parsed Value :: ")},
            {Trace("GetValue", "+"), Value("GetValue", std::string("Key is ") + key),
             Error("GetValue", "Root Node ptr is NULL"), Value("GetValue", "Parsed Value :: old"),
             Trace("GetValue", "-")});
    }
}

// --- Records

TEST_F(LookupTest, OneArgumentFormLogsTheKeyAndTheResultAndNothingOfItsDescent)
{
    const Records all = {Trace("GetValue", "Key cfg.net.ip"),
                         Value("GetValue", "Parsed Value :: 10.0.0.1\n10.0.0.2")};
    ExpectRecords(all, [&] { m_reader->GetValue("cfg.net.ip"); });
}

TEST_F(LookupTest, TwoArgumentFormLogsEachLevelInItsPlace)
{
    const Records all = {Trace("GetValue", "+"),
                         Value("GetValue", "Key is cfg.net.ip"),
                         Trace("XMLGetValue", "+"),
                         Value("XMLGetValue", "Key :: net.ip"),
                         Trace("XMLGetValue", "+"),
                         Value("XMLGetValue", "Key :: ip"),
                         Trace("XMLGetValue", "-"),
                         Trace("XMLGetValue", "+"),
                         Value("XMLGetValue", "Key :: ip"),
                         Trace("XMLGetValue", "-"),
                         Trace("XMLGetValue", "-"),
                         Value("GetValue", "Parsed Value :: old\n10.0.0.1\n10.0.0.2"),
                         Trace("GetValue", "-")};
    ExpectRecords(all,
                  [&]
                  {
                      std::string value = "old";
                      EXPECT_EQ(0, m_reader->GetValue("cfg.net.ip", value));
                  });
}

TEST_F(LookupTest, ErrorsAndXPathBitsAloneLetNothingThrough)
{
    for (const unsigned mask : {kMaskError, kMaskXPath})
    {
        LogRecorder log(mask);
        std::string value;
        m_reader->GetValue("cfg.missing", value);
        m_reader->GetValue("other.name", value);
        m_reader->GetValue("cfg", value);
        EXPECT_EQ(Records(), log.Take());
    }
}

TEST_F(LookupTest, BadKeysAreLoggedLikeOthersAndWithoutAnError)
{
    LogRecorder log;
    std::string value = "old";
    EXPECT_EQ(7, m_reader->GetValue("cfg", value));
    EXPECT_EQ(Records({Trace("GetValue", "+"), Value("GetValue", "Key is cfg"),
                       Value("GetValue", "Parsed Value :: old"), Trace("GetValue", "-")}),
              log.Take());
    EXPECT_EQ(0, m_reader->GetValue("other.name", value));
    EXPECT_EQ(Records({Trace("GetValue", "+"), Value("GetValue", "Key is other.name"),
                       Value("GetValue", "Parsed Value :: old"), Trace("GetValue", "-")}),
              log.Take());
    EXPECT_EQ(-2, m_reader->GetValue("cfg.", value));
    EXPECT_EQ(Records({Trace("GetValue", "+"), Value("GetValue", "Key is cfg."),
                       Trace("XMLGetValue", "+"), Trace("XMLGetValue", "-"),
                       Value("GetValue", "Parsed Value :: old"), Trace("GetValue", "-")}),
              log.Take());
    for (const char* const key : {"cfg", "cfg.", "other.name", "cfg.missing"})
    {
        EXPECT_EQ("", m_reader->GetValue(key));
        EXPECT_EQ(Records({Trace("GetValue", std::string("Key ") + key),
                           Value("GetValue", "Parsed Value :: ")}),
                  log.Take());
    }
}

TEST_F(LookupTest, KeyAndValueReachTheLogAsArgumentsOnly)
{
    Load("<cfg><a>%n%s%d</a></cfg>");
    LogRecorder log;
    EXPECT_EQ("", m_reader->GetValue("cfg.%n%s"));
    EXPECT_EQ(Records({Trace("GetValue", "Key cfg.%n%s"), Value("GetValue", "Parsed Value :: ")}),
              log.Take());
    std::string value;
    EXPECT_EQ(0, m_reader->GetValue("cfg.a", value));
    EXPECT_EQ("%n%s%d", value);
    const Records records = log.Take();
    ASSERT_EQ(7u, records.size());
    EXPECT_EQ(Value("GetValue", "Parsed Value :: %n%s%d"), records[5]);
    EXPECT_EQ(-2, m_reader->GetValue("cfg.%s%s%s.%n", value));
}

TEST_F(LookupTest, StatusesAreReturnedAndNeverStoredInErrno)
{
    CXMLReader empty;
    std::string value;
    errno = 1234;
    for (const char* const key : {"", "cfg", "cfg.missing", "other.name", "cfg.name"})
    {
        m_reader->GetValue(key, value);
        empty.GetValue(key, value);
    }
    EXPECT_EQ(1234, errno);
}

// Who reads the log of a crash sees which operation was looking.
TEST_F(LookupTest, LogsItsEntryBeforeItLooks)
{
    CXMLReader reader;
    std::string value;
    LogRecorder log(kMaskTrace);
    LogRecorder::OnNextCall([&] { reader.ParseFile(m_folder.Path("cfg.xml")); });
    EXPECT_EQ(0, reader.GetValue("cfg.name", value));
    EXPECT_EQ("box", value);
}

TEST_F(LookupTest, AMaskThatChangesTakesEffectAtTheNextOperation)
{
    LogRecorder log(kMaskNone);
    m_reader->GetValue("cfg.name");
    EXPECT_EQ(Records(), log.Take());
    LogRecorder::SetMask(kMaskTrace);
    m_reader->GetValue("cfg.name");
    EXPECT_EQ(Records({Trace("GetValue", "Key cfg.name")}), log.Take());
}

// --- The recursions, called directly

TEST_F(LookupTest, RecursionAnswersANullNodeOrAnEmptyKeyAtOnce)
{
    ExpectRecords({}, [&] { EXPECT_EQ("", m_reader->XMLGetValue(nullptr, "name")); });
    ExpectRecords({}, [&] { EXPECT_EQ("", m_reader->XMLGetValue(Root(), "")); });

    const Records traceOnly = {Trace("XMLGetValue", "+"), Trace("XMLGetValue", "-")};
    std::string value = "old";
    unsigned found = 5;
    ExpectRecords(traceOnly,
                  [&] { EXPECT_EQ(22, m_reader->XMLGetValue(nullptr, "name", value, found)); });
    ExpectRecords(traceOnly,
                  [&] { EXPECT_EQ(22, m_reader->XMLGetValue(Root(), "", value, found)); });
    EXPECT_EQ("old", value);
    EXPECT_EQ(5u, found);
}

TEST_F(LookupTest, RecursionSearchesBelowAnyNode)
{
    LogRecorder log;
    EXPECT_EQ("10.0.0.1", m_reader->XMLGetValue(Root()->children, "ip"));
    EXPECT_EQ(Records(), log.Take());
    const auto document = static_cast<xmlDocPtr>(m_reader->GetDataPtr());
    EXPECT_EQ("box", m_reader->XMLGetValue(reinterpret_cast<xmlNodePtr>(document), "cfg.name"));
    EXPECT_EQ("", m_reader->XMLGetValue(Root()->children->children->children, "ip"));
}

TEST_F(LookupTest, AppendingRecursionReportsByFoundAndNotByItsStatus)
{
    std::string value;
    unsigned found = 0;
    EXPECT_EQ(-2, m_reader->XMLGetValue(Root(), "name", value, found));
    EXPECT_EQ("box", value);
    EXPECT_EQ(1u, found);

    found = 0;
    EXPECT_EQ(-2, m_reader->XMLGetValue(Root(), "missing", value, found));
    EXPECT_EQ(0u, found);

    // The status of the last descent, which was given an empty key.
    EXPECT_EQ(22, m_reader->XMLGetValue(Root(), "net.", value, found));
    EXPECT_EQ(0u, found);
    EXPECT_EQ(22, m_reader->XMLGetValue(Root(), "name.", value, found));
    EXPECT_EQ(1u, found);
    EXPECT_EQ("box\nbox", value);
}

TEST_F(LookupTest, AppendingRecursionSetsFoundToOneWhateverItWas)
{
    std::string value;
    unsigned found = 7;
    m_reader->XMLGetValue(Root(), "net.ip", value, found);
    EXPECT_EQ(1u, found);
}

// --- Keys of every kind

TEST_F(LookupTest, NulBytesAreBytesLikeOthersAndMatchNoName)
{
    using namespace std::string_literals;
    for (const std::string& key : {"cfg.name\0"s, "cfg.name\0x"s, "cfg.\0"s, "cfg.na\0me"s,
                                   "cfg.net@id\0=1.ip"s, "cfg.net@id=1\0.ip"s, "cfg.net@\0=1.ip"s})
    {
        EXPECT_EQ(Nothing(-2), Ask(key)) << key.size();
    }
    EXPECT_EQ(Nothing(0), Ask("cfg\0.name"s));
    EXPECT_EQ(Nothing(0), Ask("\0.name"s));
    EXPECT_EQ(Nothing(7), Ask("\0"s));
}

TEST_F(LookupTest, ElementWithoutANameIsNeverMeant)
{
    // What the engine makes of an element when it runs out of memory while parsing.
    const xmlNodePtr root = Root();
    const xmlChar* const names[] = {root->name, root->children->name};
    root->children->name = nullptr;
    EXPECT_EQ(Found("10.0.0.2"), Ask("cfg.net.ip"));
    EXPECT_EQ(Nothing(-2), Ask("cfg..ip"));
    root->name = nullptr;
    EXPECT_EQ(Nothing(0), Ask("cfg.name"));
    EXPECT_EQ(Nothing(0), Ask(".name"));
    root->children->name = names[1];
    root->name = names[0];
}

TEST_F(LookupTest, BytesThatAreNoUtf8MatchNothing)
{
    for (const char* const key :
         {"cfg.\xFF", "cfg.\xC3\x28", "cfg.net@\xFF=1.ip", "cfg.net@id=\xFF.ip"})
    {
        EXPECT_EQ(Nothing(-2), Ask(key));
    }
}

TEST_F(LookupTest, SeveralAtsBelongToTheCondition)
{
    EXPECT_EQ(Nothing(-2), Ask("cfg.net@@id=1.ip"));
    EXPECT_EQ(Nothing(-2), Ask("cfg.net@id=1@.ip"));
    EXPECT_EQ(Nothing(-2), Ask("cfg.net@id=1@id=1.ip"));
}

TEST_F(LookupTest, KeysOfAMegabyteGetTheirAnswer)
{
    const std::size_t size = 1 << 20;
    EXPECT_EQ(Nothing(7), Ask(std::string(size, 'x')));
    EXPECT_EQ(Nothing(-2), Ask("cfg." + std::string(size, 'x')));
    EXPECT_EQ(Nothing(-2), Ask("cfg." + std::string(size, '.')));
    EXPECT_EQ(Nothing(-2), Ask("cfg.net@" + std::string(size, '&') + ".ip"));
    EXPECT_EQ(Nothing(-2), Ask("cfg.net@" + std::string(size, '=') + ".ip"));
    EXPECT_EQ(Nothing(-2), Ask("cfg.net@" + std::string(size, 'n') + "=1.ip"));
    EXPECT_EQ(Nothing(-2), Ask("cfg.net@" + std::string(size, '|') + ".ip"));
    EXPECT_EQ(Found("10.0.0.1"), Ask("cfg.net@" + std::string(size, '|') + "id=1.ip"));
}

TEST_F(LookupTest, KeysOfAMegabyteAreNotCopied)
{
    const std::size_t size = 1 << 20;
    const std::string keys[] = {
        "cfg." + std::string(size, 'x'), "cfg.net@" + std::string(size, '&') + ".ip",
        "cfg.net@id=" + std::string(size, 'v') + ".ip", "cfg." + std::string(size, '.')};
    for (const std::string& key : keys)
    {
        std::string value;
        const NewCounter heap;
        m_reader->GetValue(key, value);
        EXPECT_EQ(0u, heap.Requests()) << key.substr(0, 12);
    }
}

TEST_F(LookupTest, DepthOfTheParsersLimitIsReached)
{
    std::string open;
    std::string close;
    std::string key;
    for (int level = 0; level != 250; ++level)
    {
        open += "<a>";
        close += "</a>";
        key += level == 0 ? "a" : ".a";
    }
    EXPECT_EQ(Found("v"), Ask(open + "v" + close, key));
}

// --- Allocation

TEST_F(LookupTest, SuccessfulLookupAllocatesNothingBeyondTheResult)
{
    const std::string keys[] = {"cfg.net@id=2.ip", "cfg.net@id=3|id=1.ip", "cfg.name", "cfg.net.ip",
                                "cfg.net@" + std::string(100, 'n') + "=1|id=1.ip"};
    for (const std::string& key : keys)
    {
        std::string value;
        value.reserve(1000);
        const NewCounter heap;
        const int status = m_reader->GetValue(key, value);
        EXPECT_EQ(0u, heap.Requests()) << key;
        EXPECT_EQ(0, status) << key;
    }
}

TEST_F(LookupTest, EngineAllocatesNothing)
{
    std::string value;
    value.reserve(1000);
    const EngineMemory memory;
    EXPECT_EQ(0, m_reader->GetValue("cfg.net.ip", value));
    EXPECT_EQ(0, m_reader->GetValue("cfg.net@id=2.ip", value));
    EXPECT_EQ(0u, memory.Requests());
}

TEST_F(LookupTest, MemoryExhaustedWhileTheResultGrowsIsPassedOn)
{
    Load("<cfg><a>" + std::string(100, 'x') + "</a></cfg>");
    NewCounter heap;
    std::string value = "old";
    LogRecorder log(kMaskNone);
    heap.FailAt(1);
    EXPECT_THROW(m_reader->GetValue("cfg.a", value), std::bad_alloc);
    heap.FailAt(1);
    EXPECT_THROW(m_reader->GetValue("cfg.a"), std::bad_alloc);
    heap.FailAt(0);
    EXPECT_EQ(0, m_reader->GetValue("cfg.a", value)); // the reader is as good as before
}

TEST_F(LookupTest, ACallThatAnExceptionLeavesLogsNoExitTrace)
{
    Load("<cfg><a>" + std::string(100, 'x') + "</a></cfg>");
    std::string value;
    LogRecorder log(kMaskTrace);
    LogRecorder::ThrowAt(2); // where the descent begins
    EXPECT_THROW(m_reader->GetValue("cfg.a", value), LogFailure);
    EXPECT_EQ(Records({Trace("GetValue", "+")}), log.Take());
}
