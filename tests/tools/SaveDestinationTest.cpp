#include "FileCalls.h"

#include "file/Destination.h"
#include "support/Files.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <filesystem>
#include <thread>

#include <fcntl.h>
#include <sys/file.h>
#include <sys/xattr.h>
#include <unistd.h>

using namespace kxtest;
using std::chrono::seconds;
using Role = Destination::Role;

namespace
{

class DestinationTest : public testing::Test
{
protected:
    /** @return the message with which saving fails, or an empty string. */
    std::string Save(const std::string& path, Role role = Role::LoadedFile,
                     const Destination::Options& options = {}) const
    {
        try
        {
            Destination(path, role, seconds(0)).Save("new", options);
        }
        catch (const Failure& failure)
        {
            EXPECT_EQ(ExitStatus::NotSaved, failure.Status());
            return failure.Message();
        }
        return "";
    }

    long FilesInFolder() const
    {
        const std::filesystem::directory_iterator files(m_folder.Path(""));
        return std::distance(begin(files), end(files));
    }

    const TemporaryFolder m_folder;
    const std::string m_file = m_folder.Write("cfg.xml", "old");
};

Destination::Options DryRun()
{
    Destination::Options options;
    options.dryRun = true;
    return options;
}

} // namespace

TEST_F(DestinationTest, ReplacesTheFile)
{
    EXPECT_EQ("", Save(m_file));
    EXPECT_EQ("new", ReadFile(m_file));
    EXPECT_EQ(1, FilesInFolder());
}

TEST_F(DestinationTest, ADryRunChangesNothing)
{
    EXPECT_EQ("", Save(m_file, Role::LoadedFile, DryRun()));
    EXPECT_EQ("", Save(m_folder.Path("new.xml"), Role::OtherFile, DryRun()));
    EXPECT_EQ("old", ReadFile(m_file));
    EXPECT_EQ(1, FilesInFolder());
}

TEST_F(DestinationTest, ADryRunFailsWhereSavingWould)
{
    const std::string nowhere = m_folder.Path("nowhere/cfg.xml");
    EXPECT_EQ("cannot save " + nowhere + ": No such file or directory",
              Save(nowhere, Role::OtherFile, DryRun()));
}

TEST_F(DestinationTest, AFolderIsNoFileToSave)
{
    EXPECT_EQ("cannot save " + m_folder.Path("") + ": Is a directory",
              Save(m_folder.Path(""), Role::OtherFile));
}

TEST_F(DestinationTest, ALockedFileIsRefused)
{
    const Descriptor other(open(m_file.c_str(), O_RDONLY | O_CLOEXEC));
    ASSERT_EQ(0, flock(other.Get(), LOCK_EX));
    EXPECT_EQ("not saved: " + m_file + " is locked by another process, for longer than 0 s",
              Save(m_file));
    EXPECT_EQ("old", ReadFile(m_file));
}

TEST_F(DestinationTest, KeepsTheFileLockedUntilItIsReplaced)
{
    Destination destination(m_file, Role::LoadedFile, seconds(0));
    EXPECT_EQ("", destination.LockWarning());
    EXPECT_NE("", Save(m_file));
    destination.Save("newest", {});
    EXPECT_EQ("newest", ReadFile(m_file));
    EXPECT_EQ("", Save(m_file));
}

TEST_F(DestinationTest, SavesWithoutALockWhereThereIsNone)
{
    const NoLocks none(ENOLCK);
    Destination destination(m_file, Role::LoadedFile, seconds(0));
    EXPECT_EQ(m_file + " is not locked: its file system does not support locks: No locks available",
              destination.LockWarning());
    destination.Save("new", {});
    EXPECT_EQ("new", ReadFile(m_file));
}

TEST_F(DestinationTest, AFileThatChangedSinceItWasLoadedIsRefused)
{
    Destination destination(m_file, Role::LoadedFile, seconds(0));
    WriteFile(m_file, "theirs");
    EXPECT_THROW(destination.Save("new", {}), Failure);
    EXPECT_EQ("theirs", ReadFile(m_file));
}

TEST_F(DestinationTest, AnotherFileIsReplacedWhateverItHolds)
{
    Destination destination(m_file, Role::OtherFile, seconds(0));
    WriteFile(m_file, "theirs");
    destination.Save("new", {});
    EXPECT_EQ("new", ReadFile(m_file));
}

TEST_F(DestinationTest, TheLoadedFileMustBeRegular)
{
    const std::string pipe = m_folder.Path("pipe");
    ASSERT_EQ(0, mkfifo(pipe.c_str(), 0600));
    EXPECT_EQ("cannot save " + pipe + ": it is not a regular file; --output names another one",
              Save(pipe));
}

TEST_F(DestinationTest, APipeIsWrittenAsAStream)
{
    const std::string pipe = m_folder.Path("pipe");
    ASSERT_EQ(0, mkfifo(pipe.c_str(), 0600));
    std::string read;
    std::thread reader([&] { read = ReadFile(pipe); });
    EXPECT_EQ("", Save(pipe, Role::OtherFile));
    reader.join();
    EXPECT_EQ("new", read);
    EXPECT_TRUE(std::filesystem::is_fifo(pipe));
}

TEST_F(DestinationTest, ADescriptorIsWrittenWhereItStands)
{
    const Descriptor log(open(m_file.c_str(), O_WRONLY | O_CLOEXEC));
    WriteAll(log.Get(), "log ");
    EXPECT_EQ("", Save("/dev/fd/" + std::to_string(log.Get()), Role::OtherFile));
    EXPECT_EQ("log new", ReadFile(m_file));
}

TEST_F(DestinationTest, ADescriptorThatIsNotOpenIsRefused)
{
    EXPECT_EQ("cannot save /dev/fd/997: Bad file descriptor", Save("/dev/fd/997", Role::OtherFile));
}

TEST_F(DestinationTest, KnowsTheNamesOfStandardOutput)
{
    EXPECT_TRUE(Destination("/dev/stdout", Role::OtherFile, seconds(0)).IsStandardOutput());
    EXPECT_FALSE(Destination("/dev/stderr", Role::OtherFile, seconds(0)).IsStandardOutput());
    EXPECT_FALSE(Destination(m_file, Role::OtherFile, seconds(0)).IsStandardOutput());
}

TEST_F(DestinationTest, AFullDeviceIsReportedAsThat)
{
    EXPECT_EQ("cannot save /dev/full: No space left on device", Save("/dev/full", Role::OtherFile));
}

TEST_F(DestinationTest, WhatCannotBeKeptIsNamedBeforeAnythingChanges)
{
    if (setxattr(m_file.c_str(), "security.ima", "x", 1, 0) != 0)
    {
        GTEST_SKIP() << "needs to run as the superuser, to give a file this attribute";
    }
    EXPECT_EQ("cannot save " + m_file +
                  ": it would lose the attribute security.ima (--drop-attributes saves it anyway)",
              Save(m_file));
    EXPECT_EQ("old", ReadFile(m_file));
    Destination::Options options;
    options.dropAttributes = true;
    EXPECT_EQ("", Save(m_file, Role::LoadedFile, options));
    EXPECT_EQ("new", ReadFile(m_file));
}

TEST_F(DestinationTest, RemovesWhatAKilledSaveLeft)
{
    const std::string debris = m_folder.Write(".kxconfig-0123456789abcdef.tmp", "");
    EXPECT_EQ("", Save(m_file, Role::LoadedFile, DryRun()));
    EXPECT_TRUE(FileExists(debris));
    EXPECT_EQ("", Save(m_file));
    EXPECT_FALSE(FileExists(debris));
}
