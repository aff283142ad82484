#include "CXMLWriter.h"

#include "support/Engine.h"
#include "support/Files.h"
#include "support/Layout.h"
#include "support/Log.h"
#include "support/Memory.h"

#include <gtest/gtest.h>

using namespace kxtest;

namespace
{

class CXMLWriterLayout : public testing::Test
{
protected:
    TemporaryFolder m_folder;
    const std::string m_file = m_folder.Write("cfg.xml", "<cfg><name>box</name></cfg>");
};

} // namespace

TEST_F(CXMLWriterLayout, IsItsTableItsDocumentAndItsPath)
{
    EXPECT_EQ(2 * sizeof(void*) + sizeof(std::string), sizeof(CXMLWriter));
    CXMLWriter writer(m_file);
    const char* const bytes = reinterpret_cast<const char*>(&writer);
    EXPECT_EQ(m_file, *reinterpret_cast<const std::string*>(bytes + 2 * sizeof(void*)));

    const xmlDocPtr document = ParseText("<cfg/>");
    CXMLWriter adopter;
    EXPECT_EQ(nullptr, PointerAt(&adopter, sizeof(void*)));
    adopter.SetDataPtr(document); // the writer's now
    EXPECT_EQ(document, PointerAt(&adopter, sizeof(void*)));
}

TEST_F(CXMLWriterLayout, BeginsWithItsInterface)
{
    CXMLWriter writer;
    EXPECT_EQ(static_cast<void*>(&writer), static_cast<IConfigWriter*>(&writer));
}

TEST_F(CXMLWriterLayout, KeepsItsSlots)
{
    using OfText = int (*)(IConfigWriter*, const std::string&);
    // A string by value is passed by the address of the caller's copy.
    using OfTexts = int (*)(IConfigWriter*, const std::string&, std::string*);
    CXMLWriter writer;
    LogRecorder log;
    EXPECT_EQ(0, Slot<OfText>(&writer, 2)(&writer, m_file));
    EXPECT_EQ(Trace("ParseFile", "+"), log.Take().front());
    std::string value = "slot";
    EXPECT_EQ(0, Slot<OfTexts>(&writer, 3)(&writer, "cfg.name", &value));
    EXPECT_EQ(Trace("SetValue", "Key cfg.name"), log.Take().front());
    EXPECT_EQ(0, Slot<int (*)(IConfigWriter*)>(&writer, 4)(&writer));
    EXPECT_EQ(Records({Trace("SaveData", "+")}), log.Take());
    EXPECT_NE(std::string::npos, ReadFile(m_file).find("<name>slot</name>"));
    EXPECT_EQ(7, Slot<OfText>(&writer, 5)(&writer, ""));
    EXPECT_EQ(Records(), log.Take());

    CXMLWriter other;
    log.Take();
    Slot<void (*)(IConfigWriter*, void*)>(&other, 6)(&other, nullptr);
    EXPECT_EQ(Records({Error("SetDataPtr", "Data Pointer not set in xml writer")}), log.Take());
}

TEST_F(CXMLWriterLayout, KeepsTheSlotsOfItsDestructors)
{
    using Destructor = void (*)(IConfigWriter*);
    {
        IConfigWriter* const owned = GetCXMLWriterObjectNoParam();
        const NewCounter heap;
        Slot<Destructor>(owned, 1)(owned);
        EXPECT_EQ(-1, heap.Live());
    }
    alignas(CXMLWriter) unsigned char storage[sizeof(CXMLWriter)];
    IConfigWriter* const placed = new (storage) CXMLWriter;
    const NewCounter heap;
    Slot<Destructor>(placed, 0)(placed);
    EXPECT_EQ(0, heap.Live());
}
