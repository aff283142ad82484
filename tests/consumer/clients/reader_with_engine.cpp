// A client that handles the engine's own records.

#include "CXMLReader.h"

#include <libxml/tree.h>

#include <stdio.h>

int main(int argc, char** argv)
{
    if (argc < 2)
    {
        return 2;
    }
    CXMLReader reader(argv[1]);
    xmlNode* const root = xmlDocGetRootElement(static_cast<xmlDoc*>(reader.GetDataPtr()));
    const bool good = root != 0 && reader.XMLGetValue(root, "name") == "line-3-gateway";
    puts(good ? "good" : "wrong values");
    return good ? 0 : 1;
}
