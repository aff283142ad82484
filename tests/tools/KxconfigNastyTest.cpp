#include "ToolTest.h"

#include "support/Memory.h"

#include <nlohmann/json.hpp>

#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>

using namespace kxtest;
using testing::HasSubstr;
using testing::StartsWith;

namespace
{

/** Every command on difficult files. */
class KxconfigNasty : public ToolTest
{
protected:
    static std::vector<std::vector<std::string>> VerbsOn(const std::string& file)
    {
        return {{"get", file, "cfg.a"},     {"set", file, "cfg.a", "x"},
                {"explain", file, "cfg.a"}, {"explain", "--set", file, "cfg.a"},
                {"check", "--notes", file}, {"keys", file},
                {"find", file, "//a"}};
    }

    static nlohmann::json InJson(std::vector<std::string> arguments)
    {
        arguments.insert(arguments.begin(), "--json");
        const Outcome outcome = Tool(arguments);
        EXPECT_EQ("", outcome.err);
        const nlohmann::json answer = nlohmann::json::parse(outcome.out);
        EXPECT_EQ(outcome.status, answer.at("status"));
        return answer;
    }

    /** Expects status 3 and one line that begins with @p start, from all verbs and in JSON. */
    static void ExpectBadFile(const std::string& file, const std::string& start)
    {
        for (const std::vector<std::string>& arguments : VerbsOn(file))
        {
            SCOPED_TRACE(arguments[0] + " " + file);
            const Outcome outcome = Tool(arguments);
            EXPECT_EQ(3, outcome.status);
            EXPECT_EQ("", outcome.out);
            EXPECT_THAT(outcome.err, StartsWith("kxconfig: " + start));
            EXPECT_EQ(1, std::count(outcome.err.begin(), outcome.err.end(), '\n'));
            const nlohmann::json answer = InJson(arguments);
            EXPECT_EQ(3, answer.at("status"));
            ASSERT_EQ(1u, answer.at("messages").size());
            EXPECT_THAT(answer.at("messages")[0].get<std::string>(), StartsWith(start));
        }
    }
};

} // namespace

TEST_F(KxconfigNasty, FilesThatCannotBeRead)
{
    ExpectBadFile("", "cannot read \"\": ");
    ExpectBadFile(m_folder.Path("missing"), "cannot read " + m_folder.Path("missing") + ": ");
    ExpectBadFile(m_folder.Path(""), "cannot read " + m_folder.Path("") + ": Is a directory");
}

TEST_F(KxconfigNasty, FilesThatAreNoXmlAreReportedWithTheLine)
{
    const auto expectOnLine = [this](int line, const std::string& bytes)
    {
        const std::string file = m_folder.Write("bad.xml", bytes);
        ExpectBadFile(file, file + ":" + std::to_string(line) + ": ");
    };
    expectOnLine(1, "");
    expectOnLine(1, "\x7F"
                    "ELF\x02\x01");
    expectOnLine(3, "<cfg>\n<a>1</a>\n<b></c>\n</cfg>");
    expectOnLine(3, "<cfg>\n<a>1</a>\n<b>");
    expectOnLine(2, "<cfg>\n<a>gr\xFCn</a></cfg>");
    expectOnLine(2, "<cfg>\n<a>\x1B</a></cfg>");
    expectOnLine(2, "<cfg>\n<a>&nowhere;</a></cfg>");
    std::string deep = "<cfg>\n";
    for (int i = 0; i != 5000; ++i)
    {
        deep += "<a>";
    }
    expectOnLine(2, deep);
}

TEST_F(KxconfigNasty, DeclarationsOfEveryKind)
{
    const std::string kinds[] = {"<!NOTATION a SYSTEM 'v'>",
                                 "<!-- a -->",
                                 "<?a b?>",
                                 "<!ELEMENT cfg ANY>",
                                 "<!ATTLIST cfg a CDATA #IMPLIED>",
                                 "<!ENTITY a 'b'>",
                                 "<!ENTITY % a 'b'>",
                                 "<!ENTITY a SYSTEM 'b'>",
                                 "<!NOTATION a SYSTEM 'v'><!ENTITY b SYSTEM 'c' NDATA a>"};
    for (const std::string& kind : kinds)
    {
        const std::string file =
            m_folder.Write("cfg.xml", "<!DOCTYPE cfg [" + kind + "]><cfg><a>1</a></cfg>");
        for (std::vector<std::string> arguments : VerbsOn(file))
        {
            SCOPED_TRACE(arguments[0] + " " + kind);
            EXPECT_LE(Tool(arguments).status, arguments[0] == "check" ? 1 : 0);
            EXPECT_TRUE(InJson(arguments).at("messages").empty());
        }
        EXPECT_THAT(Tool({"find", file, "//node()|//@*|//namespace::*"}).out,
                    HasSubstr("\n/cfg/a/text() text \"x\"\n"));
    }
}

TEST_F(KxconfigNasty, FilesThatOthersMustNotRead)
{
    if (geteuid() != 0)
    {
        GTEST_SKIP() << "needs to run as the superuser, to become another user";
    }
    const std::string file = m_folder.Write("cfg.xml", "<cfg><a>1</a></cfg>");
    ASSERT_EQ(0, chmod(m_folder.Path("").c_str(), 0755));
    ASSERT_EQ(0, chmod(file.c_str(), 0));
    for (std::vector<std::string> arguments : VerbsOn(file))
    {
        arguments.insert(arguments.begin(), KX_CONFIG_TOOL);
        const Outcome outcome = RunProgram(arguments, {}, 65534);
        EXPECT_EQ(3, outcome.status);
        EXPECT_EQ("kxconfig: cannot read " + file + ": Permission denied\n", outcome.err);
    }
}

TEST_F(KxconfigNasty, KeysThatAreMalformedOrNameNothing)
{
    const std::string file = m_folder.Write("cfg.xml", "<cfg><b i='1'><c>1</c></b></cfg>");
    const std::pair<const char*, int> keys[] = {
        {"", 2},           {"cfg", 2},          {".", 1},           {"..", 1},
        {".b", 1},         {"cfg.", 1},         {"cfg..c", 1},      {"cfg.b@i.c", 1},
        {"cfg.b@=1.c", 1}, {"cfg.b\n.c", 1},    {"cfg.b .c", 1},    {"cfg.\x1B[31m", 1},
        {"cfg.b@.c", 0},   {"cfg.b@i=1|.c", 0}, {"cfg.b@i=1&.c", 0}};
    for (const auto& [key, status] : keys)
    {
        SCOPED_TRACE(key);
        const Outcome outcome = Tool({"get", file, key});
        EXPECT_EQ(status, outcome.status);
        EXPECT_EQ(status == 0 ? "1\n" : "", outcome.out);
        EXPECT_EQ(status == 0 ? 0 : 1, std::count(outcome.err.begin(), outcome.err.end(), '\n'));
        EXPECT_EQ(std::string::npos, outcome.err.find('\x1B'));
        EXPECT_EQ(status, InJson({"get", file, key}).at("status"));
        EXPECT_EQ(status, InJson({"explain", file, key}).at("status"));
    }
}

TEST_F(KxconfigNasty, ValuesThatAreNoXml)
{
    const std::string xml = "<cfg><a>1</a></cfg>";
    const std::string file = m_folder.Write("cfg.xml", xml);
    for (const char* value : {"x\x1B[31m", "\x01", "\x1F", "caf\xE9", "\xC3", "\x80"})
    {
        const Outcome outcome = Tool({"set", file, "cfg.a", value});
        EXPECT_EQ(2, outcome.status);
        EXPECT_EQ(
            "kxconfig: the new text is not XML text: it contains control characters, or bytes that "
            "are not UTF-8\n",
            outcome.err);
        EXPECT_EQ(xml, ReadFile(file));
    }
    EXPECT_EQ(0, Tool({"set", file, "cfg.a", "caf\xC3\xA9\t\n\r"}).status);
}

TEST_F(KxconfigNasty, ALongValueAndALongAttribute)
{
    const std::string value(2000000, 'x');
    const std::string attribute(100000, 'y');
    const std::string file = m_folder.Write("long.xml", "<cfg><a>" + value + "</a><b i='" +
                                                            attribute + "'>1</b><b>2</b></cfg>");
    EXPECT_EQ(value + "\n", Tool({"get", file, "cfg.a"}).out);
    EXPECT_EQ("1\n", Tool({"get", file, "cfg.b@i=" + attribute}).out);
    EXPECT_EQ("cfg.a\t\"" + value + "\"\ncfg.b@i=" + attribute + "\t\"1\"\ncfg.b\t\"1\\n2\"\n",
              Tool({"keys", file}).out);
}

TEST_F(KxconfigNasty, NamesThatATerminalShouldNotBeShownAreEscaped)
{
    const std::pair<std::string, std::string> names[] = {
        {"caf\xC3\xA9 \xE2\x82\xAC \xED\x9F\xBF \xF0\x9F\x98\x80 \xF4\x8F\xBF\xBF",
         "caf\xC3\xA9 \xE2\x82\xAC \xED\x9F\xBF \xF0\x9F\x98\x80 \xF4\x8F\xBF\xBF"},
        {"a\nb\x1B\x7F\xC2\x9B", "a\\nb\\x1b\\x7f\\xc2\\x9b"},
        {"caf\xE9", "caf\\xe9"},
        {"\x80 \xBF", "\\x80 \\xbf"},                            // the rest of a character
        {"\xE2\x82 \xF0\x9F\x98", "\\xe2\\x82 \\xf0\\x9f\\x98"}, // the start of one
        {"\xC1\x9B \xE0\x82\x9B", "\\xc1\\x9b \\xe0\\x82\\x9b"}, // in too many bytes
        {"\xF0\x8F\xBF\xBF", "\\xf0\\x8f\\xbf\\xbf"},
        {"\xED\xA0\x80 \xF4\x90\x80\x80 \xF5",
         "\\xed\\xa0\\x80 \\xf4\\x90\\x80\\x80 \\xf5"}}; // none that there is
    for (const auto& [name, shown] : names)
    {
        ExpectComplaint(Tool({"get", m_folder.Path(name), "cfg.a"}), 3,
                        "cannot read " + m_folder.Path(shown) + ": No such file or directory");
    }
}

TEST_F(KxconfigNasty, RunningOutOfMemoryWhileLoading)
{
    const std::string file = m_folder.Write("cfg.xml", "<cfg><a b='1'>1</a><a b='2'>2</a></cfg>");
    std::size_t failures = 0;
    std::size_t unreported = 0;
    for (const std::string verb : {"get", "find"})
    {
        for (std::size_t n = 1; n != 30; ++n)
        {
            const kxtest::EngineMemory memory;
            kxtest::EngineMemory::FailAt(n);
            const Outcome outcome = Tool({verb, file, verb == "get" ? "cfg.a" : "/cfg/a"});
            const bool hasFailed = kxtest::EngineMemory::Failed();
            kxtest::EngineMemory::FailAt(0);
            failures += hasFailed && outcome.status == 4 ? 1 : 0;
            unreported += outcome.status == 3 ? 1 : 0;
        }
    }
    EXPECT_GT(failures, 20U);
    EXPECT_EQ(0U, unreported);
}

TEST_F(KxconfigNasty, RunningOutOfMemory)
{
    // As many keys as this, each with the long attribute, are 2 GB.
    std::string xml = "<cfg><b i='" + std::string(1000000, 'x') + "'>";
    for (int i = 0; i != 2000; ++i)
    {
        xml += "<c i='" + std::to_string(i) + "'>1</c>";
    }
    const std::string file = m_folder.Write("cfg.xml", xml + "</b><b i='2'>1</b></cfg>");
    const auto limited = [](const std::string& arguments)
    { return RunShell("ulimit -v 400000; exec " + InShell(KX_CONFIG_TOOL) + " " + arguments); };
    if (limited("--version").status != 0)
    {
        GTEST_SKIP()
            << "needs a program that runs in little address space, not an instrumented one";
    }
    ExpectComplaint(limited("diff '" + file + "' '" + file + "'"), 4, "out of memory");
    const Outcome outcome = limited("--json keys '" + file + "'");
    EXPECT_EQ(4, outcome.status);
    EXPECT_EQ("", outcome.err);
    const nlohmann::json answer = nlohmann::json::parse(outcome.out);
    EXPECT_EQ(4, answer.at("status"));
    EXPECT_EQ(nlohmann::json({"out of memory"}), answer.at("messages"));
    EXPECT_TRUE(answer.at("results").empty());
}
