#include "Commands.h"
#include "Document.h"

#include <iostream>

ExitStatus Get(const std::string& file, const std::string& key)
{
    const std::unique_ptr<CXMLReader> reader = LoadFile(file);
    if (reader == nullptr)
    {
        return ExitStatus::BadFile;
    }
    const ExitStatus keyStatus = CheckKey(file, key, *reader);
    if (keyStatus != ExitStatus::Done)
    {
        return keyStatus;
    }
    std::string values;
    if (reader->GetValue(key, values) != 0)
    {
        Complain("nothing found: no element of " + file + " has a value under " + Quoted(key));
        return ExitStatus::NothingFound;
    }
    std::cout << values << '\n';
    return ExitStatus::Done;
}
