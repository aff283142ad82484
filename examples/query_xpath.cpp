// Prints the content of every node that an expression selects: query_xpath FILE XPATH
//
// Works for any number of nodes; FindAllNodes() is valid for at most 255.

#include "CXmlParser.h"

#include <libxml/xpath.h>

#include <iostream>

static void Print(const xmlNodeSet* nodes)
{
    const int count = xmlXPathNodeSetGetLength(nodes);
    for (int i = 0; i < count; ++i)
    {
        CXmlNode node(xmlXPathNodeSetItem(nodes, i));
        std::cout << node.Name() << ": " << node.GetContent() << "\n";
    }
    std::cout << count << " found\n";
}

int main(int argc, char** argv)
{
    if (argc != 3)
    {
        std::cerr << "usage: query_xpath FILE XPATH\n";
        return 2;
    }

    CXmlParser parser;
    const int status = parser.ParseXml(argv[1]);
    if (status != 0)
    {
        std::cerr << "not loaded: " << status << "\n";
        return 1;
    }
    xmlXPathObjectPtr result = parser.GetNodeSet(argv[2], parser.GetRootNode());
    if (result == 0)
    {
        std::cerr << "not an expression: " << argv[2] << "\n";
        return 1;
    }
    Print(result->nodesetval);
    xmlXPathFreeObject(result); // the caller owns the result, the document its nodes
    return 0;
}
