#include "ToolTest.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <filesystem>

using namespace kxtest;

namespace
{

const std::string kDeclaration = "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n";

class KxconfigSet : public ToolTest
{
protected:
    const std::string m_before = "<cfg><net id='1'><ip>a</ip></net><net id='2'><ip>b</ip></net>"
                                 "<name>box</name></cfg>";
    const std::string m_file = m_folder.Write("cfg.xml", m_before);

    /** Expects the complaint, and the file as it was, byte for byte, with nothing left beside it.
     */
    void ExpectRefused(const std::vector<std::string>& arguments, int status,
                       const std::string& message)
    {
        ExpectComplaint(Tool(arguments), status, message);
        ExpectUntouched();
    }

    void ExpectUntouched()
    {
        EXPECT_EQ(m_before, ReadFile(m_file));
        EXPECT_EQ(1, FilesInFolder());
    }

    long FilesInFolder() const
    {
        const std::filesystem::directory_iterator files(m_folder.Path(""));
        return std::distance(begin(files), end(files));
    }
};

} // namespace

TEST_F(KxconfigSet, ChangesTheFileAndPrintsWhatChanged)
{
    const Outcome outcome = Tool({"set", m_file, "cfg.name", "crate"});
    EXPECT_EQ(0, outcome.status);
    EXPECT_EQ("/cfg/name: \"box\" -> \"crate\"\n", outcome.out);
    EXPECT_EQ("", outcome.err);
    EXPECT_EQ(kDeclaration + "<cfg><net id=\"1\"><ip>a</ip></net><net id=\"2\"><ip>b</ip></net>"
                             "<name>crate</name></cfg>\n",
              ReadFile(m_file));
    EXPECT_EQ(1, FilesInFolder());
}

TEST_F(KxconfigSet, PrintsEveryElementThatTheUpdateReaches)
{
    EXPECT_EQ("/cfg/net[1]/ip: \"a\" -> \"x\"\n/cfg/net[2]/ip: \"b\" -> \"x\"\n",
              Tool({"set", m_file, "cfg.ip", "x"}).out);
}

TEST_F(KxconfigSet, HonoursConditions)
{
    EXPECT_EQ("/cfg/net[2]/ip: \"b\" -> \"x\"\n",
              Tool({"set", m_file, "cfg.net@id=2.ip", "x"}).out);
}

TEST_F(KxconfigSet, DryRunShowsTheSameAndSavesNothing)
{
    const Outcome outcome = Tool({"set", "--dry-run", m_file, "cfg.ip", "x"});
    EXPECT_EQ(0, outcome.status);
    EXPECT_EQ("/cfg/net[1]/ip: \"a\" -> \"x\"\n/cfg/net[2]/ip: \"b\" -> \"x\"\n", outcome.out);
    ExpectUntouched();
}

TEST_F(KxconfigSet, OutputSavesElsewhere)
{
    const std::string elsewhere = m_folder.Path("new%20name.xml"); // a name that the engine decodes
    const Outcome outcome = Tool({"set", m_file, "cfg.name", "crate", "--output", elsewhere});
    EXPECT_EQ(0, outcome.status);
    EXPECT_EQ("/cfg/name: \"box\" -> \"crate\"\n", outcome.out);
    EXPECT_EQ(m_before, ReadFile(m_file));
    EXPECT_NE(std::string::npos, ReadFile(elsewhere).find("<name>crate</name>"));
    EXPECT_EQ(2, FilesInFolder());
}

TEST_F(KxconfigSet, SameTextIsNotSavedAgain)
{
    const Outcome outcome = Tool({"set", m_file, "cfg.name", "box"});
    EXPECT_EQ(0, outcome.status);
    EXPECT_EQ("nothing changed: the text is the same already\n", outcome.out);
    ExpectUntouched();
}

TEST_F(KxconfigSet, ValuesAreShownOnOneLine)
{
    EXPECT_EQ("/cfg/name: \"box\" -> \"a\\nb\\x09\\\"c\\\\\"\n",
              Tool({"set", m_file, "cfg.name", "a\nb\t\"c\\"}).out);
    EXPECT_EQ("/cfg/name: \"a\\nb\\x09\\\"c\\\\\" -> \"<&>\"\n",
              Tool({"set", m_file, "cfg.name", "&lt;&amp;>"}).out);
    EXPECT_EQ("<&>\n", Tool({"get", m_file, "cfg.name"}).out);
}

TEST_F(KxconfigSet, ValueMayStartWithADashAfterTwo)
{
    EXPECT_EQ("/cfg/name: \"box\" -> \"-5\"\n", Tool({"set", m_file, "cfg.name", "--", "-5"}).out);
}

TEST_F(KxconfigSet, LeavesTheFileAloneWhenNothingIsFound)
{
    ExpectRefused({"set", m_file, "cfg.missing", "x"}, 1,
                  "nothing found: no element of " + m_file +
                      " has text that can be replaced under \"cfg.missing\"");
    ExpectRefused({"set", m_file, "other.name", "x"}, 1,
                  "nothing found: the key starts with \"other\", but the root element of " +
                      m_file + " is \"cfg\"");
}

TEST_F(KxconfigSet, LeavesTheFileAloneWhenTheKeyIsMalformed)
{
    ExpectRefused({"set", m_file, "cfg", "x"}, 2,
                  "malformed key \"cfg\": it names the root element and at least one more, as in "
                  "root.name");
    EXPECT_EQ(2, Tool({"set", m_file, "cfg.name"}).status);
    EXPECT_EQ(2, Tool({"set", "-", "cfg.name", "x"}).status);
    EXPECT_EQ(2, Tool({"set", m_file, "cfg.name", "x", "--output", "-"}).status);
    ExpectUntouched();
}

TEST_F(KxconfigSet, LeavesTheFileAloneWhenTheKeyEndsInADot)
{
    // The library updates the element in memory and yet answers that something is missing.
    const std::string xml = "<cfg><name>box</name></cfg>";
    const std::string file = m_folder.Write("dot.xml", xml);
    ExpectComplaint(Tool({"set", file, "cfg.name.", "x"}), 2,
                    "malformed key \"cfg.name.\": it ends in \".\"");
    EXPECT_EQ(xml, ReadFile(file));
}

TEST_F(KxconfigSet, SaysWhyAFileCannotBeRead)
{
    const std::string missing = m_folder.Path("missing.xml");
    ExpectComplaint(Tool({"set", missing, "a.b", "x"}), 3,
                    "cannot read " + missing + ": No such file or directory");
    EXPECT_FALSE(FileExists(missing));
}

TEST_F(KxconfigSet, RefusesToSaveWhatWouldNotLoadAgain)
{
    const Outcome outcome = Tool({"set", m_file, "cfg.name", "&nowhere;"});
    EXPECT_EQ(4, outcome.status);
    EXPECT_EQ("", outcome.out);
    EXPECT_THAT(outcome.err, testing::StartsWith("kxconfig: not saved: " + m_file +
                                                 " would not load any more, line 2: "));
    EXPECT_EQ(1, std::count(outcome.err.begin(), outcome.err.end(), '\n'));
    ExpectUntouched();
}

TEST_F(KxconfigSet, SaysThatSavingFailed)
{
    ExpectRefused({"set", m_file, "cfg.name", "x", "--output", "/dev/full"}, 4,
                  "cannot save /dev/full");
    ExpectRefused({"set", m_file, "cfg.name", "x", "--output", m_folder.Path("")}, 4,
                  "cannot save " + m_folder.Path("") + ": Is a directory");
    const std::string nowhere = m_folder.Path("nowhere/cfg.xml");
    ExpectRefused({"set", m_file, "cfg.name", "x", "--output", nowhere}, 4,
                  "cannot save " + nowhere + ": No such file or directory");
}

TEST_F(KxconfigSet, KeepsPermissionsAndLinks)
{
    ASSERT_EQ(0, chmod(m_file.c_str(), 0640));
    const std::string link = m_folder.Path("link.xml");
    ASSERT_EQ(0, symlink("cfg.xml", link.c_str()));
    EXPECT_EQ(0, Tool({"set", link, "cfg.name", "crate"}).status);
    struct stat status = {};
    ASSERT_EQ(0, lstat(link.c_str(), &status));
    EXPECT_TRUE(S_ISLNK(status.st_mode));
    ASSERT_EQ(0, stat(m_file.c_str(), &status));
    EXPECT_EQ(0640u, status.st_mode & 07777);
    EXPECT_NE(std::string::npos, ReadFile(m_file).find("crate"));
}

TEST_F(KxconfigSet, NewFileGetsThePermissionsOfANewFile)
{
    const std::string elsewhere = m_folder.Path("new.xml");
    const mode_t mask = umask(0027);
    EXPECT_EQ(0, Tool({"set", m_file, "cfg.name", "x", "--output", elsewhere}).status);
    umask(mask);
    struct stat status = {};
    ASSERT_EQ(0, stat(elsewhere.c_str(), &status));
    EXPECT_EQ(0640u, status.st_mode & 07777);
}

TEST_F(KxconfigSet, RelativePathsAreMeantFromTheCurrentFolder)
{
    const std::filesystem::path before = std::filesystem::current_path();
    std::filesystem::current_path(m_folder.Path(""));
    EXPECT_EQ(0, Tool({"set", "cfg.xml", "cfg.name", "crate"}).status);
    std::filesystem::current_path(before);
    EXPECT_NE(std::string::npos, ReadFile(m_file).find("crate"));
}
