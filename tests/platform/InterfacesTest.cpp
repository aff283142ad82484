#include "IConfigReader.h"
#include "IConfigWriter.h"

#include <gtest/gtest.h>

#include <type_traits>

// That the constructors and destructors stand in the platform's library, out of line, is shown by
// the list of symbols, and their layout by the tests of the binary interface; here is what a
// client's compiler sees.

TEST(Interfaces, AreAbstractAndDestroyedVirtually)
{
    EXPECT_TRUE(std::is_abstract<IConfigReader>::value);
    EXPECT_TRUE(std::is_abstract<IConfigWriter>::value);
    EXPECT_TRUE(std::has_virtual_destructor<IConfigReader>::value);
    EXPECT_TRUE(std::has_virtual_destructor<IConfigWriter>::value);
}
