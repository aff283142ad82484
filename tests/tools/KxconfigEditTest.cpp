#include "ToolTest.h"

#include <nlohmann/json.hpp>

#include <sys/stat.h>

#include <filesystem>

using namespace kxtest;
using testing::HasSubstr;

namespace
{

/** What all commands that change a file have in common, shown by set. */
class KxconfigEdit : public ToolTest
{
protected:
    const std::string m_before = "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n"
                                 "<cfg>\n  <name>box</name>\n  <ip>a</ip>\n</cfg>\n";
    const std::string m_file = m_folder.Write("cfg.xml", m_before);
    const std::string m_change = "/cfg/name: \"box\" -> \"crate\"\n";

    static std::string DiffOf(const std::string& from, const std::string& to)
    {
        return "--- " + from + "\n+++ " + to +
               "\n@@ -1,5 +1,5 @@\n <?xml version=\"1.0\" encoding=\"UTF-8\"?>\n <cfg>\n"
               "-  <name>box</name>\n+  <name>crate</name>\n   <ip>a</ip>\n </cfg>\n";
    }

    long FilesInFolder() const
    {
        const std::filesystem::directory_iterator files(m_folder.Path(""));
        return std::distance(begin(files), end(files));
    }
};

} // namespace

TEST_F(KxconfigEdit, DiffPrintsTheLinesThatChange)
{
    EXPECT_EQ(m_change + DiffOf(m_file, m_file),
              Tool({"set", "--diff", "--dry-run", m_file, "cfg.name", "crate"}).out);
    EXPECT_EQ(m_before, ReadFile(m_file));
    EXPECT_EQ(DiffOf(m_file, m_file),
              Tool({"set", "--diff", "--quiet", m_file, "cfg.name", "crate"}).out);
    EXPECT_EQ("", Tool({"set", "--diff", "--quiet", m_file, "cfg.name", "crate"}).out);
}

TEST_F(KxconfigEdit, DiffNamesTheOtherFile)
{
    const std::string other = m_folder.Path("other.xml");
    EXPECT_EQ(
        DiffOf(m_file, other),
        Tool({"set", "--diff", "--quiet", "--output", other, m_file, "cfg.name", "crate"}).out);
}

TEST_F(KxconfigEdit, DiffShowsWhatSavingNormalizes)
{
    const std::string file = m_folder.Write("plain.xml", "<cfg><name>box</name></cfg>");
    EXPECT_EQ("--- " + file + "\n+++ " + file +
                  "\n@@ -1 +1,2 @@\n-<cfg><name>box</name></cfg>\n"
                  "\\ No newline at end of file\n+<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n"
                  "+<cfg><name>crate</name></cfg>\n",
              Tool({"set", "--diff", "--quiet", file, "cfg.name", "crate"}).out);
}

TEST_F(KxconfigEdit, DiffIsAResultInJson)
{
    const auto answer =
        nlohmann::json::parse(Tool({"--json", "set", "--diff", m_file, "cfg.name", "crate"}).out);
    ASSERT_EQ(2u, answer["results"].size());
    EXPECT_EQ(DiffOf(m_file, m_file), answer["results"][1]["diff"]);
}

TEST_F(KxconfigEdit, DiffNeedsLinesOfText)
{
    const std::string text("\xFE\xFF\0<\0c\0>\0<\0n\0>\0b\0<\0/\0n\0>\0<\0/\0c\0>", 32);
    const std::string file = m_folder.Write("utf16.xml", text);
    const Outcome outcome = Tool({"set", "--diff", file, "c.n", "x"});
    ExpectComplaint(outcome, 4,
                    "not saved: --diff compares lines of text, and " + file +
                        " is compressed or in UTF-16");
    EXPECT_EQ(text, ReadFile(file));
}

TEST_F(KxconfigEdit, BackupKeepsTheOldFile)
{
    ASSERT_EQ(0, chmod(m_file.c_str(), 0640));
    EXPECT_EQ(m_change, Tool({"set", "--backup", m_file, "cfg.name", "crate"}).out);
    EXPECT_EQ(m_before, ReadFile(m_file + "~"));
    EXPECT_THAT(ReadFile(m_file), HasSubstr("crate"));
    struct stat status = {};
    ASSERT_EQ(0, stat((m_file + "~").c_str(), &status));
    EXPECT_EQ(0640u, status.st_mode & 07777);
    EXPECT_EQ(2, FilesInFolder());
}

TEST_F(KxconfigEdit, BackupReplacesTheLastOne)
{
    m_folder.Write("cfg.xml.old", "something else");
    EXPECT_EQ(0, Tool({"set", "--backup=.old", m_file, "cfg.name", "1"}).status);
    EXPECT_EQ(m_before, ReadFile(m_file + ".old"));
    const std::string first = ReadFile(m_file);
    EXPECT_EQ(0, Tool({"set", m_file, "cfg.name", "2", "--backup=.old"}).status);
    EXPECT_EQ(first, ReadFile(m_file + ".old"));
    EXPECT_EQ(2, FilesInFolder());
}

TEST_F(KxconfigEdit, BackupIsOnlyMadeOfWhatIsReplaced)
{
    EXPECT_EQ(0, Tool({"set", "--backup", "--dry-run", m_file, "cfg.name", "x"}).status);
    EXPECT_EQ(0, Tool({"set", "--backup", m_file, "cfg.name", "box"}).status);
    EXPECT_EQ(2, Tool({"set", "--backup", m_file, "cfg.name", "&nowhere;"}).status);
    EXPECT_EQ(1, FilesInFolder());
    const std::string other = m_folder.Path("other.xml");
    EXPECT_EQ(0, Tool({"set", "--backup", "--output", other, m_file, "cfg.name", "x"}).status);
    EXPECT_FALSE(FileExists(other + "~"));
    EXPECT_FALSE(FileExists(m_file + "~"));
    const std::string before = ReadFile(other);
    EXPECT_EQ(0, Tool({"set", "--backup", "--output", other, m_file, "cfg.name", "y"}).status);
    EXPECT_EQ(before, ReadFile(other + "~"));
}

TEST_F(KxconfigEdit, NothingIsSavedWithoutTheBackupThatWasAskedFor)
{
    std::filesystem::create_directory(m_file + "~");
    ExpectComplaint(Tool({"set", "--backup", m_file, "cfg.name", "x"}), 4,
                    "cannot save " + m_file + ": cannot keep " + m_file + "~: Is a directory");
    EXPECT_EQ(m_before, ReadFile(m_file));
    EXPECT_EQ(2, FilesInFolder());
}

TEST_F(KxconfigEdit, BackupTakesASuffixOnly)
{
    EXPECT_EQ(2, Tool({"set", "--backup=", m_file, "cfg.name", "x"}).status);
    EXPECT_EQ(2, Tool({"set", "--backup=/x", m_file, "cfg.name", "x"}).status);
    EXPECT_EQ("/cfg/name: \"box\" -> \"--backup\"\n",
              Tool({"set", m_file, "cfg.name", "--", "--backup"}).out);
}

TEST_F(KxconfigEdit, BackupOfAFileThatHasTheNameAlready)
{
    ASSERT_EQ(0, link(m_file.c_str(), (m_file + "~").c_str()));
    EXPECT_EQ(0, Tool({"set", "--backup", m_file, "cfg.name", "x"}).status);
    EXPECT_EQ(m_before, ReadFile(m_file + "~"));
    EXPECT_EQ(2, FilesInFolder());
}

TEST_F(KxconfigEdit, ADiffNeedsAFileThatCanBeReadAgain)
{
    const std::string pipe = m_folder.Path("pipe");
    ASSERT_EQ(0, RunShell("mkfifo " + pipe).status);
    const Outcome outcome =
        RunShell("{ cat " + m_file + "; sleep 0.05; } >" + pipe + " & " + InShell(KX_CONFIG_TOOL) +
                 " set " + pipe + " cfg.name crate --diff --output " + m_folder.Path("other.xml"));
    EXPECT_EQ(4, outcome.status);
    EXPECT_EQ("kxconfig: not saved: --diff needs a regular file, which " + pipe + " is not\n",
              outcome.err);
}

TEST_F(KxconfigEdit, ADiffComparesNoUtf16)
{
    std::string wide = "\xFF\xFE";
    for (const char c : std::string("<cfg><name>box</name></cfg>"))
    {
        wide += {c, '\0'};
    }
    const std::string file = m_folder.Write("wide.xml", wide);
    EXPECT_EQ("kxconfig: not saved: --diff compares lines of text, and " + file +
                  " is compressed or in UTF-16\n",
              Tool({"set", "--diff", file, "cfg.name", "crate"}).err);
    EXPECT_EQ(wide, ReadFile(file));
}

TEST_F(KxconfigEdit, ABackupsSuffixIsAPartOfAName)
{
    for (const std::string suffix : {"", "/", "a/b"})
    {
        EXPECT_EQ(2, Tool({"set", "--backup=" + suffix, m_file, "cfg.name", "crate"}).status)
            << suffix;
    }
    EXPECT_EQ(m_before, ReadFile(m_file));
}
