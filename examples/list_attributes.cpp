// Prints the attributes of the first element that an expression selects: list_attributes FILE XPATH

#include "CXmlParser.h"

#include <iostream>

int main(int argc, char** argv)
{
    if (argc != 3)
    {
        std::cerr << "usage: list_attributes FILE XPATH\n";
        return 2;
    }

    CXmlParser parser;
    const int status = parser.ParseXml(argv[1]);
    if (status != 0)
    {
        std::cerr << "not loaded: " << status << "\n";
        return 1;
    }
    CXmlNode node = parser.FindNode(argv[2], parser.GetRootNode());
    if (node.IsNull())
    {
        std::cerr << "nothing found\n";
        return 1;
    }
    std::list<CXmlAttr> items = node.GetAttributeItems();
    for (std::list<CXmlAttr>::iterator item = items.begin(); item != items.end(); ++item)
    {
        std::cout << item->m_strName << "=" << item->m_strValue << "\n";
    }

    // One attribute by its name. The string is unchanged if there is none.
    std::string protocol = "any";
    node.GetAttributeValue("protocol", protocol);
    std::cout << "protocol is " << protocol << "\n";
    return 0;
}
