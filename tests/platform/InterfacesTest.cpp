#include "IConfigReader.h"
#include "IConfigWriter.h"

#include <gtest/gtest.h>

#include <type_traits>

// That the constructors and destructors stand in the platform's library, out of line, is shown by
// the list of symbols; here is what a client's compiler sees.

TEST(Interfaces, AreAbstractAndDestroyedVirtually)
{
    EXPECT_TRUE(std::is_abstract<IConfigReader>::value);
    EXPECT_TRUE(std::is_abstract<IConfigWriter>::value);
    EXPECT_TRUE(std::has_virtual_destructor<IConfigReader>::value);
    EXPECT_TRUE(std::has_virtual_destructor<IConfigWriter>::value);
}

TEST(Interfaces, HoldNothingButTheirTable)
{
    EXPECT_EQ(sizeof(void*), sizeof(IConfigReader));
    EXPECT_EQ(sizeof(void*), sizeof(IConfigWriter));
}

namespace
{

/** Answers each operation with its slot's number. */
class SlotWriter : public IConfigWriter
{
public:
    int ParseFile(const std::string&) override { return 3; }
    int SetValue(const std::string&, std::string) override { return 4; }
    int SaveData() override { return 5; }
    int SetPath(const std::string&) override { return 6; }
    void SetDataPtr(void*) override { m_called = 7; }

    int m_called = 0;
};

} // namespace

TEST(Interfaces, WriterKeepsItsSlotOrder)
{
    SlotWriter writer;
    IConfigWriter* const interface = &writer;
    void** const table = *reinterpret_cast<void***>(interface);
    const std::string text;
    using OfText = int (*)(IConfigWriter*, const std::string&);
    using OfNothing = int (*)(IConfigWriter*);
    using OfPointer = void (*)(IConfigWriter*, void*);
    EXPECT_EQ(3, reinterpret_cast<OfText>(table[2])(interface, text));
    EXPECT_EQ(5, reinterpret_cast<OfNothing>(table[4])(interface));
    EXPECT_EQ(6, reinterpret_cast<OfText>(table[5])(interface, text));
    reinterpret_cast<OfPointer>(table[6])(interface, nullptr);
    EXPECT_EQ(7, writer.m_called);
    using OfTexts = int (*)(IConfigWriter*, const std::string&, std::string*);
    std::string value; // a string by value is passed by the address of the caller's temporary
    EXPECT_EQ(4, reinterpret_cast<OfTexts>(table[3])(interface, text, &value));
}
