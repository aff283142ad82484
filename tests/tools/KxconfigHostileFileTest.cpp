// What a hostile file can make kxconfig cost. The fuzz target feeds it more of them; here are the
// shapes whose cost grows faster than the file if something is done anew for each node.

#include "ToolTest.h"

#include "support/Memory.h"

using kxtest::Outcome;

namespace
{

/** "&x;" is @p levels times ten times as long as the first entity. */
std::string Multiplying(int levels)
{
    std::string xml = "<!DOCTYPE c [<!ENTITY l0 \"lol\">";
    for (int level = 1; level <= levels; ++level)
    {
        xml += "<!ENTITY l" + std::to_string(level) + " \"";
        for (int i = 0; i != 10; ++i)
        {
            xml += "&l" + std::to_string(level - 1) + ";";
        }
        xml += "\">";
    }
    return xml + "]><c><a>t</a></c>";
}

/** Two elements with @p count attributes each, which @p name is the name of. */
std::string ManyAttributes(std::size_t count, const std::string& name)
{
    std::string element = "<" + name;
    for (std::size_t i = 0; i != count; ++i)
    {
        element += " a" + std::to_string(i) + "=\"\"";
    }
    element += ">x</" + name + ">";
    return "<c>" + element + element + "</c>";
}

std::string ManySiblings(std::size_t count, const std::string& name)
{
    std::string xml = "<c>";
    for (std::size_t i = 0; i != count; ++i)
    {
        xml += "<" + name + " i=\"" + std::to_string(i) + "\">x</" + name + ">";
    }
    return xml + "</c>";
}

std::string Deep(std::size_t count, const std::string& name)
{
    std::string xml = "<c>";
    const std::size_t depth = 250;
    for (std::size_t i = 0; i < count; i += depth)
    {
        for (std::size_t level = 0; level != depth; ++level)
        {
            xml += "<" + name + ">";
        }
        for (std::size_t level = 0; level != depth; ++level)
        {
            xml += "</" + name + ">";
        }
    }
    return xml + "<" + name + ">x</" + name + "></c>";
}

std::string ManyEntities(std::size_t count, const std::string& name)
{
    std::string xml = "<!DOCTYPE c [";
    std::string elements;
    for (std::size_t i = 0; i != count; ++i)
    {
        const std::string entity = "e" + std::to_string(i);
        xml += "<!ENTITY " + entity + " \"v\">";
        elements += "<" + name + ">&" + entity + ";</" + name + ">";
    }
    return xml + "]><c>" + elements + "<" + name + ">x</" + name + "></c>";
}

/** Each <b> or <title> suspends the condition for the element after it, so that nearly all keys
 * select nearly all elements. */
std::string Alternating(std::size_t count, const std::string& name)
{
    std::string xml = "<c>";
    for (std::size_t i = 0; i != count; ++i)
    {
        xml += "<" + name + " i=\"" + std::to_string(i) + "\">x</" + name + "><b/>";
    }
    return xml + "</c>";
}

std::string AlternatingWithElements(std::size_t count, const std::string& name)
{
    std::string xml = "<c>";
    for (std::size_t i = 0; i != count; ++i)
    {
        xml += "<title/><" + name + " i=\"" + std::to_string(i) +
               "\"><ip k=\"1\">x</ip><ip k=\"2\">y</ip></" + name + ">";
    }
    return xml + "</c>";
}

/** Each key leads through all groups to one of them. */
std::string Groups(std::size_t count, const std::string& name)
{
    std::string xml = "<c>";
    for (std::size_t i = 0; i != count; ++i)
    {
        const std::string start = "<" + name + " i=\"" + std::to_string(i);
        xml += "<g>" + start + "\">x</" + name + ">" + start + "_\">y</" + name + "></g>";
    }
    return xml + "</c>";
}

std::string GroupsOfDifferentNames(std::size_t count, const std::string& name)
{
    std::string xml = "<c>";
    for (std::size_t i = 0; i != count; ++i)
    {
        const std::string ownName = name + std::to_string(i);
        xml += "<g><" + ownName + ">x</" + ownName + "></g>";
    }
    return xml + "<" + name + ">x</" + name + "></c>";
}

struct Shape
{
    const char* name;
    std::string (*make)(std::size_t count, const std::string& name);
};

std::ostream& operator<<(std::ostream& out, const Shape& shape)
{
    return out << shape.name;
}

} // namespace

class KxconfigHostileFile : public ToolTest
{
protected:
    void ExpectValueIsRefused(const std::string& xml, const std::string& value)
    {
        const std::string file = m_folder.Write("hostile.xml", xml);
        for (const std::vector<std::string>& command :
             std::vector<std::vector<std::string>>{{"set", file, "c.a", value},
                                                   {"set", "--create", file, "c.b", value},
                                                   {"set", "--node", file, "/c/a", value},
                                                   {"add", file, "/c", "b", value}})
        {
            const Outcome outcome = Tool(command);
            EXPECT_EQ(4, outcome.status);
            EXPECT_THAT(outcome.err, testing::HasSubstr("would no longer load, line 1: "));
            EXPECT_EQ(xml, kxtest::ReadFile(file));
        }
    }
};

TEST_F(KxconfigHostileFile, AnEntityThatContainsItselfIsNoValue)
{
    ExpectValueIsRefused("<!DOCTYPE c [<!ENTITY x \"&y;\"><!ENTITY y \"&x;\">]><c><a>t</a></c>",
                         "&x;");
}

TEST_F(KxconfigHostileFile, AnEntityThatMultipliesIsNoValue)
{
    ExpectValueIsRefused(Multiplying(9), "&l9;");
}

/** What a run costs that does not depend on the machine. */
struct Cost
{
    std::size_t requests; ///< for memory
    std::size_t bytes;    ///< requested, but not by the engine
    std::size_t output;
};

class KxconfigCost : public KxconfigHostileFile, public testing::WithParamInterface<Shape>
{
protected:
    Cost Of(const std::string& command, const std::string& xml)
    {
        const std::string file = m_folder.Write("hostile.xml", xml);
        std::vector<std::string> arguments = {command, file};
        if (command == "get" || command == "explain")
        {
            arguments.emplace_back("c.a");
        }
        const kxtest::NewCounter ours;
        const kxtest::EngineMemory engines;
        const Outcome outcome = Tool(arguments);
        return {ours.Requests() + engines.Requests(), ours.Bytes(), outcome.out.size()};
    }
};

// With twice the file four times the cost would be quadratic: 5/2 separates the two. The bounds per
// byte are those that the handbook states.
TEST_P(KxconfigCost, IsLinearInTheFile)
{
    const std::size_t count = 1000;
    const std::string small = GetParam().make(count, "a");
    const std::string large = GetParam().make(2 * count, "a");
    for (const char* const command : {"get", "keys", "check", "explain"})
    {
        const Cost less = Of(command, small);
        const Cost more = Of(command, large);
        const std::size_t fixed = 5000; // of any run
        // A standard library that shares strings allocates the short ones, too.
        const std::size_t requests = _GLIBCXX_USE_CXX11_ABI != 0 ? 4 : 6;
        EXPECT_LT(more.requests, less.requests * 5 / 2 + fixed) << command;
        EXPECT_LT(more.requests, requests * large.size() + fixed) << command;
        EXPECT_LT(more.bytes, less.bytes * 5 / 2 + 100 * fixed) << command;
        EXPECT_LT(more.bytes, 250 * large.size() + 100 * fixed) << command;
        EXPECT_LT(more.output, less.output * 5 / 2 + fixed) << command;
        EXPECT_LT(more.output, 30 * large.size() + fixed) << command;
    }
}

INSTANTIATE_TEST_SUITE_P(Shapes, KxconfigCost,
                         testing::Values(Shape{"attributes", ManyAttributes},
                                         Shape{"siblings", ManySiblings}, Shape{"deep", Deep},
                                         Shape{"entities", ManyEntities},
                                         Shape{"alternating", Alternating},
                                         Shape{"alternatingWithElements", AlternatingWithElements},
                                         Shape{"groups", Groups},
                                         Shape{"groupsOfDifferentNames", GroupsOfDifferentNames}),
                         [](const testing::TestParamInfo<Shape>& shape)
                         { return shape.param.name; });

TEST_F(KxconfigHostileFile, ALongNameIsNotCopiedForEachAttribute)
{
    const std::string file =
        m_folder.Write("long.xml", ManyAttributes(1000, std::string(40000, 'n')));
    const kxtest::NewCounter ours;
    EXPECT_EQ(0, Tool({"keys", file}).status);
    EXPECT_LT(ours.Bytes(), std::size_t(20) << 20);
}

TEST_F(KxconfigHostileFile, TheTextOfAnEntityIsKeptOnceForAllAttributes)
{
    // A million bytes is what engines from 2.11 on let the entities of a short document amount to.
    const std::size_t count = 90;
    const std::size_t length = 10000;
    std::string xml = "<!DOCTYPE c [<!ENTITY e \"" + std::string(length, 'v') + "\">]><c>";
    for (std::size_t i = 0; i != count; ++i)
    {
        xml += "<a" + std::to_string(i) + " x=\"&e;\"/>";
    }
    const std::string file = m_folder.Write("entity.xml", xml + "<b>x</b></c>");
    const kxtest::NewCounter ours;
    EXPECT_EQ("c.b\t\"x\"\n", Tool({"keys", file}).out);
    EXPECT_LT(ours.Bytes(), count * length * 3 / 2); // each is expanded once, and not kept
}
