#include "ClientRuns.h"

#include "CXMLReader.h"

#include "cli/Run.h"

#include <libxml/tree.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <sstream>

#include <unistd.h>

namespace kxfuzz
{

namespace
{

constexpr std::size_t kMostArguments = 12;
constexpr int kHighestStatus = 5;

bool StartsWithDash(const std::string& argument)
{
    return argument.compare(0, 1, "-") == 0;
}

/** @return whether the argument at @p index can be an expression only, and so no name of a file. */
bool IsExpression(const Arguments& arguments, std::size_t index, bool fileWasNamed)
{
    const std::string& command = arguments.front();
    const bool takesExpression = command == "find" || command == "add" || command == "remove";
    return takesExpression && fileWasNamed && !StartsWithDash(arguments[index]) &&
           !StartsWithDash(arguments[index - 1]);
}

std::string WithoutSlashes(std::string text)
{
    text.erase(std::remove(text.begin(), text.end(), '/'), text.end());
    return text == ".." || text == "." ? "f.xml" : text;
}

/** Names of files lose their slashes, so that they are in the current folder. */
void Confine(Arguments& arguments)
{
    bool fileWasNamed = false;
    for (std::size_t i = 1; i < arguments.size(); ++i)
    {
        if (!IsExpression(arguments, i, fileWasNamed))
        {
            fileWasNamed = fileWasNamed ||
                           (!StartsWithDash(arguments[i]) && !StartsWithDash(arguments[i - 1]));
            arguments[i] = WithoutSlashes(arguments[i]);
        }
    }
}

std::string Named(std::string argument)
{
    const auto at = argument.find("FILE");
    return at == argument.npos ? argument : argument.replace(at, 4, "f.xml");
}

} // namespace

void Require(bool holds, const char* what, const std::string& about)
{
    if (!holds)
    {
        std::fprintf(stderr, "%s: %s\n", what, about.c_str());
        std::abort();
    }
}

ScratchFolder::ScratchFolder()
{
    const char* const memory = "/dev/shm";
    const auto parent = std::filesystem::is_directory(memory)
                            ? std::filesystem::path(memory)
                            : std::filesystem::temp_directory_path();
    m_path = (parent / "kxfuzz-XXXXXX").string();
    Require(mkdtemp(m_path.data()) != nullptr, "no scratch folder", m_path);
}

ScratchFolder::~ScratchFolder()
{
    std::error_code ignored;
    std::filesystem::remove_all(m_path, ignored);
}

void ScratchFolder::Enter() const
{
    std::filesystem::current_path(m_path);
}

void ScratchFolder::Clear() const
{
    for (const auto& entry : std::filesystem::directory_iterator(m_path))
    {
        std::filesystem::remove_all(entry.path());
    }
}

ClientCase::ClientCase(const std::string& input)
{
    std::istringstream lines(input);
    std::string line;
    while (arguments.size() != kMostArguments && std::getline(lines, line) && !line.empty())
    {
        arguments.push_back(Named(line));
    }
    if (!arguments.empty())
    {
        Confine(arguments);
    }
    std::ostringstream rest;
    rest << lines.rdbuf();
    file = rest.str();
}

Json Outcome::Answer() const
{
    const Json answer = Json::parse(out, nullptr, false);
    Require(!answer.is_discarded(), "--json is no JSON", out);
    Require(answer["status"] == status, "--json has another status", out);
    return answer;
}

Outcome Client(const Arguments& arguments)
{
    std::istringstream in;
    std::ostringstream out;
    std::ostringstream err;
    const int status = ::Run(arguments, in, out, err);
    Require(status >= 0 && status <= kHighestStatus, "an unknown status", std::to_string(status));
    return {status, out.str(), err.str()};
}

bool AsksForJson(const Arguments& arguments)
{
    return std::find(arguments.begin(), arguments.end(), "--json") != arguments.end();
}

Arguments WithJson(Arguments arguments)
{
    arguments.insert(arguments.begin() + 1, "--json");
    return arguments;
}

bool StartsAtRoot(CXMLReader& reader, const std::string& key)
{
    const auto document = static_cast<xmlDoc*>(reader.GetDataPtr());
    const std::string root = reinterpret_cast<const char*>(xmlDocGetRootElement(document)->name);
    return key.substr(0, key.find('.')) == root;
}

} // namespace kxfuzz
