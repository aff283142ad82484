// Compares the library's calls of the engine with engine_calls.txt: which functions, in which order
// and with which arguments.

#include "Operations.h"

#include "support/Engine.h"
#include "support/EngineTranscript.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <dlfcn.h>

#include <fstream>
#include <map>
#include <ostream>
#include <regex>
#include <set>
#include <sstream>

using namespace kxtest;

namespace
{

using Lines = std::vector<std::string>;

Lines LinesOf(const std::string& path)
{
    Lines lines;
    std::ifstream file(path);
    for (std::string line; std::getline(file, line);)
    {
        if (!line.empty() && line[0] != '#')
        {
            lines.push_back(line);
        }
    }
    return lines;
}

/** @return whether a section holds for this engine, given what follows its name. */
bool Applies(const std::string& versions)
{
    std::istringstream words(versions);
    std::string relation;
    int major = 0;
    int minor = 0;
    char dot = '.';
    if (!(words >> relation >> major >> dot >> minor))
    {
        return true;
    }
    const bool reached = EngineVersion() >= major * 10000 + minor * 100;
    return reached == (relation == "since");
}

/** The sections of the table that hold for this engine. */
std::map<std::string, Lines> ReadTable()
{
    static const std::regex head(R"(\[(.*)\](.*))");
    std::map<std::string, Lines> table;
    Lines* section = nullptr;
    Lines skipped;
    for (const std::string& line : LinesOf(KX_ENGINE_TABLE))
    {
        std::smatch match;
        if (!std::regex_match(line, match, head))
        {
            section->push_back(line);
        }
        else if (Applies(match[2]))
        {
            section = &table[match[1]];
            EXPECT_TRUE(section->empty()) << match[1] << " appears twice";
        }
        else
        {
            section = &skipped;
        }
    }
    return table;
}

const std::map<std::string, Lines>& Table()
{
    static const std::map<std::string, Lines> table = ReadTable();
    return table;
}

const OperationFiles& Files()
{
    static const OperationFiles files;
    return files;
}

class EngineCallsTest : public testing::TestWithParam<Operation>
{
};

} // namespace

TEST_P(EngineCallsTest, AreThoseOfTheTable)
{
    World world(Files());
    GetParam().prepare(world);
    Lines calls;
    {
        AnswerVersion("20914"); // with engines before 2.9.10 the library works around their defects
        EngineTranscript transcript(Files().Folder());
        GetParam().run(world);
        calls = transcript.Take();
        AnswerVersion(nullptr);
    }
    const auto section = Table().find(GetParam().name);
    ASSERT_NE(Table().end(), section) << "no section";
    EXPECT_THAT(calls, testing::ElementsAreArray(section->second));
}

INSTANTIATE_TEST_SUITE_P(Operations, EngineCallsTest, testing::ValuesIn(AllOperations()), TestName);

TEST(EngineTable, HasNoSectionWithoutOperation)
{
    std::set<std::string> names;
    for (const Operation& operation : AllOperations())
    {
        EXPECT_TRUE(names.insert(operation.name).second) << operation.name;
    }
    for (const auto& [name, calls] : Table())
    {
        EXPECT_EQ(1u, names.count(name)) << name;
    }
}

// Otherwise a call would pass unseen.
TEST(EngineTranscript, SeesEveryFunctionThatTheLibraryMayCall)
{
    Dl_info program;
    ASSERT_NE(0, dladdr(reinterpret_cast<void*>(&RefuseNext), &program));
    const Lines functions = LinesOf(KX_ENGINE_FUNCTIONS);
    EXPECT_LT(20u, functions.size());
    for (const std::string& name : functions)
    {
        if (name == "xmlFree" || name == "xmlMalloc")
        {
            continue; // variables, which the transcript sets
        }
        if (name == "__xmlParserVersion" && EngineVersion() >= 21400)
        {
            continue; // not called, as these engines do not have it
        }
        Dl_info definition;
        ASSERT_NE(0, dladdr(dlsym(RTLD_DEFAULT, name.c_str()), &definition)) << name;
        EXPECT_EQ(program.dli_fbase, definition.dli_fbase) << name;
    }
}
