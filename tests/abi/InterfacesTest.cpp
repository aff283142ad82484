#include "IConfigReader.h"
#include "IConfigWriter.h"

#include "support/Layout.h"

#include <gtest/gtest.h>

using namespace kxtest;

namespace
{

// Each operation answers with its slot's number.

class SlotReader : public IConfigReader
{
public:
    int ParseFile(const std::string&) override { return 2; }
    std::string GetValue(const std::string&) override { return "3"; }
    int GetValue(const std::string&, std::string&) override { return 4; }
    void* GetDataPtr() override { return this; }
};

class SlotWriter : public IConfigWriter
{
public:
    int ParseFile(const std::string&) override { return 2; }
    int SetValue(const std::string&, std::string) override { return 3; }
    int SaveData() override { return 4; }
    int SetPath(const std::string&) override { return 5; }
    void SetDataPtr(void* document) override { *static_cast<int*>(document) = 6; }
};

} // namespace

TEST(InterfaceLayout, IsATableAlone)
{
    EXPECT_EQ(sizeof(void*), sizeof(IConfigReader));
    EXPECT_EQ(sizeof(void*), sizeof(IConfigWriter));
}

TEST(InterfaceLayout, ReaderKeepsItsSlots)
{
    SlotReader reader;
    std::string text;
    EXPECT_EQ(2, Slot<int (*)(void*, const std::string&)>(&reader, 2)(&reader, text));
    EXPECT_EQ("3", Slot<std::string (*)(void*, const std::string&)>(&reader, 3)(&reader, text));
    EXPECT_EQ(
        4, Slot<int (*)(void*, const std::string&, std::string&)>(&reader, 4)(&reader, text, text));
    EXPECT_EQ(&reader, Slot<void* (*)(void*)>(&reader, 5)(&reader));
}

TEST(InterfaceLayout, WriterKeepsItsSlots)
{
    SlotWriter writer;
    std::string text; // a string by value is passed by the address of the caller's temporary
    EXPECT_EQ(2, Slot<int (*)(void*, const std::string&)>(&writer, 2)(&writer, text));
    EXPECT_EQ(3, Slot<int (*)(void*, const std::string&, std::string*)>(&writer, 3)(&writer, text,
                                                                                    &text));
    EXPECT_EQ(4, Slot<int (*)(void*)>(&writer, 4)(&writer));
    EXPECT_EQ(5, Slot<int (*)(void*, const std::string&)>(&writer, 5)(&writer, text));
    int called = 0;
    Slot<void (*)(void*, void*)>(&writer, 6)(&writer, &called);
    EXPECT_EQ(6, called);
}
