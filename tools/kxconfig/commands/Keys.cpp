#include "commands/Keys.h"

#include "file/Load.h"
#include "output/Failure.h"
#include "output/Quoting.h"
#include "output/Report.h"
#include "survey/KeyList.h"
#include "survey/KeyValues.h"

#include <nlohmann/json.hpp>

namespace
{

struct KeyAndValue
{
    const std::string& key;
    std::string value; ///< of several elements where a key cannot tell them apart

    std::string Line() const { return key + '\t' + Quoted(value); }
    Json InJson() const { return {{"key", key}, {"value", value}}; }
};

} // namespace

ExitStatus Keys(const KeysArguments& arguments, Report& report)
{
    const std::unique_ptr<CXMLReader> reader = LoadFile(arguments.file);
    const xmlNode* const root = RootOf(*reader);
    Levels levels(root->doc);
    KeyValues values(root, levels);
    const std::vector<std::string> keys = ListKeys(root, levels);
    if (keys.empty())
    {
        throw Failure(ExitStatus::NothingFound, "nothing found: " + arguments.file +
                                                    " has no value that a key path can name");
    }
    for (const std::string& key : keys)
    {
        report.Add(KeyAndValue{key, values.Under(key)});
    }
    return ExitStatus::Done;
}
