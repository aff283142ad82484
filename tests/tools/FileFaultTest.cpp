// Each call of the system that a load or a save needs can fail, or meet what another process does
// at the same time.

#include "FileCalls.h"
#include "SharedAcl.h"

#include "file/Debris.h"
#include "file/Destination.h"
#include "file/FileAttributes.h"
#include "file/Input.h"
#include "file/Replacement.h"
#include "support/Files.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cstring>
#include <filesystem>
#include <sstream>

#include <fcntl.h>
#include <signal.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>
#include <sys/xattr.h>

using namespace kxtest;
using std::chrono::seconds;
using testing::ElementsAre;
using testing::HasSubstr;
using Role = Destination::Role;

namespace fs = std::filesystem;

namespace
{

class FileFault : public testing::Test
{
protected:
    /** @return the message with which saving fails; empty if it does not. */
    std::string Save(const std::string& path, Destination::Options options = {},
                     Role role = Role::LoadedFile)
    {
        try
        {
            Destination destination(path, role, seconds(0));
            destination.Save("new", options);
            return destination.SyncWarning();
        }
        catch (const Failure& failure)
        {
            EXPECT_EQ(ExitStatus::NotSaved, failure.Status());
            return failure.Message();
        }
    }

    std::string CannotSave(const std::string& reason) const
    {
        return "cannot save " + m_file + ": " + reason;
    }

    void ExpectOld() const
    {
        EXPECT_EQ("old", ReadFile(m_file));
        EXPECT_EQ(1, FilesInFolder());
    }

    long FilesInFolder() const
    {
        const fs::directory_iterator files(m_folder.Path(""));
        return std::distance(begin(files), end(files));
    }

    const TemporaryFolder m_folder;
    const std::string m_file = m_folder.Write("cfg.xml", "old");
};

/** Where files have no name until they are in place, or where there are none such. */
class SaveFault : public FileFault, public testing::WithParamInterface<bool>
{
protected:
    SaveFault()
    {
        if (!GetParam())
        {
            m_noUnnamed.emplace();
        }
    }

    std::optional<NoUnnamedFiles> m_noUnnamed;
};

int ErrorOf(const std::function<void()>& act)
{
    try
    {
        act();
    }
    catch (const std::system_error& error)
    {
        return error.code().value();
    }
    return 0;
}

} // namespace

INSTANTIATE_TEST_SUITE_P(, SaveFault, testing::Bool(),
                         [](const testing::TestParamInfo<bool>& way)
                         { return way.param ? "Unnamed" : "Named"; });

TEST_P(SaveFault, AFullDiskIsTheReason)
{
    const FailingCall full("write", ENOSPC);
    EXPECT_EQ(CannotSave("No space left on device"), Save(m_file));
    ExpectOld();
}

TEST_P(SaveFault, AnInterruptedWriteIsRepeated)
{
    const FailingCall interrupted("write", EINTR, 1);
    EXPECT_EQ("", Save(m_file));
    EXPECT_EQ("new", ReadFile(m_file));
}

TEST_P(SaveFault, AFileThatCannotBeSyncedDoesNotReplaceTheOldOne)
{
    const FailingCall broken("fsync", EIO, 1);
    EXPECT_EQ(CannotSave("Input/output error"), Save(m_file));
    ExpectOld();
}

TEST_P(SaveFault, AFileThatCannotBeRenamedVanishes)
{
    const FailingCall refused("renameat", EPERM);
    EXPECT_EQ(CannotSave("Operation not permitted"), Save(m_file));
    ExpectOld();
}

TEST_P(SaveFault, ReportsThatTheFolderWasNotSynced)
{
    const FailingCall broken("fsync", EIO, 2);
    EXPECT_EQ(m_file + " is saved, but may not survive a power failure: Input/output error",
              Save(m_file));
    EXPECT_EQ("new", ReadFile(m_file));
}

TEST_P(SaveFault, SomeFoldersCannotBeSynced)
{
    for (const int error : {EBADF, EINVAL})
    {
        const FailingCall refused("fsync", error, 2);
        EXPECT_EQ("", Save(m_file)) << error;
    }
}

TEST_P(SaveFault, ABackupThatCannotBeLinkedIsTheReason)
{
    const FailingCall refused("linkat", EMLINK, 1);
    Destination::Options options;
    options.backupSuffix = "~";
    EXPECT_EQ(CannotSave("cannot keep " + m_file + "~: Too many links"), Save(m_file, options));
    ExpectOld();
}

TEST_P(SaveFault, TheFoldersPermissionsAreTheReason)
{
    {
        // The first call opens the file to lock it, the others make the new one.
        const BeforeCall refused("openat", [](int number) { return number == 1 ? 0 : EACCES; });
        EXPECT_EQ(CannotSave("cannot create a file in its directory: Permission denied"),
                  Save(m_file));
    }
    ExpectOld();
}

TEST_F(FileFault, AFileThatCannotBeLinkedVanishes)
{
    const FailingCall refused("linkat", EPERM);
    EXPECT_EQ(CannotSave("Operation not permitted"), Save(m_file));
    ExpectOld();
}

TEST_F(FileFault, WithoutProcTheNewFileHasAName)
{
    const FailingCall missing("access", ENOENT);
    const Place place(m_file);
    Replacement replacement(place, 0600);
    EXPECT_EQ(2, FilesInFolder());
    replacement.TakePlace();
    EXPECT_EQ(1, FilesInFolder());
}

TEST_F(FileFault, TheFilesPermissionsAreTheReason)
{
    {
        const FailingCall refused("openat", EACCES);
        EXPECT_EQ(CannotSave("Permission denied"), Save(m_file));
    }
    ExpectOld();
}

TEST_F(FileFault, ALockThatIsInterruptedIsTriedAgain)
{
    const FailingCall interrupted("flock", EINTR, 1);
    const FileLock lock(Place(m_file), seconds(5));
    EXPECT_EQ(FileLock::State::Held, lock.GetState());
}

TEST_F(FileFault, TheFileThatHasTheNameIsLocked)
{
    const std::string other = m_folder.Write("other.xml", "other");
    const BeforeCall replaced("flock",
                              [&](int number)
                              {
                                  if (number == 1)
                                  {
                                      fs::rename(other, m_file);
                                  }
                                  return 0;
                              });
    const Place place(m_file);
    const FileLock lock(place, seconds(5));
    EXPECT_EQ(FileLock::State::Held, lock.GetState());
    EXPECT_TRUE(place.Has(lock.File()));
    EXPECT_EQ("other", ReadFile(m_file));
}

TEST_F(FileFault, ANewFileThatIsTakenForDebrisIsMadeAgain)
{
    const NoUnnamedFiles named;
    const BeforeCall removed("flock",
                             [&](int number)
                             {
                                 for (const auto& entry : fs::directory_iterator(m_folder.Path("")))
                                 {
                                     if (number == 1 && entry.path() != m_file)
                                     {
                                         fs::remove(entry.path());
                                     }
                                 }
                                 return 0;
                             });
    const Place place(m_file);
    Replacement replacement(place, 0600);
    EXPECT_EQ(2, FilesInFolder());
    replacement.TakePlace();
    EXPECT_TRUE(place.Has(replacement.File()));
}

TEST_F(FileFault, ANewFileThatOthersKeepLockingIsGivenUp)
{
    const NoUnnamedFiles named;
    const FailingCall busy("flock", EWOULDBLOCK);
    const Place place(m_file);
    EXPECT_EQ(EBUSY, ErrorOf([&] { Replacement(place, 0600); }));
    ExpectOld();
}

TEST_F(FileFault, DebrisThatCannotBeOpenedStays)
{
    m_folder.Write(NameOfReplacement(), "");
    const Place place(m_file);
    for (const int number : {1, 2}) // the folder, the file
    {
        const FailingCall refused("openat", EACCES, number);
        RemoveDebris(place);
        EXPECT_EQ(2, FilesInFolder()) << number;
    }
}

TEST_F(FileFault, ASignalIsPassedOnToTheHandlerBefore)
{
    static int received;
    received = 0;
    struct sigaction before = {};
    struct sigaction counting = {};
    counting.sa_handler = [](int) { ++received; };
    sigaction(SIGTERM, &counting, &before);
    const NoUnnamedFiles named;
    const Place place(m_file);
    {
        const Replacement replacement(place, 0600);
        EXPECT_EQ(2, FilesInFolder());
        raise(SIGTERM);
        EXPECT_EQ(1, FilesInFolder());
    }
    sigaction(SIGTERM, &before, nullptr);
    EXPECT_EQ(1, received);
}

TEST_F(FileFault, AnIgnoredSignalRemovesNothing)
{
    struct sigaction before = {};
    struct sigaction ignoring = {};
    ignoring.sa_handler = SIG_IGN;
    sigaction(SIGHUP, &ignoring, &before);
    const NoUnnamedFiles named;
    const Place place(m_file);
    {
        Replacement replacement(place, 0600);
        raise(SIGHUP);
        replacement.TakePlace();
    }
    sigaction(SIGHUP, &before, nullptr);
    EXPECT_EQ("", ReadFile(m_file));
}

TEST_F(FileFault, AFileWhoseTimeChangedIsRefused)
{
    for (const long nanoseconds : {0L, 1L})
    {
        struct stat status = {};
        ASSERT_EQ(0, stat(m_file.c_str(), &status));
        timespec times[] = {status.st_atim, status.st_mtim};
        times[1].tv_sec -= nanoseconds == 0 ? 1 : 0;
        times[1].tv_nsec = (times[1].tv_nsec + nanoseconds) % 1000000000;
        const BeforeCall written("write",
                                 [&](int)
                                 {
                                     utimensat(AT_FDCWD, m_file.c_str(), times, 0);
                                     return 0;
                                 });
        EXPECT_EQ("not saved: " + m_file + " was changed by another program in the meantime",
                  Save(m_file));
        ExpectOld();
    }
}

TEST_F(FileFault, ASocketIsNoStreamToWriteTo)
{
    sockaddr_un address = {};
    address.sun_family = AF_UNIX;
    const std::string path = m_folder.Path("s");
    std::strncpy(address.sun_path, path.c_str(), sizeof address.sun_path - 1);
    const Descriptor server(socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0));
    ASSERT_EQ(0, bind(server.Get(), reinterpret_cast<sockaddr*>(&address), sizeof address));
    EXPECT_EQ("cannot save " + path + ": No such device or address",
              Save(path, {}, Role::OtherFile));
}

TEST_F(FileFault, ADryRunWritesToNoStream)
{
    Destination::Options options;
    options.dryRun = true;
    EXPECT_EQ("", Save("/dev/full", options, Role::OtherFile));
}

TEST_F(FileFault, AnUnreadableAttributeIsNamed)
{
    const Descriptor old(open(m_file.c_str(), O_RDWR | O_CLOEXEC));
    if (fsetxattr(old.Get(), "user.note", "text", 4, 0) != 0)
    {
        GTEST_SKIP() << "needs a file system with extended attributes";
    }
    const FailingCall refused("fgetxattr", EPERM);
    const Attributes attributes(old.Get());
    EXPECT_THAT(attributes.MissingFrom(attributes), ElementsAre("the attribute user.note"));
}

TEST_F(FileFault, AnAttributeThatGrowsIsReadAgain)
{
    const Descriptor old(open(m_file.c_str(), O_RDWR | O_CLOEXEC));
    if (fsetxattr(old.Get(), "user.note", "text", 4, 0) != 0)
    {
        GTEST_SKIP() << "needs a file system with extended attributes";
    }
    const FailingCall grown("fgetxattr", ERANGE, 2);
    const Attributes attributes(old.Get());
    const Descriptor copy(open(m_folder.Write("copy", "").c_str(), O_RDWR | O_CLOEXEC));
    attributes.ApplyTo(copy.Get());
    char value[4];
    EXPECT_EQ(4, fgetxattr(copy.Get(), "user.note", value, sizeof value));
}

TEST_F(FileFault, AttributesThatCannotBeListedAreTheReason)
{
    const FailingCall broken("flistxattr", EIO);
    EXPECT_EQ(CannotSave("Input/output error"), Save(m_file));
    EXPECT_EQ(EBADF, ErrorOf([] { Attributes(-1); }));
    ExpectOld();
}

TEST_F(FileFault, AFileSystemWithoutAttributesLosesNone)
{
    for (const int error : {ENOTSUP, ENOSYS})
    {
        const FailingCall missing("flistxattr", error);
        EXPECT_EQ("", Save(m_file)) << error;
    }
}

TEST_F(FileFault, AnAttributeThatCannotBeSetIsNamed)
{
    if (setxattr(m_file.c_str(), "user.note", "text", 4, 0) != 0)
    {
        GTEST_SKIP() << "needs a file system with extended attributes";
    }
    const FailingCall full("fsetxattr", ENOSPC);
    EXPECT_THAT(Save(m_file), HasSubstr("it would lose the attribute user.note"));
    ExpectOld();
}

TEST_F(FileFault, AnAclThatCannotBeKeptGivesTheGroupNoMoreThanBefore)
{
    if (setxattr(m_file.c_str(), g_acl, g_sharedAcl.data(), g_sharedAcl.size(), 0) != 0)
    {
        GTEST_SKIP() << "needs a file system with ACLs";
    }
    setxattr(m_file.c_str(), "user.note", "text", 4, 0);
    {
        const FailingCall refused("fsetxattr", EPERM);
        EXPECT_THAT(Save(m_file), HasSubstr("it would lose its permissions, its ACL"));
    }
    const FailingCall refused("fsetxattr", EPERM, 1); // the other attribute is kept
    Destination::Options options;
    options.dropAttributes = true;
    EXPECT_EQ("", Save(m_file, options));
    struct stat status = {};
    ASSERT_EQ(0, stat(m_file.c_str(), &status));
    EXPECT_EQ(0640u, status.st_mode & 0777u);
}

TEST_F(FileFault, AGroupThatCannotBeKeptHasNoRights)
{
    const Descriptor old(open(m_file.c_str(), O_RDWR | O_CLOEXEC));
    const Descriptor copy(open(m_folder.Write("copy", "").c_str(), O_RDWR | O_CLOEXEC));
    ASSERT_EQ(0, fchmod(old.Get(), 0664));
    const FailingCall refused("fchown", EPERM);
    const Attributes attributes(old.Get());
    attributes.ApplyTo(copy.Get());
    EXPECT_THAT(attributes.MissingFrom(Attributes(copy.Get())), ElementsAre("its permissions"));
    struct stat status = {};
    fstat(copy.Get(), &status);
    EXPECT_EQ(0604u, status.st_mode & 0777u);
}

TEST_F(FileFault, SpecialBitsGoWithAnOwnerThatCannotBeKept)
{
    const Descriptor old(open(m_file.c_str(), O_RDWR | O_CLOEXEC));
    const Descriptor copy(open(m_folder.Write("copy", "").c_str(), O_RDWR | O_CLOEXEC));
    if (fchown(old.Get(), 1234, 4321) != 0)
    {
        GTEST_SKIP() << "needs to run as the superuser, to give a file to another user";
    }
    ASSERT_EQ(0, fchmod(old.Get(), 06775));
    const FailingCall refused("fchown", EPERM, 1); // the owner; the group is tried after it
    const Attributes attributes(old.Get());
    attributes.ApplyTo(copy.Get());
    EXPECT_THAT(attributes.MissingFrom(Attributes(copy.Get())), ElementsAre("its owner"));
    struct stat status = {};
    fstat(copy.Get(), &status);
    EXPECT_EQ(0775u, status.st_mode & 07777u);
}

TEST_F(FileFault, AStreamThatDoesNotEndIsRefused)
{
    std::istringstream stream("more than four bytes");
    EXPECT_EQ(EFBIG, ErrorOf([&] { Input(stream, 4); }));
}

TEST_F(FileFault, InputThatCannotBeCopiedIsTheReason)
{
    std::istringstream stream("text");
    const FailingCall missing("memfd_create", ENOSYS);
    EXPECT_EQ(ENOSYS, ErrorOf([&] { Input input(stream); }));
}

TEST_F(FileFault, APipeThatCannotBeReadIsTheReason)
{
    const std::string path = m_folder.Path("pipe");
    ASSERT_EQ(0, mkfifo(path.c_str(), 0600));
    const Descriptor writer(open(path.c_str(), O_RDWR | O_CLOEXEC));
    WriteAll(writer.Get(), "text");
    {
        const FailingCall missing("memfd_create", ENOSYS);
        EXPECT_EQ(ENOSYS, ErrorOf([&] { Input input(path); }));
    }
    const BeforeCall broken("read", [](int number) { return number == 1 ? EINTR : EIO; });
    EXPECT_EQ(EIO, ErrorOf([&] { Input input(path); }));
}

TEST_F(FileFault, ANameLikeAnAddressIsAFileName)
{
    fs::create_directory(m_folder.Path("http:"));
    m_folder.Write("http:/cfg.xml", "");
    const std::string absolute = m_folder.Path("http:") + "//cfg.xml";
    EXPECT_EQ(absolute, Input(absolute).Path());
    const fs::path before = fs::current_path();
    fs::current_path(m_folder.Path(""));
    const std::string relative = "http://cfg.xml";
    EXPECT_EQ("./" + relative, Input(relative).Path());
    fs::current_path(before);
}

TEST_F(FileFault, APlaceHasOnlyTheFileWithItsName)
{
    const Place place(m_file);
    const Descriptor other(open(m_folder.Write("other", "").c_str(), O_RDONLY | O_CLOEXEC));
    const Descriptor device(open("/dev/null", O_RDONLY | O_CLOEXEC));
    EXPECT_FALSE(place.Has(other.Get()));
    EXPECT_FALSE(place.Has(device.Get()));
    EXPECT_FALSE(place.Has(-1));
    fs::remove(m_file);
    EXPECT_FALSE(place.Has(other.Get()));
}

TEST_F(FileFault, OnlyANumberNamesADescriptor)
{
    EXPECT_EQ(1, DescriptorNamedBy("/proc/self/fd/1"));
    for (const std::string name : {"/proc/self/fd/1x", "/proc/self/fd/x", "/proc/self/fd/"})
    {
        EXPECT_EQ(std::nullopt, DescriptorNamedBy(name)) << name;
    }
}

TEST_F(FileFault, AnAttributeThatVanishesWhileItIsReadIsNamed)
{
    if (setxattr(m_file.c_str(), "user.note", "text", 4, 0) != 0)
    {
        GTEST_SKIP() << "needs a file system with extended attributes";
    }
    {
        const FailingCall vanished("fgetxattr", ENODATA, 2);
        EXPECT_THAT(Save(m_file), HasSubstr("it would lose the attribute user.note"));
    }
    {
        const FailingCall grown("flistxattr", ERANGE, 2);
        EXPECT_EQ("", Save(m_file));
    }
    char value[4];
    EXPECT_EQ(4, getxattr(m_file.c_str(), "user.note", value, sizeof value));
}

TEST_F(FileFault, AnAclThatCannotBeTakenAwayIsAPermission)
{
    const Descriptor old(open(m_file.c_str(), O_RDWR | O_CLOEXEC));
    const Descriptor copy(open(m_folder.Write("copy", "").c_str(), O_RDWR | O_CLOEXEC));
    if (fsetxattr(copy.Get(), g_acl, g_sharedAcl.data(), g_sharedAcl.size(), 0) != 0)
    {
        GTEST_SKIP() << "needs a file system with ACLs";
    }
    ASSERT_EQ(0, fchmod(old.Get(), 0660));
    const FailingCall refused("fremovexattr", EPERM);
    const Attributes attributes(old.Get());
    attributes.ApplyTo(copy.Get());
    EXPECT_THAT(attributes.MissingFrom(Attributes(copy.Get())), ElementsAre("its permissions"));
}

TEST_F(FileFault, TheOldAclTakesThePlaceOfAnInheritedOne)
{
    const Descriptor old(open(m_file.c_str(), O_RDWR | O_CLOEXEC));
    const Descriptor copy(open(m_folder.Write("copy", "").c_str(), O_RDWR | O_CLOEXEC));
    std::string inherited = g_sharedAcl;
    inherited[14] = 4; // the other user may only read
    if (fsetxattr(old.Get(), g_acl, g_sharedAcl.data(), g_sharedAcl.size(), 0) != 0 ||
        fsetxattr(copy.Get(), g_acl, inherited.data(), inherited.size(), 0) != 0)
    {
        GTEST_SKIP() << "needs a file system with ACLs";
    }
    const Attributes attributes(old.Get());
    attributes.ApplyTo(copy.Get());
    EXPECT_THAT(attributes.MissingFrom(Attributes(copy.Get())), ElementsAre());
}

TEST_F(FileFault, WithoutLocksANewFileIsMadeAllTheSame)
{
    const NoUnnamedFiles named;
    const FailingCall missing("flock", ENOLCK);
    EXPECT_EQ("", Save(m_file));
    EXPECT_EQ("new", ReadFile(m_file));
}
