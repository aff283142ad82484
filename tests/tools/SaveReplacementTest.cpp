#include "FileCalls.h"

#include "file/Debris.h"
#include "file/FileLock.h"
#include "file/Replacement.h"
#include "support/Files.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <functional>

#include <fcntl.h>
#include <sys/file.h>
#include <sys/wait.h>

using namespace kxtest;

namespace
{

/** With files that have no name until they are in place, or as where there are none. */
class ReplacementTest : public testing::TestWithParam<bool>
{
protected:
    ReplacementTest()
    {
        if (!GetParam())
        {
            m_noUnnamed.emplace();
        }
    }

    long FilesInFolder() const
    {
        const std::filesystem::directory_iterator files(m_folder.Path(""));
        return std::distance(begin(files), end(files));
    }

    std::optional<NoUnnamedFiles> m_noUnnamed;
    const TemporaryFolder m_folder;
    const std::string m_file = m_folder.Write("cfg.xml", "old");
    const Place m_place{m_file};
};

std::string NameOfWay(const testing::TestParamInfo<bool>& info)
{
    return info.param ? "Unnamed" : "Named";
}

/** @return the signal that ended a process that ran @p act, or 0. */
int SignalThatEnds(const std::function<void()>& act)
{
    const pid_t child = fork();
    if (child == 0)
    {
        act();
        _exit(0);
    }
    int status = 0;
    waitpid(child, &status, 0);
    return WIFSIGNALED(status) ? WTERMSIG(status) : 0;
}

} // namespace

INSTANTIATE_TEST_SUITE_P(, ReplacementTest, testing::Bool(), NameOfWay);

TEST_P(ReplacementTest, TakesThePlaceOfTheFile)
{
    Replacement replacement(m_place, 0600);
    WriteAll(replacement.File(), "new");
    EXPECT_EQ("old", ReadFile(m_file));
    replacement.TakePlace();
    EXPECT_EQ("new", ReadFile(m_file));
    EXPECT_TRUE(m_place.Has(replacement.File()));
    EXPECT_EQ(1, FilesInFolder());
}

TEST_P(ReplacementTest, TakesAPlaceThatIsFree)
{
    const Place place(m_folder.Path("new.xml"));
    Replacement replacement(place, 0600);
    replacement.TakePlace();
    EXPECT_EQ("", ReadFile(m_folder.Path("new.xml")));
    EXPECT_EQ(2, FilesInFolder());
}

TEST_P(ReplacementTest, VanishesUnlessItTakesThePlace)
{
    {
        const Replacement replacement(m_place, 0600);
        EXPECT_EQ(GetParam() ? 1 : 2, FilesInFolder());
    }
    EXPECT_EQ(1, FilesInFolder());
    EXPECT_EQ("old", ReadFile(m_file));
}

TEST_P(ReplacementTest, VanishesIfItCannotTakeThePlace)
{
    {
        Replacement replacement(m_place, 0600);
        std::filesystem::remove(m_file);
        std::filesystem::create_directory(m_file);
        EXPECT_THROW(replacement.TakePlace(), std::system_error);
        EXPECT_EQ(1, FilesInFolder());
    }
    EXPECT_EQ(1, FilesInFolder());
}

TEST_P(ReplacementTest, VanishesWhenASignalEndsTheProcess)
{
    for (const int signal : {SIGINT, SIGTERM, SIGHUP, SIGQUIT, SIGXCPU, SIGXFSZ})
    {
        EXPECT_EQ(signal, SignalThatEnds(
                              [&]
                              {
                                  const Replacement replacement(m_place, 0600);
                                  raise(signal);
                              }));
        EXPECT_EQ(1, FilesInFolder());
    }
}

TEST_P(ReplacementTest, LetsIgnoredSignalsBeIgnored)
{
    EXPECT_EQ(0, SignalThatEnds(
                     [&]
                     {
                         signal(SIGHUP, SIG_IGN);
                         Replacement replacement(m_place, 0600);
                         raise(SIGHUP);
                         replacement.TakePlace();
                     }));
    EXPECT_EQ("", ReadFile(m_file));
}

TEST_P(ReplacementTest, RestoresTheSignals)
{
    {
        const Replacement replacement(m_place, 0600);
    }
    struct sigaction now = {};
    sigaction(SIGTERM, nullptr, &now);
    EXPECT_EQ(SIG_DFL, now.sa_handler);
    sigset_t delayed;
    pthread_sigmask(SIG_BLOCK, nullptr, &delayed);
    EXPECT_EQ(0, sigismember(&delayed, SIGTERM));
}

TEST_P(ReplacementTest, HasTheModeThatIsAskedForAndTheUmaskAllows)
{
    const mode_t before = umask(027);
    const Replacement replacement(m_place, 0666);
    umask(before);
    struct stat status = {};
    fstat(replacement.File(), &status);
    EXPECT_EQ(0640u, status.st_mode & 07777u);
}

TEST_P(ReplacementTest, IsNoDebrisWhileItIsMade)
{
    Replacement replacement(m_place, 0600);
    RemoveDebris(m_place);
    replacement.TakePlace();
    EXPECT_EQ("", ReadFile(m_file));
}

TEST_P(ReplacementTest, IsDebrisWhenItsProcessIsKilled)
{
    EXPECT_EQ(SIGKILL, SignalThatEnds(
                           [&]
                           {
                               const Replacement replacement(m_place, 0600);
                               raise(SIGKILL);
                           }));
    EXPECT_EQ(GetParam() ? 1 : 2, FilesInFolder());
    RemoveDebris(m_place);
    EXPECT_EQ(1, FilesInFolder());
}

TEST(DebrisTest, IsOnlyWhatHasItsName)
{
    const TemporaryFolder folder;
    for (const char* const name :
         {".kxconfig-0123456789abcdef", ".kxconfig-0123456789abcdeg.tmp",
          ".kxconfig-0123456789abcde.tmp", ".kxconfig-0123456789abcdef.bak", ".kxconfig-backup",
          "kxconfig-00123456789abcdef.tmp"})
    {
        folder.Write(name, "");
    }
    std::filesystem::create_directory(folder.Path(".kxconfig-0123456789abcdef.tmp"));
    std::filesystem::create_symlink("x", folder.Path(".kxconfig-1123456789abcdef.tmp"));
    const std::string debris = folder.Write(NameOfReplacement(), "");
    const Place place(folder.Path("cfg.xml"));
    RemoveDebris(place);
    EXPECT_FALSE(FileExists(debris));
    const std::filesystem::directory_iterator rest(folder.Path(""));
    EXPECT_EQ(8, std::distance(begin(rest), end(rest)));
}

TEST(DebrisTest, StaysWhereNoLockProvesItStale)
{
    const TemporaryFolder folder;
    const std::string debris = folder.Write(NameOfReplacement(), "");
    const Place place(folder.Path("cfg.xml"));
    const NoLocks none(ENOLCK);
    RemoveDebris(place);
    EXPECT_TRUE(FileExists(debris));
}

TEST(DebrisTest, IsAlsoASecondNameOfTheLockedFile)
{
    const TemporaryFolder folder;
    const Place place(folder.Write("cfg.xml", "old"));
    const FileLock lock(place, std::chrono::seconds(0));
    const std::string link = folder.Path(NameOfReplacement());
    std::filesystem::create_hard_link(folder.Path("cfg.xml"), link);
    RemoveDebris(place);
    EXPECT_FALSE(FileExists(link));
    EXPECT_EQ("old", ReadFile(folder.Path("cfg.xml")));
}

TEST(DebrisTest, IsNoFileThatAnotherSaveHasLocked)
{
    const TemporaryFolder folder;
    const Place place(folder.Write("cfg.xml", "old"));
    const Place other(folder.Write(NameOfReplacement(), "new"));
    const FileLock lock(other, std::chrono::seconds(0));
    RemoveDebris(place);
    EXPECT_TRUE(other.Status());
}
