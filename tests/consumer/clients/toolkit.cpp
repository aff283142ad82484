// A client of the document toolkit.

#include "CXmlParser.h"

#include <stdio.h>

#include <list>
#include <string>

static bool ReadsTheName(CXmlParser& parser)
{
    std::string name;
    return parser.GetRootNode().GetContentOfChildNode("name", name) == 0 &&
           name == "line-3-gateway" && parser.FindAllNodes("//channel", CXmlNode()).size() == 3;
}

static bool ListsAttributes(CXmlParser& parser)
{
    const std::list<CXmlAttr> attributes =
        parser.FindNode("//channel", CXmlNode()).GetAttributeItems();
    return attributes.size() == 3 && attributes.front().m_strName == "id" &&
           attributes.front().m_strValue == "1";
}

int main(int argc, char** argv)
{
    if (argc < 2)
    {
        return 2;
    }
    CXmlParser parser;
    const bool good = parser.ParseXml(argv[1]) == 0 && ReadsTheName(parser) &&
                      ListsAttributes(parser) && parser.GetRootNode().Type() == NODE_ELEMENT;
    puts(good ? "good" : "wrong values");
    return good ? 0 : 1;
}
