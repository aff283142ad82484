#include "Commands.h"
#include "Document.h"

#include "CXMLReader.h"

#include <iostream>
#include <memory>

namespace
{

ExitStatus PrintValues(CXMLReader& reader, const std::string& file, const std::string& key)
{
    std::string values;
    const int status = reader.GetValue(key, values);
    if (key.empty() || status == 7)
    {
        Complain("malformed key \"" + key +
                 "\": it names the root element and at least one more, as in root.name");
        return ExitStatus::BadUsage;
    }
    const std::string root = RootName(reader.GetDataPtr());
    if (RootNameOf(key) != root)
    {
        Complain("nothing found: the key starts with \"" + RootNameOf(key) +
                 "\", but the root element of " + file + " is \"" + root + "\"");
        return ExitStatus::NothingFound;
    }
    if (status != 0)
    {
        Complain("nothing found: no element of " + file + " has a value under \"" + key + "\"");
        return ExitStatus::NothingFound;
    }
    std::cout << values << '\n';
    return ExitStatus::Done;
}

} // namespace

ExitStatus Get(const std::string& file, const std::string& key)
{
    const std::unique_ptr<CXMLReader> reader(GetCXMLReaderObject(file.c_str()));
    if (reader == nullptr || reader->GetDataPtr() == nullptr)
    {
        Complain(WhyNotLoaded(file));
        return ExitStatus::BadFile;
    }
    return PrintValues(*reader, file, key);
}
