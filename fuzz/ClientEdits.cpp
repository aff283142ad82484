#include "ClientEdits.h"

#include "file/Locations.h"
#include "file/Nodes.h"

#include "support/Files.h"

#include <libxml/parser.h>
#include <libxml/tree.h>

#include <algorithm>
#include <map>
#include <set>

namespace kxfuzz
{

namespace
{

const char* const g_file = "f.xml";

struct Node
{
    std::string content;
    bool isLeaf;          ///< an attribute, or an element without elements in it
    std::size_t contains; ///< the number of elements and attributes in it, itself included
};

/** The elements and attributes of a file by their locations, and the other nodes. */
class Nodes
{
public:
    explicit Nodes(const std::string& content)
    {
        xmlDoc* const document =
            xmlReadMemory(content.data(), static_cast<int>(content.size()), nullptr, nullptr, 0);
        m_loaded = document != nullptr;
        if (m_loaded)
        {
            Locations locations;
            m_count = Collect(document->children, locations);
        }
        xmlFreeDoc(document);
    }

    bool Loaded() const { return m_loaded; }

    /** @return the number of elements and attributes. */
    std::size_t Count() const { return m_count; }

    const Node& At(const std::string& location) const
    {
        const auto found = m_nodes.find(location);
        Require(found != m_nodes.end(), "a reported location is not there", location);
        return found->second;
    }

    /** @return the leaves that have another content in @p after, by their locations. */
    std::set<std::string> ChangedIn(const Nodes& after) const
    {
        std::set<std::string> changed;
        for (const auto& [location, node] : m_nodes)
        {
            if (node.isLeaf && after.At(location).content != node.content)
            {
                changed.insert(location);
            }
        }
        return changed;
    }

private:
    std::size_t Collect(const xmlNode* node, Locations& locations)
    {
        std::size_t count = 0;
        for (; node != nullptr; node = node->next)
        {
            count += Add(node, locations);
        }
        return count;
    }

    std::size_t Add(const xmlNode* node, Locations& locations)
    {
        const bool isElement = node->type == XML_ELEMENT_NODE;
        const bool isAttribute = node->type == XML_ATTRIBUTE_NODE;
        std::size_t count = isElement || isAttribute ? 1 : 0;
        if (isElement)
        {
            count += Collect(reinterpret_cast<const xmlNode*>(node->properties), locations);
            count += Collect(node->children, locations);
        }
        if (HasLocation(node))
        {
            const bool isLeaf =
                isAttribute || (isElement && xmlChildElementCount(const_cast<xmlNode*>(node)) == 0);
            m_nodes[locations.Of(node)] = {ContentOf(node), isLeaf, count};
        }
        return count;
    }

    bool m_loaded;
    std::size_t m_count = 0;
    std::map<std::string, Node> m_nodes;
};

bool IsOneOf(const Arguments& choices, const std::string& argument)
{
    return std::find(choices.begin(), choices.end(), argument) != choices.end();
}

/** @return the edit of @p arguments with @p option, applied to the file. */
Arguments EditWith(const Arguments& options, const Arguments& arguments)
{
    const Arguments kept = {"--all", "--node", "--create", "--after", "--attribute"};
    Arguments edit = {arguments.front(), "--json"};
    edit.insert(edit.end(), options.begin(), options.end());
    std::copy_if(arguments.begin() + 1, arguments.end(), std::back_inserter(edit),
                 [&](const std::string& argument) { return IsOneOf(kept, argument); });
    edit.emplace_back("--");
    std::copy_if(arguments.begin() + 1, arguments.end(), std::back_inserter(edit),
                 [](const std::string& argument) { return argument.compare(0, 2, "--") != 0; });
    return edit;
}

void RequireReportedChanges(const Json& results, const Nodes& before, const Nodes& after)
{
    for (const Json& change : results)
    {
        const auto location = change["location"].get<std::string>();
        Require(change["before"] != change["after"], "a change is none", location);
        Require(change["before"].is_null() || before.At(location).content == change["before"],
                "a node had another content", location);
        Require(change["after"].is_null() || after.At(location).content == change["after"],
                "a node has another content", location);
    }
}

/** Requires that the numbers of nodes differ as reported. */
void RequireReportedCount(const Json& results, const Nodes& before, const Nodes& after)
{
    std::size_t added = 0;
    std::size_t removed = 0;
    for (const Json& change : results)
    {
        const auto location = change["location"].get<std::string>();
        added += change["before"].is_null() ? 1 : 0;
        removed += change["after"].is_null() ? before.At(location).contains : 0;
    }
    Require(before.Count() + added == after.Count() + removed, "nodes appear or disappear", "");
}

/** Requires that what differs is reported, if no node was added or removed. */
void RequireNothingElse(const Json& results, const Nodes& before, const Nodes& after)
{
    std::set<std::string> reported;
    for (const Json& change : results)
    {
        if (change["before"].is_null() || change["after"].is_null())
        {
            return;
        }
        reported.insert(change["location"].get<std::string>());
    }
    Require(before.ChangedIn(after) == reported, "the report is not the difference", "");
}

void RequireSaved(const Json& results, const std::string& content)
{
    const Nodes before(content);
    const Nodes after(kxtest::ReadFile(g_file));
    Require(after.Loaded(), "what was saved does not load", "");
    RequireReportedChanges(results, before, after);
    RequireReportedCount(results, before, after);
    RequireNothingElse(results, before, after);
}

void RequireUnchanged(const std::string& content, const char* option)
{
    Require(kxtest::ReadFile(g_file) == content, "the file was changed", option);
}

/** @return the values of all keys. */
std::map<std::string, Json> ValuesIn(const std::string& file)
{
    std::map<std::string, Json> values;
    const Json results = Client({"keys", "--all", "--json", file}).Answer()["results"];
    for (const Json& result : results)
    {
        values[result["key"].get<std::string>()] = result["value"];
    }
    return values;
}

} // namespace

bool IsEdit(const Arguments& arguments)
{
    return !arguments.empty() && IsOneOf({"set", "add", "remove"}, arguments.front());
}

void RequireHonestEdit(const Arguments& arguments)
{
    const std::string content = kxtest::ReadFile(g_file);
    const Outcome trial = Client(EditWith({"--dry-run"}, arguments));
    RequireUnchanged(content, "--dry-run");
    const Json results = trial.Answer()["results"];
    const std::string tooMany = "--expect=" + std::to_string(results.size() + 1);
    Require(Client(EditWith({tooMany}, arguments)).status != 0, "--expect was ignored", tooMany);
    RequireUnchanged(content, "--expect");
    const Outcome outcome = Client(EditWith({}, arguments));
    Require(outcome.status == trial.status, "with --dry-run the status is another", "");
    if (outcome.status != 0)
    {
        RequireUnchanged(content, "a failure");
        return;
    }
    Require(outcome.Answer()["results"] == results, "--dry-run has another report", "");
    RequireSaved(results, content);
    kxtest::WriteFile(g_file, content);
}

void RequireSameDifferences(const std::string& file, const std::string& other)
{
    const std::map<std::string, Json> values = ValuesIn(file);
    const std::map<std::string, Json> others = ValuesIn(other);
    std::map<std::string, Json> all = values;
    all.insert(others.begin(), others.end());
    Json expected = Json::object();
    for (const auto& [key, value] : all)
    {
        const auto one = values.find(key);
        const auto two = others.find(key);
        if (one == values.end() || two == others.end() || one->second != two->second)
        {
            expected[key] = {one == values.end() ? Json() : one->second,
                             two == others.end() ? Json() : two->second};
        }
    }
    Json found = Json::object();
    const Json results = Client({"diff", "--json", file, other}).Answer()["results"];
    for (const Json& result : results)
    {
        found[result["key"].get<std::string>()] = {result["value"], result["other"]};
    }
    Require(found == expected, "diff and keys differ", file);
}

} // namespace kxfuzz
