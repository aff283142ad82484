#include "ToolTest.h"

#include "KxLog.h"

#include <libxml/parser.h>

#include <filesystem>

using namespace kxtest;

namespace
{

int g_reported = 0;

#if LIBXML_VERSION >= 21200
using EngineError = const xmlError*;
#else
using EngineError = xmlErrorPtr;
#endif

void CountReport(void* reported, EngineError)
{
    ++*static_cast<int*>(reported);
}

void CountPrinted(void* printed, const char*, ...)
{
    ++*static_cast<int*>(printed);
}

/** Settings of this process that are not the usual ones, and back again. */
class UnusualSettings
{
public:
    UnusualSettings()
        : m_lines(CountLines(0)), m_noLines(CountLines(0)), m_blanks(xmlKeepBlanksDefault(0))
    {
        xmlSetStructuredErrorFunc(&g_reported, CountReport);
        xmlSetGenericErrorFunc(&g_reported, CountPrinted);
        g_LumLogParams.xmlConfigParserMask = kMask;
    }

    ~UnusualSettings()
    {
        g_LumLogParams.xmlConfigParserMask = 0;
        xmlSetGenericErrorFunc(nullptr, m_print);
        xmlSetStructuredErrorFunc(nullptr, nullptr);
        xmlKeepBlanksDefault(m_blanks);
        CountLines(m_lines);
    }

    UnusualSettings(const UnusualSettings&) = delete;
    UnusualSettings& operator=(const UnusualSettings&) = delete;

    void ExpectInPlace() const
    {
        EXPECT_EQ(kMask, g_LumLogParams.xmlConfigParserMask);
        EXPECT_EQ(CountReport, xmlStructuredError);
        EXPECT_EQ(&g_reported, xmlStructuredErrorContext);
        EXPECT_EQ(CountPrinted, xmlGenericError);
        EXPECT_EQ(&g_reported, xmlGenericErrorContext);
        EXPECT_EQ(0, xmlKeepBlanksDefault(0));
        EXPECT_EQ(m_noLines, CountLines(0));
        EXPECT_EQ(nullptr, xmlGetLastError());
        EXPECT_EQ(m_folder, std::filesystem::current_path());
        EXPECT_EQ(0, g_reported);
    }

private:
    static constexpr unsigned kMask = 0x200;

    static int CountLines(int whether)
    {
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wdeprecated-declarations" // newer engines always count lines
        return xmlLineNumbersDefault(whether);
#pragma GCC diagnostic pop
    }

    const int m_lines;
    const int m_noLines; // from 2.15 on the engine always counts them
    const int m_blanks;
    const xmlGenericErrorFunc m_print = xmlGenericError;
    const std::filesystem::path m_folder = std::filesystem::current_path();
};

class KxconfigRun : public ToolTest
{
protected:
    /** @return arguments that lead to each command's end, good and bad. */
    std::vector<std::vector<std::string>> Samples() const
    {
        const std::string missing = m_folder.Path("missing/cfg.xml");
        return {{"get", m_file, "cfg.net.ip"},
                {"--log-mask", "all", "get", m_file, "cfg.none"},
                {"get", m_bad, "cfg.a"},
                {"explain", m_file, "cfg.net@id=1.ip"},
                {"explain", "--set", m_file, "cfg.net.ip"},
                {"keys", m_file},
                {"check", "--notes", m_file},
                {"check", m_file, "cfg.net.ip"},
                {"find", m_file, "//net"},
                {"find", m_file, "//p:net"},
                {"find", m_bad, "//net"},
                {"set", m_file, "cfg.net.ip", "x", "--output", m_folder.Path("copy.xml")},
                {"set", m_file, "cfg.net.ip", "x", "--output", missing},
                {"set", m_file, "cfg.net.ip", "&nowhere;"},
                {"--version"},
                {"frobnicate"}};
    }

    const std::string m_file = m_folder.Write(
        "cfg.xml", "<cfg>\n <net id='1'><ip>a</ip></net>\n <net id='2'><ip>b</ip></net>\n</cfg>");
    const std::string m_bad = m_folder.Write("bad.xml", "<cfg>\n<a></cfg>");
};

} // namespace

TEST_F(KxconfigRun, LeavesTheProcessAsItFoundIt)
{
    const UnusualSettings settings;
    for (const std::vector<std::string>& arguments : Samples())
    {
        SCOPED_TRACE(testing::PrintToString(arguments));
        Tool(arguments);
        settings.ExpectInPlace();
    }
}

TEST_F(KxconfigRun, AnswersAlikeUnderAnySettings)
{
    for (const std::vector<std::string>& arguments : Samples())
    {
        SCOPED_TRACE(testing::PrintToString(arguments));
        const Outcome usual = Tool(arguments);
        const UnusualSettings settings;
        const Outcome unusual = Tool(arguments);
        EXPECT_EQ(usual.status, unusual.status);
        EXPECT_EQ(usual.out, unusual.out);
        EXPECT_EQ(usual.err, unusual.err);
    }
}

TEST_F(KxconfigRun, IsAllThatTheProgramDoes)
{
    for (const std::vector<std::string>& arguments : Samples())
    {
        if (arguments.front() != "--log-mask") // the records of the program's own run are printed
        {
            SCOPED_TRACE(testing::PrintToString(arguments));
            const Outcome here = Tool(arguments);
            const Outcome program = ToolProcess(arguments);
            EXPECT_EQ(here.status, program.status);
            EXPECT_EQ(here.out, program.out);
            EXPECT_EQ(here.err, program.err);
        }
    }
}

TEST_F(KxconfigRun, EndsByASignalWhenNobodyReadsItsOutput)
{
    std::string xml = "<cfg>";
    for (int i = 0; i != 10000; ++i)
    {
        xml += "<a i='" + std::to_string(i) + "'>1</a>"; // more output than a pipe holds
    }
    const std::string file = m_folder.Write("long.xml", xml + "</cfg>");
    const Outcome outcome =
        RunShell(InShell(KX_CONFIG_TOOL) + " keys " + file + " | true; exit ${PIPESTATUS[0]}");
    EXPECT_EQ(128 + 13, outcome.status);
    EXPECT_EQ("", outcome.err);
}
