// A client of the key-path store, through the factory and through an object of its own.

#include "CXMLReader.h"

#include <stdio.h>

#include <string>

static bool HoldsTheName(IConfigReader& reader)
{
    std::string value;
    return reader.GetValue("gateway.name", value) == 0 && value == "line-3-gateway" &&
           reader.GetValue("gateway.name") == value;
}

int main(int argc, char** argv)
{
    if (argc < 2)
    {
        return 2;
    }
    CXMLReader own;
    CXMLReader* const made = GetCXMLReaderObject(argv[1]);
    const bool good = made != 0 && HoldsTheName(*made) && own.ParseFile(argv[1]) == 0 &&
                      HoldsTheName(own) && own.GetDataPtr() != 0;
    delete made;
    puts(good ? "good" : "wrong values");
    return good ? 0 : 1;
}
