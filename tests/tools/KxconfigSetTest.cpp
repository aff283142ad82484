#include "ToolTest.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <sys/sysmacros.h>
#include <unistd.h>

#include <algorithm>
#include <filesystem>

using namespace kxtest;

namespace
{

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

    /**
     * Sets the second net's ip to "x" while another process runs @p change, a script of the shell,
     * after the file is loaded and before it is saved.
     *
     * The tool is asked for the record of the key, which is longer than a pipe can hold. So when
     * the first byte comes out the file is loaded, and the tool waits until the rest is read.
     */
    Outcome SetWhile(const std::string& change, const std::string& options = "") const
    {
        const std::string key = "cfg.net@id=2|id=" + std::string(100000, 'x') + ".ip";
        const std::string pipe = m_pipes.Path("pipe");
        return RunShell("mkfifo " + pipe + "; " + InShell(KX_CONFIG_TOOL) +
                        " --log-mask value set " + options + " " + m_file + " '" + key + "' x 2>" +
                        pipe + " & exec 3<" + pipe + "; read -r -N 1 -u 3; " + change +
                        "; cat <&3 >&2; wait $!");
    }

    void ExpectNotSaved(const Outcome& outcome) const
    {
        EXPECT_EQ(4, outcome.status);
        EXPECT_EQ("", outcome.out);
        EXPECT_THAT(outcome.err,
                    testing::EndsWith("\nkxconfig: not saved: " + m_file +
                                      " was changed by another program in the meantime\n"));
    }

    long FilesInFolder() const
    {
        const std::filesystem::directory_iterator files(m_folder.Path(""));
        return std::distance(begin(files), end(files));
    }

    const TemporaryFolder m_pipes;
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

TEST_F(KxconfigSet, OutputNeedsAName)
{
    const std::string seeHelp = " (kxconfig --help shows the usage)";
    ExpectRefused({"set", m_file, "cfg.name", "x", "--output", ""}, 2,
                  "--output: \"\" is not a file name" + seeHelp);
    EXPECT_EQ(2, Tool({"set", m_file, "cfg.name", "x", "--output="}).status);
    ExpectUntouched();
}

TEST_F(KxconfigSet, SameTextIsNotSavedAgain)
{
    const Outcome outcome = Tool({"set", m_file, "cfg.name", "box"});
    EXPECT_EQ(0, outcome.status);
    EXPECT_EQ("nothing changed: the text is already the same\n", outcome.out);
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
                  "malformed key \"cfg\": a key names the root element and at least one more, as "
                  "in root.name");
    EXPECT_EQ(2, Tool({"set", m_file, "cfg.name"}).status);
    EXPECT_EQ(2, Tool({"set", "-", "cfg.name", "x"}).status);
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
    const std::string xml = "<!DOCTYPE cfg [<!ENTITY e \"<b>\">]>\n<cfg>\n<a>1</a></cfg>\n";
    const std::string file = m_folder.Write("entity.xml", xml);
    for (const std::string option : {"--json", "--dry-run"})
    {
        EXPECT_EQ(4, Tool({"set", option, file, "cfg.a", "&e;"}).status);
    }
    const Outcome outcome = Tool({"set", file, "cfg.a", "&e;"});
    EXPECT_EQ(4, outcome.status);
    EXPECT_EQ("", outcome.out);
    EXPECT_THAT(outcome.err, testing::StartsWith("kxconfig: not saved: " + file +
                                                 " would no longer load, line "));
    EXPECT_EQ(1, std::count(outcome.err.begin(), outcome.err.end(), '\n'));
    EXPECT_EQ(xml, ReadFile(file));
}

TEST_F(KxconfigSet, RefusesAReferenceToAnEntityThatTheFileDoesNotDeclare)
{
    ExpectRefused({"set", m_file, "cfg.name", "a&nowhere;"}, 2,
                  "the new text is not XML text: the file declares no entity \"nowhere\"");
    const std::string file =
        m_folder.Write("entity.xml", "<!DOCTYPE cfg [<!ENTITY e \"x\">]>\n<cfg><a>1</a></cfg>\n");
    EXPECT_EQ(0, Tool({"set", file, "cfg.a", "&e;&lt;"}).status);
    const std::string external = m_folder.Write(
        "external.xml", "<!DOCTYPE cfg SYSTEM \"missing.dtd\">\n<cfg><a>1</a></cfg>\n");
    EXPECT_EQ(0, Tool({"set", external, "cfg.a", "&unknown;"}).status);
}

TEST_F(KxconfigSet, RefusesNoncharacters)
{
    for (const std::string character : {"\xEF\xBF\xBE", "\xEF\xBF\xBF"})
    {
        ExpectRefused({"set", m_file, "cfg.name", "a" + character}, 2,
                      "the new text is not XML text: it contains U+FFFE or U+FFFF, which are not "
                      "characters");
    }
    EXPECT_EQ(0, Tool({"set", m_file, "cfg.name", "\xEF\xBF\xBD"}).status);
}

TEST_F(KxconfigSet, SaysThatSavingFailed)
{
    ExpectRefused({"set", m_file, "cfg.name", "x", "--output", m_folder.Path("")}, 4,
                  "cannot save " + m_folder.Path("") + ": Is a directory");
    const std::string nowhere = m_folder.Path("nowhere/cfg.xml");
    ExpectRefused({"set", m_file, "cfg.name", "x", "--output", nowhere}, 4,
                  "cannot save " + nowhere + ": No such file or directory");
}

TEST_F(KxconfigSet, SaysThatADeviceIsFull)
{
    // A node of the test's own: replacing the real one by a file would harm the machine.
    const std::string full = m_folder.Path("full");
    if (mknod(full.c_str(), S_IFCHR | 0666, makedev(1, 7)) != 0)
    {
        GTEST_SKIP() << "needs to run as the superuser, to make a device node";
    }
    ExpectComplaint(Tool({"set", m_file, "cfg.name", "x", "--output", full}), 4,
                    "cannot save " + full + ": No space left on device");
    struct stat status = {};
    ASSERT_EQ(0, stat(full.c_str(), &status));
    EXPECT_TRUE(S_ISCHR(status.st_mode));
    EXPECT_EQ(m_before, ReadFile(m_file));
}

TEST_F(KxconfigSet, RefusesAValueThatIsNoXmlText)
{
    for (const std::string value :
         {"x&y", "x&y=2", "&", "a & b", "a & b;", "&;", "&#;", "&#x;", "&#1a;", "&#xg;", "&amp;&"})
    {
        ExpectRefused({"set", m_file, "cfg.name", value}, 2,
                      "the new text is not XML text: write & as &amp;");
    }
}

TEST_F(KxconfigSet, RefusesAReferenceToACharacterThatXmlDoesNotHave)
{
    // The engine would make nothing of some of them, and save.
    for (const std::string value :
         {"&#0;", "&#x0;", "a&#0;b", "&amp;&#00;", "&#8;", "&#11;", "&#12;", "&#x1F;", "&#xD800;",
          "&#xDFFF;", "&#xFFFE;", "&#65535;", "&#x110000;", "&#4294967361;",
          "&#x10000000000000041;"})
    {
        ExpectRefused(
            {"set", m_file, "cfg.name", value}, 2,
            "the new text is not XML text: it refers to a character that XML does not allow");
    }
}

TEST_F(KxconfigSet, TakesReferencesToTheFirstAndTheLastCharacterOfEachRange)
{
    EXPECT_EQ("/cfg/name: \"box\" -> \"\\x09\\n\\x0d \xED\x9F\xBF\xEE\x80\x80\xEF\xBF\xBD"
              "\xF0\x90\x80\x80\xF4\x8F\xBF\xBF\"\n",
              Tool({"set", m_file, "cfg.name",
                    "&#9;&#10;&#xD;&#x20;&#xD7FF;&#xE000;&#xFFFD;&#x10000;&#x0010FFFF;"})
                  .out);
}

TEST_F(KxconfigSet, RefusesAValueThatIsNoXmlTextWhateverTheKeySelects)
{
    ExpectRefused({"set", m_file, "cfg.missing", "x&y"}, 2,
                  "the new text is not XML text: write & as &amp;");
}

TEST_F(KxconfigSet, TakesReferencesToCharactersAndEntities)
{
    EXPECT_EQ("/cfg/name: \"box\" -> \"A & JK\"\n",
              Tool({"set", m_file, "cfg.name", "&#65; &amp; &#x4a;&#x4B;"}).out);
}

TEST_F(KxconfigSet, DryRunFailsWhereTheRealRunWould)
{
    EXPECT_EQ(2, Tool({"set", "--dry-run", m_file, "cfg.name", "&nowhere;"}).status);
    EXPECT_EQ(2, Tool({"set", "--dry-run", m_file, "cfg.name", "x&y"}).status);
    ExpectUntouched();
}

TEST_F(KxconfigSet, DryRunMakesNoOtherFileEither)
{
    EXPECT_EQ(
        0, Tool({"set", "--dry-run", m_file, "cfg.name", "x", "--output", m_folder.Path("new.xml")})
               .status);
    ExpectUntouched();
}

TEST_F(KxconfigSet, OutputIsWrittenAlsoWhenNothingChanges)
{
    const std::string copy = m_folder.Path("copy.xml");
    EXPECT_EQ(0, Tool({"set", m_file, "cfg.name", "box", "--output", copy}).status);
    EXPECT_NE(std::string::npos, ReadFile(copy).find("<name>box</name>"));
}

TEST_F(KxconfigSet, RefusesAFileThatMustNotBeWritten)
{
    if (geteuid() != 0)
    {
        GTEST_SKIP() << "needs to run as the superuser, to become another user";
    }
    ASSERT_EQ(0, chmod(m_folder.Path("").c_str(), 0777));
    ASSERT_EQ(0, chmod(m_file.c_str(), 0444));
    const Outcome outcome =
        RunProgram({KX_CONFIG_TOOL, "set", m_file, "cfg.name", "crate"}, {}, 65534);
    EXPECT_EQ(4, outcome.status);
    EXPECT_EQ("kxconfig: cannot save " + m_file + ": Permission denied\n", outcome.err);
    ExpectUntouched();
}

TEST_F(KxconfigSet, SaysThatItIsTheFolderThatMustNotBeWritten)
{
    if (geteuid() != 0)
    {
        GTEST_SKIP() << "needs to run as the superuser, to become another user";
    }
    ASSERT_EQ(0, chmod(m_folder.Path("").c_str(), 0755));
    ASSERT_EQ(0, chmod(m_file.c_str(), 0666));
    const Outcome outcome =
        RunProgram({KX_CONFIG_TOOL, "set", m_file, "cfg.name", "crate"}, {}, 65534);
    EXPECT_EQ(4, outcome.status);
    EXPECT_EQ("kxconfig: cannot save " + m_file +
                  ": cannot create a file in its directory: Permission denied\n",
              outcome.err);
    ExpectUntouched();
}

TEST_F(KxconfigSet, LeavesTheFilesOtherNamesWithTheOldContent)
{
    const std::string other = m_folder.Path("other.xml");
    ASSERT_EQ(0, link(m_file.c_str(), other.c_str()));
    EXPECT_EQ(0, Tool({"set", m_file, "cfg.name", "crate"}).status);
    EXPECT_THAT(ReadFile(m_file), testing::HasSubstr("crate"));
    EXPECT_EQ(m_before, ReadFile(other));
}

TEST_F(KxconfigSet, KeepsOwnerAndGroup)
{
    if (geteuid() != 0)
    {
        GTEST_SKIP() << "needs to run as the superuser, to give the file away";
    }
    ASSERT_EQ(0, chown(m_file.c_str(), 1234, 4321));
    EXPECT_EQ(0, Tool({"set", m_file, "cfg.name", "crate"}).status);
    struct stat status = {};
    ASSERT_EQ(0, stat(m_file.c_str(), &status));
    EXPECT_EQ(1234u, status.st_uid);
    EXPECT_EQ(4321u, status.st_gid);
}

TEST_F(KxconfigSet, DoesNotTakeAFileFromItsGroup)
{
    if (geteuid() != 0)
    {
        GTEST_SKIP() << "needs to run as the superuser, to become another user";
    }
    // Writable for all, but of a group that the other user is not in.
    ASSERT_EQ(0, chmod(m_folder.Path("").c_str(), 0777));
    ASSERT_EQ(0, chown(m_file.c_str(), 1234, 4321));
    ASSERT_EQ(0, chmod(m_file.c_str(), 0666));
    EXPECT_EQ(4,
              RunProgram({KX_CONFIG_TOOL, "set", m_file, "cfg.name", "crate"}, {}, 65534).status);
    ExpectUntouched();
}

TEST_F(KxconfigSet, SavesAfterAWaitInWhichNothingHappens)
{
    const Outcome outcome = SetWhile("true");
    EXPECT_EQ(0, outcome.status);
    EXPECT_EQ("/cfg/net[2]/ip: \"b\" -> \"x\"\n", outcome.out);
    EXPECT_THAT(ReadFile(m_file), testing::HasSubstr("<ip>x</ip>"));
}

TEST_F(KxconfigSet, DoesNotOverwriteWhatSomebodyElseWroteMeanwhile)
{
    const std::string theirs = "<cfg><net id='1'><ip>theirs</ip></net></cfg>";
    ExpectNotSaved(SetWhile("printf %s \"" + theirs + "\" >" + m_file));
    EXPECT_EQ(theirs, ReadFile(m_file));
    EXPECT_EQ(1, FilesInFolder());
}

TEST_F(KxconfigSet, DoesNotReplaceAFileThatSomebodyElseReplacedMeanwhile)
{
    // Of the same size and of the same time: only the file is another.
    const std::string theirs = m_folder.Path("theirs");
    ExpectNotSaved(SetWhile("sed s/box/fox/ " + m_file + " >" + theirs + "; touch -r " + m_file +
                            " " + theirs + "; mv " + theirs + " " + m_file));
    EXPECT_THAT(ReadFile(m_file), testing::HasSubstr("<name>fox</name>"));
    EXPECT_EQ(1, FilesInFolder());
}

TEST_F(KxconfigSet, DoesNotBringBackAFileThatSomebodyElseRemovedMeanwhile)
{
    ExpectNotSaved(SetWhile("rm " + m_file));
    EXPECT_EQ(0, FilesInFolder());
}

TEST_F(KxconfigSet, SavesElsewhereWhateverHappensToTheFile)
{
    const std::string copy = m_folder.Path("copy.xml");
    EXPECT_EQ(0, SetWhile("echo >" + m_file, "--output " + copy).status);
    EXPECT_EQ("\n", ReadFile(m_file));
    EXPECT_THAT(ReadFile(copy), testing::HasSubstr("<ip>x</ip>"));
}

TEST_F(KxconfigSet, FollowsALinkToAFileThatIsYetToBe)
{
    const std::string link = m_folder.Path("link.xml");
    ASSERT_EQ(0, symlink("target.xml", link.c_str()));
    EXPECT_EQ(0, Tool({"set", m_file, "cfg.name", "crate", "--output", link}).status);
    struct stat status = {};
    ASSERT_EQ(0, lstat(link.c_str(), &status));
    EXPECT_TRUE(S_ISLNK(status.st_mode));
    EXPECT_NE(std::string::npos, ReadFile(m_folder.Path("target.xml")).find("crate"));
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
