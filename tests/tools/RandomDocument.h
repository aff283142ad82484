#ifndef KX_TESTS_TOOLS_RANDOMDOCUMENT_H
#define KX_TESTS_TOOLS_RANDOMDOCUMENT_H

#include <random>
#include <string>
#include <vector>

/** Makes small documents in which names repeat, attributes may distinguish, and orders vary. */
class RandomDocument
{
public:
    explicit RandomDocument(unsigned seed) : m_random(seed) {}

    std::string Make()
    {
        return "<!DOCTYPE cfg [<!ATTLIST a i CDATA '3'><!ATTLIST b p:i CDATA '1' j CDATA '2'>]>"
               "<cfg xmlns:p='urn:p'>" +
               Elements(3) + "</cfg>";
    }

private:
    std::string OneOf(const std::vector<std::string>& choices)
    {
        return choices[m_random() % choices.size()];
    }

    std::string Elements(int depth)
    {
        std::string elements;
        for (auto count = 1 + m_random() % 6; count != 0; --count)
        {
            elements += Element(depth) + OneOf({"", "", "", "<!--c-->", "t", "<?p i?>"});
        }
        return elements;
    }

    std::string Element(int depth)
    {
        const std::string name = OneOf({"a", "a", "b", "p:a", "u:a", "c.d"});
        const std::string attributes = OneOf({"", " i='1'", " i='2'", " i=''", " i='x.y'"}) +
                                       OneOf({"", " p:i='1'", " p:i='4'"}) +
                                       OneOf({"", " j='1'", " j='2'", " j='a=b@c'", " j='1|2'"});
        const std::string content =
            depth == 0 || m_random() % 3 == 0
                ? OneOf({"v", "w", "x\ny", " ", "", "<![CDATA[z]]>", "v<!--c-->w"})
                : Elements(depth - 1);
        return "<" + name + attributes + ">" + content + "</" + name + ">";
    }

    std::mt19937 m_random;
};

#endif
