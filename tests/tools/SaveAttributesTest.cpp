#include "SharedAcl.h"
#include "file/FileAttributes.h"

#include "file/Descriptor.h"
#include "support/Files.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <fcntl.h>
#include <sys/wait.h>
#include <sys/xattr.h>

using namespace kxtest;
using testing::ElementsAre;

namespace
{

class AttributesTest : public testing::Test
{
protected:
    bool Give(const char* name, const std::string& value)
    {
        return fsetxattr(m_old.Get(), name, value.data(), value.size(), 0) == 0;
    }

    std::vector<std::string> Apply() const
    {
        const Attributes attributes(m_old.Get());
        attributes.ApplyTo(m_new.Get());
        return attributes.MissingFrom(Attributes(m_new.Get()));
    }

    /** The same by a process of another user, who owns the new file. */
    std::vector<std::string> ApplyAsNobody() const
    {
        EXPECT_EQ(0, fchown(m_new.Get(), 65534, 65534));
        const pid_t child = fork();
        if (child == 0)
        {
            _exit(setgid(65534) != 0 || setuid(65534) != 0 || (Apply(), false));
        }
        int status = 0;
        waitpid(child, &status, 0);
        EXPECT_EQ(0, status);
        return Attributes(m_old.Get()).MissingFrom(Attributes(m_new.Get()));
    }

    unsigned NewMode() const
    {
        struct stat status = {};
        fstat(m_new.Get(), &status);
        return status.st_mode & 07777;
    }

    const TemporaryFolder m_folder;
    const Descriptor m_old{open(m_folder.Write("old", "").c_str(), O_RDWR | O_CLOEXEC)};
    const Descriptor m_new{open(m_folder.Write("new", "").c_str(), O_RDWR | O_CLOEXEC)};
};

} // namespace

TEST_F(AttributesTest, KeepPermissions)
{
    for (const mode_t mode : {0600u, 0644u, 0777u, 0400u, 0u})
    {
        ASSERT_EQ(0, fchmod(m_old.Get(), mode));
        EXPECT_THAT(Apply(), ElementsAre());
        EXPECT_EQ(mode, NewMode());
    }
}

TEST_F(AttributesTest, KeepExtendedAttributes)
{
    const std::string large(3000, 'x');
    if (!Give("user.note", "text") || !Give("user.large", large) || !Give("user.empty", ""))
    {
        GTEST_SKIP() << "needs a file system with extended attributes";
    }
    fsetxattr(m_new.Get(), "user.note", "other", 5, 0);
    fsetxattr(m_new.Get(), "user.more", "other", 5, 0);
    EXPECT_THAT(Apply(), ElementsAre());
    std::string value(large.size(), '\0');
    EXPECT_EQ(3000, fgetxattr(m_new.Get(), "user.large", value.data(), value.size()));
    EXPECT_EQ(large, value);
    EXPECT_EQ(4, fgetxattr(m_new.Get(), "user.note", value.data(), value.size()));
    EXPECT_EQ(0, fgetxattr(m_new.Get(), "user.empty", value.data(), value.size()));
    EXPECT_EQ(-1, fgetxattr(m_new.Get(), "user.more", value.data(), value.size()));
}

TEST_F(AttributesTest, KeepTheAcl)
{
    if (!Give(g_acl, g_sharedAcl))
    {
        GTEST_SKIP() << "needs a file system with ACLs";
    }
    EXPECT_THAT(Apply(), ElementsAre());
    std::string acl(100, '\0');
    const ssize_t size = fgetxattr(m_new.Get(), g_acl, acl.data(), acl.size());
    ASSERT_EQ(static_cast<ssize_t>(g_sharedAcl.size()), size);
    EXPECT_EQ(g_sharedAcl, acl.substr(0, g_sharedAcl.size()));
    EXPECT_EQ(0660u, NewMode());
}

TEST_F(AttributesTest, TakeAwayAnAclThatOnlyTheNewFileHas)
{
    if (fsetxattr(m_new.Get(), g_acl, g_sharedAcl.data(), g_sharedAcl.size(), 0) != 0)
    {
        GTEST_SKIP() << "needs a file system with ACLs";
    }
    ASSERT_EQ(0, fchmod(m_old.Get(), 0640));
    EXPECT_THAT(Apply(), ElementsAre());
    EXPECT_EQ(-1, fgetxattr(m_new.Get(), g_acl, nullptr, 0));
    EXPECT_EQ(0640u, NewMode());
}

TEST_F(AttributesTest, DoNotKeepAChecksumOfTheOldContent)
{
    if (!Give("security.ima", "checksum"))
    {
        GTEST_SKIP() << "needs to run as the superuser, to give a file this attribute";
    }
    EXPECT_THAT(Apply(), ElementsAre("the attribute security.ima"));
    EXPECT_EQ(-1, fgetxattr(m_new.Get(), "security.ima", nullptr, 0));
}

class AttributesOfOthersTest : public AttributesTest
{
protected:
    void SetUp() override
    {
        if (geteuid() != 0)
        {
            GTEST_SKIP() << "needs to run as the superuser, to become another user";
        }
    }
};

TEST_F(AttributesOfOthersTest, KeepOwnerAndGroupAndSpecialBits)
{
    ASSERT_EQ(0, fchown(m_old.Get(), 1234, 4321));
    ASSERT_EQ(0, fchmod(m_old.Get(), 06755));
    EXPECT_THAT(Apply(), ElementsAre());
    EXPECT_EQ(06755u, NewMode());
}

TEST_F(AttributesOfOthersTest, SpecialBitsGoWithTheOwner)
{
    ASSERT_EQ(0, fchown(m_old.Get(), 1234, 65534));
    ASSERT_EQ(0, fchmod(m_old.Get(), 06775));
    EXPECT_THAT(ApplyAsNobody(), ElementsAre("its owner"));
    EXPECT_EQ(0775u, NewMode());
}

TEST_F(AttributesOfOthersTest, AnotherGroupGetsNoRights)
{
    ASSERT_EQ(0, fchown(m_old.Get(), 65534, 4321));
    ASSERT_EQ(0, fchmod(m_old.Get(), 0664));
    EXPECT_THAT(ApplyAsNobody(), ElementsAre("its group"));
    EXPECT_EQ(0604u, NewMode());
}

TEST_F(AttributesOfOthersTest, NameWhatOnlyTheSuperuserCanKeep)
{
    if (!Give("security.note", "text"))
    {
        GTEST_SKIP() << "needs a file system with extended attributes";
    }
    ASSERT_EQ(0, fchown(m_old.Get(), 65534, 65534));
    EXPECT_THAT(ApplyAsNobody(), ElementsAre("the attribute security.note"));
}
