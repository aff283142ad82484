// Saving fails after the n-th byte, for each n: the status reports it, the document is unchanged,
// and saving succeeds as soon as there is space.

#include "CXMLWriter.h"
#include "CXmlParser.h"

#include "support/Engine.h"
#include "support/Files.h"

#include <gtest/gtest.h>

#include <sys/resource.h>

#include <csignal>
#include <functional>

using namespace kxtest;

namespace
{

/** Lets no file of the process grow beyond some bytes, as long as the object lives. */
class RoomForFiles
{
public:
    explicit RoomForFiles(std::size_t bytes) : m_signal(std::signal(SIGXFSZ, SIG_IGN))
    {
        getrlimit(RLIMIT_FSIZE, &m_before);
        rlimit limit = m_before;
        limit.rlim_cur = bytes;
        setrlimit(RLIMIT_FSIZE, &limit);
    }
    ~RoomForFiles()
    {
        setrlimit(RLIMIT_FSIZE, &m_before);
        std::signal(SIGXFSZ, m_signal);
    }
    RoomForFiles(const RoomForFiles&) = delete;
    RoomForFiles& operator=(const RoomForFiles&) = delete;

private:
    void (*m_signal)(int);
    rlimit m_before = {};
};

class WriteFaultTest : public testing::Test
{
protected:
    /** Calls @p save with room for ever more bytes, until the file fits. */
    void SaveWithEverMoreRoom(const std::function<int()>& save, std::size_t step)
    {
        ASSERT_EQ(0, save());
        const std::string whole = ReadFile(m_file);
        ASSERT_LT(step, whole.size());
        for (std::size_t room = 0; room < whole.size(); room += step)
        {
            SCOPED_TRACE("room for " + std::to_string(room) + " of " +
                         std::to_string(whole.size()) + " bytes");
            {
                const RoomForFiles limit(room);
                EXPECT_EQ(-2, save());
            }
            // Saved in place: what the file held is lost, and no more than fits is in it.
            EXPECT_EQ(whole.substr(0, ReadFile(m_file).size()), ReadFile(m_file));
            EXPECT_LE(ReadFile(m_file).size(), room);

            ASSERT_EQ(0, save());
            ASSERT_EQ(whole, ReadFile(m_file));
        }
        const RoomForFiles limit(whole.size());
        EXPECT_EQ(0, save());
        TakeEngineErrors();
    }

    static std::string Document(std::size_t elements)
    {
        std::string text;
        for (std::size_t i = 0; i != elements; ++i)
        {
            text += "<a>" + std::to_string(i) + "</a>";
        }
        return "<cfg>" + text + "</cfg>";
    }

    TemporaryFolder m_folder;
    const std::string m_small = m_folder.Write("small.xml", Document(3));
    const std::string m_large = m_folder.Write("large.xml", Document(3000));
    const std::string m_file = m_folder.Write("cfg.xml", "");
};

} // namespace

TEST_F(WriteFaultTest, WriterAfterEachByte)
{
    CXMLWriter writer(m_small);
    writer.SetPath(m_file);
    SaveWithEverMoreRoom([&] { return writer.SaveData(); }, 1);
}

TEST_F(WriteFaultTest, WriterWithinEachBlock)
{
    CXMLWriter writer(m_large);
    writer.SetPath(m_file);
    SaveWithEverMoreRoom([&] { return writer.SaveData(); }, 1000);
}

TEST_F(WriteFaultTest, DocumentAfterEachByte)
{
    CXmlParser parser;
    ASSERT_EQ(0, parser.ParseXml(m_small));
    SaveWithEverMoreRoom([&] { return parser.SaveXml(m_file); }, 1);
}

TEST_F(WriteFaultTest, DocumentWithinEachBlock)
{
    CXmlParser parser;
    ASSERT_EQ(0, parser.ParseXml(m_large));
    SaveWithEverMoreRoom([&] { return parser.SaveXml(m_file); }, 1000);
}
