#include <gtest/gtest.h>

#include <libxml/parser.h>

#include <cstdlib>

// Records of the engine are read by their fields, so the headers have to be those of the library.
TEST(Engine, IsTheOneThatTheHeadersBelongTo)
{
    EXPECT_EQ(LIBXML_VERSION, std::atoi(xmlParserVersion));
}
