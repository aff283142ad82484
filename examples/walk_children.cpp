// Prints the elements of a file, indented, with their text: walk_children FILE

#include "CXmlParser.h"

#include <iostream>

static void Print(CXmlNode node, const std::string& indentation)
{
    std::cout << indentation << node.Name();
    const std::string content = node.GetContent();
    if (!content.empty())
    {
        std::cout << ": " << content;
    }
    std::cout << "\n";
    for (CXmlNode child = node.FirstChild(); !child.IsNull(); child = child.NextSibling())
    {
        Print(child, indentation + "  ");
    }
}

int main(int argc, char** argv)
{
    if (argc != 2)
    {
        std::cerr << "usage: walk_children FILE\n";
        return 2;
    }

    CXmlParser parser;
    const int status = parser.ParseXml(argv[1]);
    if (status != 0)
    {
        std::cerr << "not loaded: " << status << "\n";
        return 1;
    }
    Print(parser.GetRootNode(), "");
    return 0;
}
