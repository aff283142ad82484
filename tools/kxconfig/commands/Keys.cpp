#include "commands/Commands.h"
#include "file/Document.h"
#include "output/Output.h"
#include "survey/KeyList.h"
#include "survey/KeyValues.h"

ExitStatus Keys(const std::string& file)
{
    const std::unique_ptr<CXMLReader> reader = LoadFile(file);
    if (reader == nullptr)
    {
        return ExitStatus::BadFile;
    }
    const xmlNode* const root = RootOf(*reader);
    Levels levels(root->doc);
    KeyValues values(root, levels);
    const std::vector<std::string> keys = ListKeys(root, levels);
    for (const std::string& key : keys)
    {
        // More than one element's where a key cannot tell.
        const std::string value = values.Under(key);
        if (AnswersInJson())
        {
            PrintResult({{"key", key}, {"value", value}});
        }
        else
        {
            PrintLine(key + '\t' + Quoted(value));
        }
    }
    if (keys.empty())
    {
        Complain("nothing found: " + file + " holds no value that a key path can name");
        return ExitStatus::NothingFound;
    }
    return ExitStatus::Done;
}
