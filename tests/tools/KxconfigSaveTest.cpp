#include "ToolTest.h"

#include "CXMLWriter.h"

#include <fcntl.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <sys/xattr.h>

#include <filesystem>

using namespace kxtest;

namespace
{

/** What becomes of the file when it is saved, whatever else happens. */
class KxconfigSave : public ToolTest
{
protected:
    const std::string m_before = "<cfg><name>box</name></cfg>";
    const std::string m_after = kDeclaration + "<cfg><name>crate</name></cfg>\n";
    const std::string m_change = "/cfg/name: \"box\" -> \"crate\"\n";
    const std::string m_file = m_folder.Write("cfg.xml", m_before);

    /** Runs a script of the shell in which $set sets the name to "crate" in the file named next. */
    Outcome Shell(const std::string& script) const
    {
        const std::string set = "set() { " + InShell(KX_CONFIG_TOOL) +
                                " set \"$1\" cfg.name crate \"${@:2}\"; }; file=" + m_file + "; ";
        return RunShell(set + script, {"KX_LOG_MASK="});
    }
};

long FilesIn(const TemporaryFolder& folder)
{
    const std::filesystem::directory_iterator files(folder.Path(""));
    return std::distance(begin(files), end(files));
}

std::string Updates(int writer, int count)
{
    std::string lines;
    for (int i = 0; i != count; ++i)
    {
        lines += "/cfg/w" + std::to_string(writer) + ": \"" + std::to_string(i) + "\" -> \"" +
                 std::to_string(i + 1) + "\"\n";
    }
    return lines;
}

} // namespace

TEST_F(KxconfigSave, RefusesALockedFileAfterTheWait)
{
    const int owner = open(m_file.c_str(), O_RDONLY | O_CLOEXEC);
    ASSERT_EQ(0, flock(owner, LOCK_EX));
    ExpectComplaint(Tool({"set", "--wait", "0", m_file, "cfg.name", "crate"}), 4,
                    "not saved: " + m_file + " is locked by another process, for longer than 0 s");
    EXPECT_EQ(4, Tool({"set", "--wait=0", "--dry-run", m_file, "cfg.name", "crate"}).status);
    EXPECT_EQ(0, Tool({"get", m_file, "cfg.name"}).status);
    EXPECT_EQ(m_before, ReadFile(m_file));
    close(owner);
}

TEST_F(KxconfigSave, WaitsForALock)
{
    const Outcome outcome = Shell("flock $file sleep 0.3 & sleep 0.1; set $file");
    EXPECT_EQ(0, outcome.status);
    EXPECT_EQ(m_change, outcome.out);
}

TEST_F(KxconfigSave, TheWaitIsANumberOfSeconds)
{
    for (const std::string wait : {"", "-1", "x", "1x", "nan", "inf", "1000000000000"})
    {
        EXPECT_EQ(2, Tool({"set", "--wait=" + wait, m_file, "cfg.name", "crate"}).status) << wait;
    }
    EXPECT_EQ(m_before, ReadFile(m_file));
}

TEST_F(KxconfigSave, LosesNoUpdateOfManyWriters)
{
    // Of interest is the order of what the writers do, not how long a disk takes to sync.
    const bool hasMemory = access("/dev/shm", W_OK) == 0;
    const Environment environment({hasMemory ? "TMPDIR=/dev/shm" : "TMPDIR=/tmp"});
    const TemporaryFolder folder;
    const int writers = 16;
    const int updates = KX_UPDATES_OF_A_WRITER;
    std::string xml = "<cfg>";
    for (int writer = 1; writer <= writers; ++writer)
    {
        const std::string name = "w" + std::to_string(writer);
        xml += "<" + name + ">0</" + name + ">";
    }
    folder.Write("cfg.xml", xml + "<end>whole</end></cfg>");
    const std::string tool = InShell(KX_CONFIG_TOOL);
    const std::string count = std::to_string(updates);
    const Outcome outcome = RunShell(
        "cd " + folder.Path("") + "; for w in {1..16}; do for i in {1.." + count + "}; do " + tool +
            " set --wait 600 cfg.xml cfg.w$w $i; done >$w.out 2>&1 & all+=($!); done; " +
            "{ while [ ! -e done ]; do [ \"$(" + tool +
            " get cfg.xml cfg.end)\" = whole ] || echo torn; done; } & " +
            "wait ${all[@]}; touch done; wait",
        {"KX_LOG_MASK="});
    EXPECT_EQ("", outcome.out);
    EXPECT_EQ("", outcome.err);
    for (int writer = 1; writer <= writers; ++writer)
    {
        EXPECT_EQ(Updates(writer, updates), ReadFile(folder.Path(std::to_string(writer) + ".out")));
    }
    EXPECT_EQ(writers + 2, FilesIn(folder));
}

TEST_F(KxconfigSave, ReadsAPipeOnceAndToItsEnd)
{
    const std::string pipe = m_folder.Path("pipe");
    ASSERT_EQ(0, mkfifo(pipe.c_str(), 0600));
    for (const std::string command : {"get $p cfg.name", "find $p /cfg/name", "keys $p", "check $p",
                                      "explain $p cfg.name", "set $p cfg.name x --output $p.xml"})
    {
        const Outcome outcome =
            RunShell("p=" + pipe + "; { cat " + m_file + "; sleep 0.05; } >$p & " +
                     InShell(KX_CONFIG_TOOL) + " " + command);
        EXPECT_EQ(0, outcome.status) << command << outcome.err;
    }
}

TEST_F(KxconfigSave, ReadsACompressedPipe)
{
    const std::string tool = InShell(KX_CONFIG_TOOL);
    const std::string compressed = m_file + ".gz";
    RunShell("gzip <" + m_file + " >" + compressed);
    if (Tool({"get", compressed, "cfg.name"}).status == 3)
    {
        GTEST_SKIP() << "needs an engine that reads compressed files";
    }
    EXPECT_EQ("box\n",
              RunShell("cat " + compressed + " | " + tool + " get /dev/stdin cfg.name").out);
}

TEST_F(KxconfigSave, DoesNotUpdateAPipe)
{
    const std::string pipe = m_folder.Path("pipe");
    ASSERT_EQ(0, mkfifo(pipe.c_str(), 0600));
    ExpectComplaint(Tool({"set", pipe, "cfg.name", "crate"}), 4,
                    "cannot save " + pipe +
                        ": it is not a regular file; --output names another one");
}

TEST_F(KxconfigSave, OutputIsAStreamToWhatIsNoFile)
{
    EXPECT_EQ(m_after, Shell("set $file --output /dev/stdout | cat").out);
    EXPECT_EQ(m_change + m_after,
              Shell("set $file --output >(cat >$file.copy); wait $!; cat $file.copy").out);
    EXPECT_EQ(m_before, ReadFile(m_file));
}

TEST_F(KxconfigSave, OutputToStandardOutputKeepsWhatIsThere)
{
    EXPECT_EQ("log\n" + m_after + "end\n",
              Shell("{ echo log; set $file --output /dev/stdout; echo end; } >$file.log; "
                    "cat $file.log")
                  .out);
}

TEST_F(KxconfigSave, ADashIsStandardOutputAndTheReportGoesToStandardError)
{
    for (const std::string output : {"-", "/dev/stdout"})
    {
        const Outcome outcome = Tool({"set", m_file, "cfg.name", "crate", "--output", output});
        EXPECT_EQ(0, outcome.status);
        EXPECT_EQ(m_after, outcome.out);
        EXPECT_EQ(m_change, outcome.err);
    }
    EXPECT_EQ(m_before, ReadFile(m_file));
    EXPECT_FALSE(FileExists("-"));
}

TEST_F(KxconfigSave, ADashWithJsonPutsTheObjectOnStandardError)
{
    const Outcome outcome = Tool({"--json", "set", m_file, "cfg.name", "crate", "--output", "-"});
    EXPECT_EQ(m_after, outcome.out);
    EXPECT_THAT(outcome.err, testing::StartsWith("{"));
}

TEST_F(KxconfigSave, ReportsThatStandardOutputIsFull)
{
    const Outcome outcome = Shell("set $file --output - >/dev/full");
    EXPECT_EQ(4, outcome.status);
    EXPECT_EQ("kxconfig: cannot save -: No space left on device\n", outcome.err);
}

TEST_F(KxconfigSave, KeepsTheAcl)
{
    const std::string acl(
        "\2\0\0\0\1\0\6\0\xFF\xFF\xFF\xFF\2\0\6\0\xFE\xFF\0\0\4\0\4\0\xFF\xFF\xFF\xFF"
        "\x10\0\6\0\xFF\xFF\xFF\xFF\x20\0\0\0\xFF\xFF\xFF\xFF",
        44);
    const char* const name = "system.posix_acl_access";
    if (setxattr(m_file.c_str(), name, acl.data(), acl.size(), 0) != 0)
    {
        GTEST_SKIP() << "needs a file system with ACLs";
    }
    EXPECT_EQ(0, Tool({"set", m_file, "cfg.name", "crate"}).status);
    std::string kept(acl.size(), '\0');
    EXPECT_EQ(44, getxattr(m_file.c_str(), name, kept.data(), kept.size()));
    EXPECT_EQ(acl, kept);
}

TEST_F(KxconfigSave, KeepsExtendedAttributes)
{
    if (setxattr(m_file.c_str(), "user.note", "text", 4, 0) != 0)
    {
        GTEST_SKIP() << "needs a file system with extended attributes";
    }
    EXPECT_EQ(0, Tool({"set", m_file, "cfg.name", "crate"}).status);
    char kept[4];
    EXPECT_EQ(4, getxattr(m_file.c_str(), "user.note", kept, sizeof kept));
}

TEST_F(KxconfigSave, RefusesToTakeAFileFromItsOwnerWithoutTheOption)
{
    if (geteuid() != 0)
    {
        GTEST_SKIP() << "needs to run as the superuser, to become another user";
    }
    ASSERT_EQ(0, chmod(m_folder.Path("").c_str(), 0777));
    ASSERT_EQ(0, chown(m_file.c_str(), 1234, 4321));
    ASSERT_EQ(0, chmod(m_file.c_str(), 0666));
    const std::vector<std::string> set = {KX_CONFIG_TOOL, "set", m_file, "cfg.name", "crate"};
    const Outcome refused = RunProgram(set, {}, 65534);
    EXPECT_EQ(4, refused.status);
    EXPECT_EQ("kxconfig: cannot save " + m_file +
                  ": it would lose its owner, its group (--drop-attributes saves it anyway)\n",
              refused.err);
    EXPECT_EQ(m_before, ReadFile(m_file));
    std::vector<std::string> dropping = set;
    dropping.push_back("--drop-attributes");
    EXPECT_EQ(0, RunProgram(dropping, {}, 65534).status);
    EXPECT_EQ(m_after, ReadFile(m_file));
}

TEST_F(KxconfigSave, ADryRunFailsWhereTheFileCannotBeSaved)
{
    if (geteuid() != 0)
    {
        GTEST_SKIP() << "needs to run as the superuser, to become another user";
    }
    ASSERT_EQ(0, chmod(m_folder.Path("").c_str(), 0755));
    ASSERT_EQ(0, chmod(m_file.c_str(), 0666));
    const Outcome outcome =
        RunProgram({KX_CONFIG_TOOL, "set", "--dry-run", m_file, "cfg.name", "crate"}, {}, 65534);
    EXPECT_EQ(4, outcome.status);
}

TEST_F(KxconfigSave, WritesTheBytesThatTheLibraryWrites)
{
    for (const std::string name : {"gateway.xml", "network.xml"})
    {
        const std::string text = ReadFile(std::string(KX_EXAMPLE_DATA) + "/" + name);
        const std::string byLibrary = m_folder.Write("library.xml", text);
        const std::string byTool = m_folder.Write("tool.xml", text);
        CXMLWriter writer(byLibrary);
        const std::string root = name.substr(0, name.find('.'));
        EXPECT_EQ(0, Tool({"set", byTool, root + ".name", "x"}).status);
        ASSERT_EQ(0, writer.SetValue(root + ".name", "x"));
        ASSERT_EQ(0, writer.SaveData());
        EXPECT_EQ(ReadFile(byLibrary), ReadFile(byTool));
    }
}

TEST_F(KxconfigSave, ReportsThatTheFileIsSavedThoughPrintingFailed)
{
    const Outcome outcome = Shell("set $file >/dev/full");
    EXPECT_EQ(5, outcome.status);
    EXPECT_EQ("kxconfig: cannot write to standard output\n", outcome.err);
    EXPECT_EQ(m_after, ReadFile(m_file));
}

TEST_F(KxconfigSave, NothingSavedAndNothingPrintedIsNoSave)
{
    EXPECT_EQ(4, Shell("set $file --dry-run >/dev/full").status);
    EXPECT_EQ(m_before, ReadFile(m_file));
}
