#include "file/Place.h"
#include "support/Files.h"

#include <gtest/gtest.h>

#include <fcntl.h>
#include <unistd.h>

using namespace kxtest;

namespace
{

class PlaceTest : public testing::Test
{
protected:
    const TemporaryFolder m_folder;
    const std::string m_file = m_folder.Write("cfg.xml", "text");

    std::string Link(const std::string& name, const std::string& target) const
    {
        EXPECT_EQ(0, symlink(target.c_str(), m_folder.Path(name).c_str()));
        return m_folder.Path(name);
    }

    int ErrorOf(const std::string& path) const
    {
        try
        {
            const Place place(path);
        }
        catch (const std::system_error& error)
        {
            return error.code().value();
        }
        return 0;
    }
};

} // namespace

TEST_F(PlaceTest, IsTheFileAtTheEndOfTheLinks)
{
    const Place place(Link("outer", Link("inner", "cfg.xml")));
    EXPECT_STREQ("cfg.xml", place.Name());
    EXPECT_EQ(4, place.Status()->st_size);
}

TEST_F(PlaceTest, CanBeThatOfAFileThatIsYetToBe)
{
    const Place place(Link("link", "new.xml"));
    EXPECT_STREQ("new.xml", place.Name());
    EXPECT_FALSE(place.Status());
}

TEST_F(PlaceTest, NeedsAFolder)
{
    EXPECT_EQ(ENOENT, ErrorOf(m_folder.Path("nowhere/cfg.xml")));
    EXPECT_EQ(ENOTDIR, ErrorOf(m_file + "/cfg.xml"));
    EXPECT_EQ(ELOOP, ErrorOf(Link("circle", "circle")));
}

TEST_F(PlaceTest, StaysInItsFolderWhateverTheFolderIsCalled)
{
    const std::string folder = m_folder.Path("folder");
    ASSERT_EQ(0, mkdir(folder.c_str(), 0700));
    WriteFile(folder + "/cfg.xml", "12345");
    const Place place(folder + "/cfg.xml");
    ASSERT_EQ(0, rename(folder.c_str(), m_folder.Path("other").c_str()));
    EXPECT_EQ(5, place.Status()->st_size);
}

TEST_F(PlaceTest, KnowsWhetherAnOpenFileHasTheName)
{
    const Place place(m_file);
    const Descriptor file(open(m_file.c_str(), O_RDONLY | O_CLOEXEC));
    EXPECT_TRUE(place.Has(file.Get()));
    ASSERT_EQ(0, rename(m_folder.Write("new", "text").c_str(), m_file.c_str()));
    EXPECT_FALSE(place.Has(file.Get()));
}

TEST_F(PlaceTest, SyncsItsFolder)
{
    EXPECT_FALSE(Place(m_file).SyncFolder());
}

TEST_F(PlaceTest, DescriptorsHaveNamesToo)
{
    EXPECT_EQ(1, DescriptorNamedBy("/dev/stdout"));
    EXPECT_EQ(0, DescriptorNamedBy("/dev/fd/0"));
    EXPECT_EQ(77, DescriptorNamedBy("/proc/self/fd/77"));
    EXPECT_EQ(1, DescriptorNamedBy(Link("link", "/dev/stdout")));
    EXPECT_EQ(std::nullopt, DescriptorNamedBy("/proc/self/fd/x"));
    EXPECT_EQ(std::nullopt, DescriptorNamedBy("/dev/null"));
    EXPECT_EQ(std::nullopt, DescriptorNamedBy("1"));
    EXPECT_EQ(std::nullopt, DescriptorNamedBy(m_file));
    EXPECT_EQ(std::nullopt, DescriptorNamedBy(Link("circle", "circle")));
    EXPECT_EQ(std::nullopt, DescriptorNamedBy(m_folder.Path("nowhere/cfg.xml")));
}
