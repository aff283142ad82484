#include "FileCalls.h"

#include "file/FileLock.h"
#include "support/Files.h"

#include <gtest/gtest.h>

#include <thread>

#include <fcntl.h>
#include <stdio.h>
#include <sys/file.h>
#include <unistd.h>

using namespace kxtest;
using std::chrono::milliseconds;
using State = FileLock::State;

namespace
{

/** Another process that locks a file: the lock belongs to the open file, so one process can play
 * both. */
class Owner
{
public:
    explicit Owner(const std::string& path) : m_file(open(path.c_str(), O_RDONLY | O_CLOEXEC))
    {
        EXPECT_EQ(0, flock(m_file.Get(), LOCK_EX | LOCK_NB));
    }

private:
    Descriptor m_file;
};

class FileLockTest : public testing::Test
{
protected:
    const TemporaryFolder m_folder;
    const std::string m_file = m_folder.Write("cfg.xml", "old");
    const Place m_place{m_file};
};

} // namespace

TEST_F(FileLockTest, IsHeldUntilItIsDestroyed)
{
    {
        const FileLock lock(m_place, milliseconds(0));
        EXPECT_EQ(State::Held, lock.GetState());
        EXPECT_EQ(State::Busy, FileLock(m_place, milliseconds(0)).GetState());
    }
    EXPECT_EQ(State::Held, FileLock(m_place, milliseconds(0)).GetState());
}

TEST_F(FileLockTest, IsTheOneThatFlockOfTheShellTakes)
{
    const FileLock lock(m_place, milliseconds(0));
    EXPECT_NE(0, system(("flock --nonblock " + m_file + " true").c_str()));
}

TEST_F(FileLockTest, StaysHeldWhenAnotherDescriptorOfTheFileIsClosed)
{
    const FileLock lock(m_place, milliseconds(0));
    ReadFile(m_file);
    EXPECT_EQ(State::Busy, FileLock(m_place, milliseconds(0)).GetState());
}

TEST_F(FileLockTest, WaitsAsLongAsItIsAskedTo)
{
    const Owner owner(m_file);
    const auto start = std::chrono::steady_clock::now();
    EXPECT_EQ(State::Busy, FileLock(m_place, milliseconds(30)).GetState());
    EXPECT_LE(milliseconds(30), std::chrono::steady_clock::now() - start);
}

TEST_F(FileLockTest, IsHadWhenItsOwnerGivesItUp)
{
    auto owner = std::make_unique<Owner>(m_file);
    std::thread other(
        [&]
        {
            std::this_thread::sleep_for(milliseconds(20));
            owner.reset();
        });
    EXPECT_EQ(State::Held, FileLock(m_place, milliseconds(60000)).GetState());
    other.join();
}

TEST_F(FileLockTest, IsOnTheFileThatHasTheNameWhenItIsHad)
{
    auto owner = std::make_unique<Owner>(m_file);
    std::thread other(
        [&]
        {
            std::this_thread::sleep_for(milliseconds(20));
            rename(m_folder.Write("new", "new").c_str(), m_file.c_str());
            owner.reset();
        });
    const FileLock lock(m_place, milliseconds(60000));
    other.join();
    EXPECT_EQ(State::Held, lock.GetState());
    EXPECT_TRUE(m_place.Has(lock.File()));
}

TEST_F(FileLockTest, LeavesNothingBehind)
{
    {
        const FileLock lock(m_place, milliseconds(0));
    }
    EXPECT_EQ(0, unlink(m_file.c_str()));
    EXPECT_EQ(0, rmdir(m_folder.Path("").c_str()));
}

TEST_F(FileLockTest, ReportsAFileSystemWithoutLocks)
{
    for (const int error : {ENOLCK, EOPNOTSUPP, ENOSYS})
    {
        const NoLocks none(error);
        const FileLock lock(m_place, milliseconds(60000));
        EXPECT_EQ(State::Unsupported, lock.GetState());
        EXPECT_EQ(error, lock.Error().value());
        EXPECT_LE(0, lock.File());
    }
}

TEST_F(FileLockTest, ReportsAFileThatCannotBeOpened)
{
    const Place missing(m_folder.Path("missing.xml"));
    const FileLock lock(missing, milliseconds(60000));
    EXPECT_EQ(State::NotOpened, lock.GetState());
    EXPECT_EQ(ENOENT, lock.Error().value());
    EXPECT_GT(0, lock.File());
}
