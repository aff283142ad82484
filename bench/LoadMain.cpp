// Loads a file, prints the value under a key, and ends: the least that get and explain have to do.

#include "CXMLReader.h"
#include "KxLog.h"

#include <iostream>

int main(int argc, char** argv)
{
    if (argc != 3)
    {
        std::cerr << "usage: kx_bench_load FILE KEY\n";
        return 2;
    }
    g_LumLogParams.xmlConfigParserMask = 0;
    // Not freed, as in the client: the system takes the memory back at once.
    CXMLReader& reader = *new CXMLReader(argv[1]);
    std::string value;
    const int status = reader.GetValue(argv[2], value);
    std::cout << value << '\n';
    return status;
}
