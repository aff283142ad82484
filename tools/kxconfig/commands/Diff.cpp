#include "commands/Diff.h"

#include "file/KeyTree.h"
#include "output/Quoting.h"
#include "output/Report.h"
#include "survey/KeyList.h"
#include "survey/KeyValues.h"

#include <nlohmann/json.hpp>

#include <optional>
#include <unordered_map>

namespace
{

/** The keys of one file, in document order, and their values. */
class KeyedValues
{
public:
    KeyedValues(const std::string& path, std::istream* input)
    {
        const KeyTree document = LoadKeyTree(path, input);
        const KeyElement* const root = document.Root();
        Levels levels;
        KeyValues values(root, levels);
        VisitKeys(root, levels,
                  [&](const ListedKey& listed)
                  {
                      m_keys.push_back(listed.key);
                      m_values[listed.key] = JoinedValues(values.BearersUnder(listed).first);
                      return true;
                  });
    }

    const std::vector<std::string>& Keys() const { return m_keys; }

    std::optional<std::string> Under(const std::string& key) const
    {
        const auto found = m_values.find(key);
        return found == m_values.end() ? std::nullopt : std::optional(found->second);
    }

private:
    std::vector<std::string> m_keys;
    std::unordered_map<std::string, std::string> m_values;
};

/** A key that has different values in the two files, or none in one of them. */
struct Difference
{
    const std::string& key;
    std::optional<std::string> value;
    std::optional<std::string> other;

    std::string Line() const
    {
        if (!other)
        {
            return "- " + key + '\t' + Quoted(*value);
        }
        return value ? "! " + key + '\t' + Quoted(*value) + " -> " + Quoted(*other)
                     : "+ " + key + '\t' + Quoted(*other);
    }

    Json InJson() const
    {
        return {{"key", key},
                {"value", value ? Json(*value) : Json()},
                {"other", other ? Json(*other) : Json()}};
    }
};

} // namespace

ExitStatus Diff(const DiffArguments& arguments, Report& report)
{
    const KeyedValues values(arguments.file, arguments.input);
    const KeyedValues others(arguments.other, arguments.input);
    ExitStatus status = ExitStatus::Done;
    const auto compare = [&](const std::string& key)
    {
        const Difference difference{key, values.Under(key), others.Under(key)};
        if (difference.value != difference.other)
        {
            report.Add(difference);
            status = ExitStatus::NothingFound;
        }
    };
    for (const std::string& key : values.Keys())
    {
        compare(key);
    }
    for (const std::string& key : others.Keys())
    {
        if (!values.Under(key))
        {
            compare(key);
        }
    }
    return status;
}
