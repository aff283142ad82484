// Reads the values under a key path: read_value FILE KEY

#include "CXMLReader.h"

#include <iostream>
#include <string>

int main(int argc, char** argv)
{
    if (argc != 3)
    {
        std::cerr << "usage: read_value FILE KEY\n";
        return 2;
    }
    IConfigReader* const reader = GetCXMLReaderObject(argv[1]);
    if (reader == 0 || reader->GetDataPtr() == 0)
    {
        std::cerr << argv[1] << " cannot be read\n";
        delete reader;
        return 1;
    }
    std::string values;
    if (reader->GetValue(argv[2], values) == 0)
    {
        std::cout << values << '\n'; // several values are separated by "\n"
    }
    delete reader; // also frees the document
    return 0;
}
