#include "commands/Keys.h"

#include "file/Load.h"
#include "output/Failure.h"
#include "output/Quoting.h"
#include "output/Report.h"
#include "survey/KeyList.h"
#include "survey/KeyValues.h"

#include <nlohmann/json.hpp>

#include <algorithm>
#include <cstring>

namespace
{

/** Of several values under one key, only these are printed: keys that match the same elements
 * would print them again and again. */
const size_t kMostValues = 10;
const size_t kMostBytes = 1000;

struct KeyAndValue
{
    const std::string& key;
    std::string value; ///< of several elements that a key cannot distinguish
    size_t more;       ///< the number of values that are left out

    std::string Line() const
    {
        const std::string left = more == 0 ? "" : " ... " + std::to_string(more) + " more";
        return key + '\t' + Quoted(value) + left;
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

/** @return how many of the values of @p elements are printed. */
size_t NumberShown(const Elements& elements)
{
    size_t shown = 0;
    size_t bytes = 0;
    for (; shown != std::min(elements.size(), kMostValues); ++shown)
    {
        bytes += std::strlen(ValueOf(elements[shown]));
        if (bytes > kMostBytes)
        {
            break;
        }
    }
    return elements.size() == 1 ? 1 : shown;
}

KeyAndValue Describe(const std::string& key, Elements elements, bool all)
{
    const size_t shown = all ? elements.size() : NumberShown(elements);
    const size_t more = elements.size() - shown;
    elements.resize(shown);
    return {key, JoinedValues(elements), more};
}

} // namespace

ExitStatus Keys(const KeysArguments& arguments, Report& report)
{
    const std::unique_ptr<CXMLReader> reader = LoadFile(arguments.file, arguments.input);
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
        report.Add(Describe(key, values.BearersUnder(key), arguments.all));
    }
    return ExitStatus::Done;
}
