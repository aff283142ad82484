#include "file/Input.h"
#include "support/Files.h"

#include <gtest/gtest.h>

#include <thread>

#include <fcntl.h>
#include <sys/stat.h>

using namespace kxtest;

namespace
{

class InputTest : public testing::Test
{
protected:
    int ErrorOf(const std::string& path, size_t most = Input::kMostFromPipe) const
    {
        try
        {
            const Input input(path, most);
        }
        catch (const std::system_error& error)
        {
            return error.code().value();
        }
        return 0;
    }

    std::string MakePipe() const
    {
        const std::string pipe = m_folder.Path("pipe");
        EXPECT_EQ(0, mkfifo(pipe.c_str(), 0600));
        return pipe;
    }

    const TemporaryFolder m_folder;
};

} // namespace

TEST_F(InputTest, AFileIsLoadedByItsOwnName)
{
    const std::string file = m_folder.Write("cfg.xml", "text");
    EXPECT_EQ(file, Input(file).Path());
}

TEST_F(InputTest, APipeIsReadToItsEndAndCanBeLoadedMoreThanOnce)
{
    const std::string pipe = MakePipe();
    const std::string text(200000, 'x'); // more than a pipe holds
    std::thread writer([&] { WriteFile(pipe, text); });
    const Input input(pipe);
    writer.join();
    EXPECT_EQ(text, ReadFile(input.Path()));
    EXPECT_EQ(text, ReadFile(input.Path()));
}

TEST_F(InputTest, APipeThatDoesNotEndIsRefused)
{
    const std::string pipe = MakePipe();
    const Descriptor writer(open(pipe.c_str(), O_RDWR | O_CLOEXEC));
    WriteAll(writer.Get(), "four");
    EXPECT_EQ(EFBIG, ErrorOf(pipe, 3));
}

TEST_F(InputTest, AFolderIsNoFileToLoad)
{
    EXPECT_EQ(EISDIR, ErrorOf(m_folder.Path("")));
    EXPECT_EQ(ENOENT, ErrorOf(m_folder.Path("missing.xml")));
    EXPECT_EQ(ENOENT, ErrorOf(""));
}
