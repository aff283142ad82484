// The client's core: a file and the arguments of one run, and then what must hold of every file
// that loads. The input is the arguments, one on a line, an empty line, and the file. The argument
// FILE stands for the file's name.

#include "CXMLReader.h"

#include "ClientEdits.h"
#include "ClientRuns.h"
#include "ClientText.h"
#include "ConfinedEngine.h"

#include "support/Files.h"
#include "support/Log.h"

#include <libxml/tree.h>

#include <algorithm>
#include <cstdint>
#include <memory>
#include <set>

using kxfuzz::Arguments;
using kxfuzz::Client;
using kxfuzz::Json;
using kxfuzz::Outcome;
using kxfuzz::Require;

namespace
{

constexpr std::size_t kMostKeys = 12;
constexpr std::size_t kMostNodes = 12;

const kxfuzz::ScratchFolder& Scratch()
{
    static const kxfuzz::ScratchFolder folder;
    return folder;
}

/** `get` and the library give the same under @p key. @return whether there is a value. */
bool RequireSameValue(CXMLReader& reader, const std::string& key)
{
    std::string value;
    const bool found = reader.GetValue(key, value) == 0 && kxfuzz::StartsAtRoot(reader, key);
    const Outcome outcome = Client({"get", "--", "f.xml", key});
    if (outcome.status == 0)
    {
        Require(found && outcome.out == value + "\n", "get and GetValue differ", key);
    }
    else
    {
        Require(!found && outcome.out.empty(), "get finds nothing and GetValue does", key);
    }
    return found;
}

/** Each listed key gives the value beside it. */
void RequireListedValues(CXMLReader& reader)
{
    const Json results = Client({"keys", "--all", "--json", "f.xml"}).Answer()["results"];
    for (std::size_t i = 0; i != std::min(results.size(), kMostKeys); ++i)
    {
        const auto key = results[i]["key"].get<std::string>();
        const auto value = results[i]["value"].get<std::string>();
        Require(RequireSameValue(reader, key), "a key is listed and not found", key);
        std::string looked;
        reader.GetValue(key, looked);
        Require(looked == value, "a key is listed with another value", key);
    }
}

/** @return the expression that selects the node, by its own account; empty if there is none. */
std::string ExpressionFor(const Json& node)
{
    const bool isInTree = node.contains("line") && node["location"].is_string();
    const Json none = "";
    return node.value("expression", isInTree ? node["location"] : none).get<std::string>();
}

/** Each location selects one node, the one that was printed with it. */
void RequireLocationsFindTheirNodes(const std::string& expression)
{
    const Outcome outcome = Client({"find", "--json", "--", "f.xml", expression});
    const Json results = outcome.Answer()["results"];
    for (std::size_t i = 0; i != std::min(results.size(), kMostNodes); ++i)
    {
        const std::string location = ExpressionFor(results[i]);
        if (!location.empty())
        {
            const Json again = Client({"find", "--json", "--", "f.xml", location}).Answer();
            Require(again["results"] == Json::array({results[i]}), "a location finds another node",
                    location);
        }
    }
}

/** The elements that `explain --set` shows as reached. */
class Foretelling
{
public:
    explicit Foretelling(const std::string& key)
    {
        const Json answer = Client({"explain", "--set", "--json", "--", "f.xml", key}).Answer();
        for (const Json& event : answer["results"])
        {
            Add(event);
        }
    }

    bool Has(const std::string& location) const
    {
        return m_isSummed || m_locations.count(location) == 1;
    }

private:
    /** A location is spelled out as steps, one for each level of the walk. */
    void Add(const Json& event)
    {
        const auto depth = event["depth"].get<std::size_t>();
        m_isSummed = m_isSummed || event["event"] == "more";
        if (!event.contains("step"))
        {
            return;
        }
        const bool isElement = event["event"] == "element";
        const auto step = event["step"].get<std::string>();
        m_paths.resize(depth + 1);
        m_paths[depth] = depth == 0  ? step
                         : isElement ? m_paths[depth - 1] + "/" + step
                                     : m_paths[depth - 1];
        if (isElement && event["value"].is_string())
        {
            m_locations.insert(m_paths[depth]);
        }
    }

    std::vector<std::string> m_paths; ///< by depth
    std::set<std::string> m_locations;
    bool m_isSummed = false; ///< some are only counted
};

/** What `set` reports was foretold, and is what `diff` finds. */
void RequireForetoldUpdate(const std::string& key, const std::string& value)
{
    const std::string content = kxtest::ReadFile("f.xml");
    const Foretelling foretelling(key);
    const Outcome outcome = Client({"set", "--json", "--", "f.xml", key, value});
    const Json results = outcome.Answer()["results"];
    for (const Json& change : results)
    {
        const auto location = change["location"].get<std::string>();
        Require(foretelling.Has(location), "a change was not foretold", location);
    }
    kxtest::WriteFile("old.xml", content);
    kxfuzz::RequireSameDifferences("old.xml", "f.xml");
    kxtest::WriteFile("f.xml", content);
}

/** The text and the JSON of a run are about the same. */
void RequireSameInJson(const Arguments& arguments, const Outcome& text)
{
    const Outcome outcome = Client(kxfuzz::WithJson(arguments));
    Require(outcome.status == text.status, "with --json the status is another", "");
    kxfuzz::RequireSameContent(arguments, text.out, outcome.Answer());
}

void Restore(const std::string& content)
{
    Scratch().Clear();
    kxtest::WriteFile("f.xml", content);
}

void UseArguments(const Arguments& arguments)
{
    const std::string before = kxtest::ReadFile("f.xml");
    const Outcome outcome = Client(arguments);
    Restore(before);
    const int badUsage = 2;
    if (!kxfuzz::AsksForJson(arguments) && !arguments.empty() && outcome.status != badUsage)
    {
        RequireSameInJson(arguments, outcome);
        Restore(before);
    }
    if (kxfuzz::IsEdit(arguments))
    {
        kxfuzz::RequireHonestEdit(arguments);
        Restore(before);
    }
}

/** @return the argument at @p index, or @p otherwise. */
std::string At(const Arguments& arguments, std::size_t index, const char* otherwise)
{
    return index < arguments.size() ? arguments[index] : otherwise;
}

void UseFile(const Arguments& arguments)
{
    const auto reader = std::make_unique<CXMLReader>();
    if (reader->ParseFile("f.xml") != 0)
    {
        const int badFile = 3;
        Require(Client({"keys", "f.xml"}).status == badFile, "a file loads only in the client", "");
        return;
    }
    RequireListedValues(*reader);
    const bool isFind = At(arguments, 0, "") == "find";
    const std::string key = At(arguments, isFind ? 4 : 2, "cfg.a");
    RequireSameValue(*reader, key);
    RequireLocationsFindTheirNodes(isFind ? At(arguments, 2, "//node()") : "//node()|//@*");
    const std::string value = At(arguments, 3, "new");
    kxfuzz::RequireHonestEdit({"set", "f.xml", key, value});
    RequireForetoldUpdate(key, value);
}

} // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***)
{
    Scratch().Enter();
    kxfuzz::ConfineEngine(true);
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const kxtest::LogRecorder log;
    const kxfuzz::ClientCase subject(std::string(reinterpret_cast<const char*>(data), size));
    kxtest::WriteFile("f.xml", subject.file);
    UseArguments(subject.arguments);
    UseFile(subject.arguments);
    return 0;
}
