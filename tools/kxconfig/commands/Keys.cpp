#include "commands/Keys.h"

#include "file/KeyTree.h"
#include "output/Failure.h"
#include "output/Quoting.h"
#include "output/Report.h"
#include "survey/KeyList.h"
#include "survey/KeyValues.h"

#include <nlohmann/json.hpp>

#include <algorithm>

namespace
{

/** Of several values under one key, only these are printed: keys that match the same elements
 * would print them again and again. */
const size_t kMostValues = 10;
const size_t kMostBytes = 1000;

struct Name
{
    const std::string& key;

    std::string Line() const { return key; }
    Json InJson() const { return {{"key", key}}; }
};

struct KeyAndValue
{
    const std::string& key;
    std::string value; ///< of several elements that a key cannot distinguish
    size_t more;       ///< the number of values that are left out

    std::string Line() const
    {
        std::string line;
        line.reserve(key.size() + value.size() + 4); // with the tab, the quotes and the line's end
        line.append(key).append(1, '\t').append(Quoted(value));
        return more == 0 ? line : line + " ... " + std::to_string(more) + " more";
    }

    Json InJson() const
    {
        Json result = {{"key", key}, {"value", value}};
        if (more != 0)
        {
            result["more"] = more;
        }
        return result;
    }
};

/** @return how many of the values of @p bearers are printed. */
size_t NumberShown(const Bearers& bearers)
{
    size_t shown = 0;
    size_t bytes = 0;
    for (; shown != bearers.first.size(); ++shown)
    {
        bytes += bearers.first[shown]->value.size();
        if (bytes > kMostBytes)
        {
            break;
        }
    }
    return bearers.count == 1 ? 1 : shown;
}

KeyAndValue Describe(const ListedKey& listed, KeyValues& values, bool all)
{
    if (listed.onlyBearer != nullptr)
    {
        return {listed.key, std::string(listed.onlyBearer->value), 0};
    }
    Bearers bearers =
        all ? values.BearersUnder(listed.key) : values.BearersUnder(listed.key, kMostValues);
    bearers.first.resize(all ? bearers.count : NumberShown(bearers));
    return {listed.key, JoinedValues(bearers.first), bearers.count - bearers.first.size()};
}

/** @return whether @p key is @p prefix, or goes on with a segment or with the condition of its last
 * one. */
bool IsBelow(const std::string& prefix, const std::string& key)
{
    if (prefix.empty() || key == prefix)
    {
        return true;
    }
    const bool hasCondition = prefix.find('@', prefix.rfind('.') + 1) != std::string::npos;
    const char next = key.compare(0, prefix.size(), prefix) == 0 ? key[prefix.size()] : '\0';
    return next == '.' || (next == '@' && !hasCondition);
}

Failure NothingFound(const KeysArguments& arguments)
{
    const std::string below = arguments.prefix.empty() ? "" : " below " + Quoted(arguments.prefix);
    return {ExitStatus::NothingFound,
            "nothing found: " + arguments.file + " has no value that a key path can name" + below};
}

void Add(const ListedKey& listed, KeyValues& values, const KeysArguments& arguments, Report& report)
{
    if (arguments.namesOnly)
    {
        report.Add(Name{listed.key});
        return;
    }
    report.Add(Describe(listed, values, arguments.all));
}

} // namespace

ExitStatus Keys(const KeysArguments& arguments, Report& report)
{
    const KeyTree document = LoadKeyTree(arguments.file, arguments.input);
    const KeyElement* const root = document.Root();
    Levels levels;
    KeyValues values(root, levels);
    bool isFound = false;
    VisitKeys(root, levels,
              [&](const ListedKey& listed)
              {
                  if (IsBelow(arguments.prefix, listed.key))
                  {
                      isFound = true;
                      Add(listed, values, arguments, report);
                  }
                  return true;
              });
    if (!isFound)
    {
        throw NothingFound(arguments);
    }
    return ExitStatus::Done;
}
