#include "support/Engine.h"
#include "support/Memory.h"

#include <gtest/gtest.h>

#include <libxml/parser.h>

int main(int argc, char** argv)
{
    // Before anything of the engine's is allocated.
    kxtest::EngineMemory::Install();
    xmlInitParser();
    kxtest::CollectEngineErrors();

    testing::InitGoogleTest(&argc, argv);
    const int result = RUN_ALL_TESTS();
    xmlCleanupParser();
    return result;
}
