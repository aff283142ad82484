// Changes a value, saves the file and reads it back: change_and_save FILE

#include "CXMLReader.h"
#include "CXMLWriter.h"

#include <iostream>
#include <string>

namespace
{

const char* const kKey = "gateway.log.level";

/** @return whether the file now holds the value. */
bool Change(const char* file, const std::string& value)
{
    IConfigWriter* const writer = GetCXMLWriterObject(file);
    if (writer == 0)
    {
        return false;
    }
    // For a file that cannot be parsed the writer has no document, and SetValue() returns 7.
    const bool changed = writer->SetValue(kKey, value) == 0 && writer->SaveData() == 0;
    delete writer;
    return changed;
}

} // namespace

int main(int argc, char** argv)
{
    if (argc != 2 || !Change(argv[1], "debug"))
    {
        std::cerr << "usage: change_and_save FILE, a file that can be written\n";
        return 1;
    }
    CXMLReader reader(argv[1]);
    std::cout << kKey << " is now " << reader.GetValue(kKey) << '\n';
    return 0;
}
