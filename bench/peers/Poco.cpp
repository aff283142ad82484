// Poco's XMLConfiguration, whose keys look much like those of this library.

#include "Documents.h"
#include "Operations.h"

#include <Poco/Util/XMLConfiguration.h>
#include <Poco/Version.h>

#include <map>

namespace bench
{

namespace
{

const char* const kPoco = "Poco XMLConfiguration";

using Configuration = Poco::AutoPtr<Poco::Util::XMLConfiguration>;

Configuration Loaded(const std::string& path)
{
    static std::map<std::string, Configuration> configurations;
    Configuration& configuration = configurations[path];
    if (!configuration)
    {
        configuration = new Poco::Util::XMLConfiguration(path);
    }
    return configuration;
}

std::string KeyOf(const std::vector<std::string>& names, const std::string& condition)
{
    std::string key = names[0] + condition;
    for (std::size_t level = 1; level != names.size(); ++level)
    {
        key += '.' + names[level];
    }
    return key;
}

std::string Condition(const std::string& attribute, const std::string& value)
{
    return attribute.empty() ? std::string() : "[@" + attribute + '=' + value + ']';
}

void AddLookUp(const std::string& workload, const std::string& file, const std::string& key,
               const std::string& expected)
{
    Add(workload, kPoco, expected,
        [file, key]
        { return [configuration = Loaded(file), key] { return configuration->getString(key); }; });
}

void AddLoads()
{
    for (const FirstRead& read : FirstReads())
    {
        if (!read.firstWillDo)
        {
            continue;
        }
        const std::string key = KeyOf(read.names, Condition(read.attribute, read.attributeValue));
        Add(read.workload, kPoco, read.value,
            [read, key]
            {
                return [path = read.path, key]
                {
                    const Configuration configuration(new Poco::Util::XMLConfiguration(path));
                    return configuration->getString(key);
                };
            });
    }
}

void AddLookUps()
{
    for (const std::size_t count : kSiblingCounts)
    {
        AddLookUp(Sized(kLookUpPlain, count), Siblings(count), "service", kServiceValue);
    }
    for (const std::size_t count : kItemCounts)
    {
        AddLookUp(Sized(kLookUpCondition, count), Items(count),
                  KeyOf({"item", "name"}, Condition("id", std::to_string(count))), ItemName(count));
    }
    for (const std::size_t levels : kDepths)
    {
        AddLookUp(Sized(kLookUpDepth, levels), Nested(levels), KeyOf(NestedNames(levels), ""),
                  kNestedValue);
    }
}

void AddUpdates()
{
    Add(kUpdate, kPoco, true,
        []
        {
            auto configuration = Loaded(Channels(kUpdatedChannels));
            return Seen(
                [configuration]() mutable
                {
                    configuration->setString("label", "after");
                    return true;
                },
                [configuration] { return configuration->getString("label") == "after"; });
        });
    Add(kUpdateAndSave, kPoco, true,
        []
        {
            const std::string path = ScratchFile("saved-by-poco.xml");
            return Seen(
                [configuration = Loaded(Channels(kUpdatedChannels)), path]() mutable
                {
                    configuration->setString("label", "after");
                    configuration->save(path);
                    return true;
                },
                [path] { return IsUpdated(path); });
        });
}

const Registration registration(
    []
    {
        Versions()[kPoco] = std::to_string(POCO_VERSION >> 24) + '.' +
                            std::to_string(POCO_VERSION >> 16 & 0xFF) + '.' +
                            std::to_string(POCO_VERSION >> 8 & 0xFF);
        AddLoads();
        AddLookUps();
        AddUpdates();
    });

} // namespace

} // namespace bench
