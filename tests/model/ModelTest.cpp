// The model answers what the rules say, and the tools around it keep and shrink cases faithfully.

#include "model/Model.h"
#include "model/Case.h"
#include "model/Generate.h"
#include "model/Shrink.h"

#include "support/Engine.h"
#include "support/ParsedDocument.h"

#include <gtest/gtest.h>

using namespace kxmodel;
using namespace kxtest;

namespace
{

class ModelTest : public ParsedDocument
{
protected:
    /** @return the text of both forms and the status. */
    std::string Found(const std::string& xml, const std::string& key)
    {
        Load(xml);
        Model model(m_document);
        std::string value;
        const int status = model.GetValue(key, value);
        return model.GetValue(key) + "/" + std::to_string(status) + " " + value;
    }

    /** @return the status and the document. */
    std::string Updated(const std::string& xml, const std::string& key)
    {
        Load(xml);
        const int status = Model(m_document).SetValue(key, "new");
        const std::string text = Serialized(m_document);
        return std::to_string(status) + text.substr(text.find('\n'), text.rfind('\n') - 38);
    }
};

const std::string kName = "<name>box</name>";
const std::string kNets = "<net id='1'><ip>10.0.0.1</ip></net><net id='2'><ip>10.0.0.2</ip></net>";
const std::string kCfg = "<cfg>" + kNets + kName + "</cfg>";

const std::string kPair = "<p n=\"1\"><v>a</v></p><p n=\"2\"><v>b</v></p>";

} // namespace

TEST_F(ModelTest, LooksUp)
{
    EXPECT_EQ("box/0 box", Found(kCfg, "cfg.name"));
    EXPECT_EQ("10.0.0.1\n10.0.0.2/0 10.0.0.1\n10.0.0.2", Found(kCfg, "cfg.net.ip"));
    EXPECT_EQ("10.0.0.2/0 10.0.0.2", Found(kCfg, "cfg.net@id=2.ip"));
    EXPECT_EQ("10.0.0.1/0 10.0.0.1", Found(kCfg, "cfg.net@id=3|id=1.ip"));
    EXPECT_EQ("10.0.0.1/0 10.0.0.1", Found("<cfg>" + kName + kNets + "</cfg>", "cfg.net@id=3.ip"));
    EXPECT_EQ("12/0 1\n2", Found("<cfg><net><ip>1</ip><ip>2</ip></net></cfg>", "cfg.net.ip"));
    EXPECT_EQ("/-2 ", Found(kCfg, "cfg.net"));
    EXPECT_EQ("/0 ", Found(kCfg, "other.name"));
    EXPECT_EQ("/7 ", Found(kCfg, "cfg"));
    EXPECT_EQ("/-2 ", Found(kCfg, "cfg."));
    EXPECT_EQ("/22 ", Found(kCfg, ""));
}

TEST_F(ModelTest, Updates)
{
    EXPECT_EQ("0\n<cfg><a>new</a></cfg>", Updated("<cfg><a>1</a></cfg>", "cfg.a"));
    EXPECT_EQ("-2\n<cfg><a>1</a></cfg>", Updated("<cfg><a>1</a></cfg>", "cfg.b"));
    EXPECT_EQ("-2\n<cfg><a/></cfg>", Updated("<cfg><a/></cfg>", "cfg.a"));
    EXPECT_EQ("0\n<cfg><x><a>new</a></x><a>new</a></cfg>",
              Updated("<cfg><x><a>1</a></x><a>2</a></cfg>", "cfg.a"));
    EXPECT_EQ("0\n<cfg><p n=\"1\"><v>a</v></p><p n=\"2\"><v>new</v></p></cfg>",
              Updated("<cfg>" + kPair + "</cfg>", "cfg.p@n=2.v"));
    EXPECT_EQ("0\n<cfg><z/><p n=\"1\"><v>new</v></p><p n=\"2\"><v>new</v></p></cfg>",
              Updated("<cfg><z/>" + kPair + "</cfg>", "cfg.p@n=2.v"));
    EXPECT_EQ("-2\n<cfg><p n=\"1\">v</p><p n=\"2\">w</p></cfg>",
              Updated("<cfg><p n=\"1\">v</p><p n=\"2\">w</p></cfg>", "cfg.p@n=2"));
    EXPECT_EQ("22\n<cfg><a>new</a></cfg>", Updated("<cfg><a>1</a></cfg>", "cfg.a."));
}

TEST(Cases, SurviveBeingWrittenDown)
{
    using namespace std::string_literals;
    Case subject;
    subject.document = "<a>\n\n</a>";
    subject.operations = {{Call::Append, 0x80000200u, 3, "a.\0\t\n\\x\xFF"s, "\r"},
                          {Call::Set, 0, 0, "", ""}};
    const std::string text = ToText(subject);
    EXPECT_EQ("append\t80000200\t3\ta.\\x00\\x09\\x0a\\x5cx\\xff\t\\x0d\n"
              "set\t0\t0\t\t\n"
              "\n"
              "<a>\n\n</a>",
              text);
    EXPECT_EQ(text, ToText(FromText(text)));
    EXPECT_EQ("a.\0\t\n\\x\xFF"s, FromText(text).operations.at(0).key);
    EXPECT_EQ(Call::Append, FromText(text).operations.at(0).call);
    EXPECT_EQ(0x80000200u, FromText(text).operations.at(0).mask);
}

TEST(Cases, ShrinkToWhatFails)
{
    const auto fails = [](const Case& subject)
    {
        bool hasKey = false;
        for (const Operation& operation : subject.operations)
        {
            hasKey = hasKey || operation.key.find('@') != std::string::npos;
        }
        return hasKey && subject.document.find("<b>") != std::string::npos;
    };
    Case failing = Generated(1);
    failing.document += "<b>";
    failing.operations.push_back({Call::Get, 0, 0, "cfg.a@n=1", "value"});
    const Case shrunk = Shrunk(failing, fails);
    EXPECT_EQ("<b>", shrunk.document);
    ASSERT_EQ(1u, shrunk.operations.size());
    EXPECT_EQ("@", shrunk.operations[0].key);
    EXPECT_EQ("", shrunk.operations[0].value);
}

TEST(Cases, AreTheSameForTheSameSeed)
{
    EXPECT_EQ(ToText(Generated(7)), ToText(Generated(7)));
    EXPECT_NE(ToText(Generated(7)), ToText(Generated(8)));
}
