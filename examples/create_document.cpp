// Creates a document and saves it: create_document FILE

#include "CXmlParser.h"

#include <fstream>
#include <iostream>

int main(int argc, char** argv)
{
    if (argc != 2)
    {
        std::cerr << "usage: create_document FILE\n";
        return 2;
    }

    CXmlParser parser;
    if (parser.CreateNewXmlDoc("network") != 0)
    {
        std::cerr << "no document\n";
        return 1;
    }
    CXmlNode root = parser.GetRootNode();
    root.AddChildNode("name", "inside &amp; outside"); // content is XML text
    CXmlNode port = root.AddChildNode("port", "80");
    port.AddNewAttribute("id", "1"); // an attribute's value is plain text

    // Saving only overwrites an existing file, so create an empty one first.
    std::ofstream(argv[1], std::ios::app).close();
    const int status = parser.SaveXml(argv[1]);
    if (status != 0)
    {
        std::cerr << "not saved: " << status << "\n";
        return 1;
    }
    std::cout << std::ifstream(argv[1]).rdbuf();
    return 0;
}
