#include "CXMLReader.h"

#include "support/Files.h"
#include "support/Layout.h"
#include "support/Log.h"
#include "support/Memory.h"

#include <gtest/gtest.h>

using namespace kxtest;

namespace
{

class CXMLReaderLayout : public testing::Test
{
protected:
    TemporaryFolder m_folder;
    const std::string m_file = m_folder.Write("cfg.xml", "<cfg><name>box</name></cfg>");
};

} // namespace

TEST_F(CXMLReaderLayout, IsItsTableAndItsDocument)
{
    EXPECT_EQ(2 * sizeof(void*), sizeof(CXMLReader));
    CXMLReader reader(m_file);
    ASSERT_NE(nullptr, reader.GetDataPtr());
    EXPECT_EQ(reader.GetDataPtr(), PointerAt(&reader, sizeof(void*)));
}

TEST_F(CXMLReaderLayout, BeginsWithItsInterface)
{
    CXMLReader reader;
    EXPECT_EQ(static_cast<void*>(&reader), static_cast<IConfigReader*>(&reader));
}

TEST_F(CXMLReaderLayout, KeepsItsSlots)
{
    CXMLReader reader;
    EXPECT_EQ(0, Slot<int (*)(IConfigReader*, const std::string&)>(&reader, 2)(&reader, m_file));

    LogRecorder log;
    EXPECT_EQ("box", Slot<std::string (*)(IConfigReader*, const std::string&)>(&reader, 3)(
                         &reader, "cfg.name"));
    EXPECT_EQ(Trace("GetValue", "Key cfg.name"), log.Take().front());

    std::string value;
    EXPECT_EQ(0, Slot<int (*)(IConfigReader*, const std::string&, std::string&)>(&reader, 4)(
                     &reader, "cfg.name", value));
    EXPECT_EQ("box", value);

    EXPECT_EQ(reader.GetDataPtr(), Slot<void* (*)(IConfigReader*)>(&reader, 5)(&reader));
}

TEST_F(CXMLReaderLayout, KeepsTheSlotsOfItsDestructors)
{
    using Destructor = void (*)(IConfigReader*);
    {
        IConfigReader* const owned = GetCXMLReaderObject(m_file.c_str());
        const NewCounter heap;
        Slot<Destructor>(owned, 1)(owned);
        EXPECT_EQ(-1, heap.Live());
    }
    alignas(CXMLReader) unsigned char storage[sizeof(CXMLReader)];
    IConfigReader* const placed = new (storage) CXMLReader(m_file);
    const NewCounter heap;
    Slot<Destructor>(placed, 0)(placed);
    EXPECT_EQ(0, heap.Live());
}
