#include "model/Generate.h"

#include "model/Nodes.h"

#include <libxml/parser.h>

#include <algorithm>
#include <initializer_list>
#include <random>

namespace kxmodel
{

namespace
{

class Dice
{
public:
    explicit Dice(std::uint64_t seed) : m_engine(seed) {}

    // The standard's distributions differ between its implementations.
    std::size_t Below(std::size_t end) { return static_cast<std::size_t>(m_engine() % end); }
    bool OneIn(std::size_t n) { return Below(n) == 0; }

    template <class T>
    T Pick(std::initializer_list<T> choices)
    {
        return choices.begin()[Below(choices.size())];
    }

private:
    std::mt19937_64 m_engine;
};

// --- Documents

class DocumentWriter
{
public:
    explicit DocumentWriter(Dice& dice) : m_dice(dice), m_hasDtd(dice.OneIn(3)) {}

    std::string Write()
    {
        std::string text;
        if (m_hasDtd)
        {
            text += "<!DOCTYPE cfg [<!ENTITY e 'mid'><!ENTITY t '<a n=\"1\">in</a>'>";
            text += m_dice.OneIn(2) ? "<!ATTLIST a n CDATA '1' nm CDATA ''>" : "";
            text += m_dice.OneIn(2) ? "<!ATTLIST ab m CDATA 'x&e;y'>]>" : "]>";
        }
        Add(text, "<!-- head -->", 8);
        text += Element(m_dice.OneIn(4) ? Name() : "cfg", 0);
        Add(text, "<?tail?>", 8);
        return text;
    }

private:
    void Add(std::string& text, const char* piece, std::size_t oneIn)
    {
        if (m_dice.OneIn(oneIn))
        {
            text += piece;
        }
    }

    std::string Name()
    {
        return m_dice.Pick({"a", "a", "a", "ab", "ab", "abc", "b", "cfg", "p:a"});
    }

    std::string Attributes()
    {
        std::string text;
        for (const char* const name : {"n", "nm", "m", "p:m"})
        {
            if (m_dice.OneIn(3))
            {
                text += std::string(" ") + name + "=\"" + AttributeValue() + '"';
            }
        }
        return text;
    }

    std::string AttributeValue()
    {
        if (m_hasDtd && m_dice.OneIn(6))
        {
            return m_dice.Pick({"&e;", "x&e;y"});
        }
        if (m_dice.OneIn(8))
        {
            return m_dice.Pick({"#", "#0", "#2", "#c"}); // for Reshape()
        }
        return m_dice.Pick({"1", "1", "1", "2", "2", "12", "", "=", "1=2", "1|2", "1&amp;2",
                            "1&amp;nm=2", "1@m=2", "&lt;"});
    }

    std::string Element(const std::string& name, std::size_t depth)
    {
        std::string text = "<" + name;
        text += depth == 0 ? " xmlns:p='urn:p'" : "";
        text += Attributes() + ">";
        if (depth != 0 && m_dice.OneIn(2))
        {
            text += Text();
        }
        else
        {
            const std::size_t children = depth == 0 ? 1 + m_dice.Below(6) : m_dice.Below(5);
            for (std::size_t i = 0; i != children; ++i)
            {
                text += Child(depth);
            }
        }
        return text + "</" + name + ">";
    }

    std::string Child(std::size_t depth)
    {
        if (depth < 5 && !m_dice.OneIn(3))
        {
            return Element(Name(), depth + 1);
        }
        if (m_hasDtd && m_dice.OneIn(4))
        {
            return m_dice.Pick({"&e;", "&t;"});
        }
        return m_dice.OneIn(2) ? Text()
                               : m_dice.Pick({"<!--c-->", "<?pi a?>", "<![CDATA[v]]>", "\n  ", "",
                                              "<![CDATA[]]>", "&#65;", "<a/>"});
    }

    std::string Text() { return m_dice.Pick({"v", "w", "1", " ", "a.b", "&lt;&amp;", "v\nw"}); }

    Dice& m_dice;
    const bool m_hasDtd;
};

// --- Keys

std::string Name(const xmlChar* name)
{
    return reinterpret_cast<const char*>(name);
}

class KeyWriter
{
public:
    KeyWriter(Dice& dice, xmlDocPtr document) : m_dice(dice), m_nodes(NodesOf(document))
    {
        for (const xmlNodePtr node : m_nodes)
        {
            if (node != nullptr && node->type == XML_ELEMENT_NODE)
            {
                m_elements.push_back(node);
            }
        }
    }

    /** @return a key path. */
    std::string Whole()
    {
        const std::string rest = Path(Target(), m_elements[0]);
        return Mutated(Name(m_elements[0]->name) + (rest.empty() ? "" : ".") + rest);
    }

    /** @return the rest of a key path, below the node whose number goes into @p start. */
    std::string Rest(unsigned& start)
    {
        const xmlNodePtr target = Target();
        xmlNodePtr top = target->parent;
        while (m_dice.OneIn(2) && top->parent != nullptr)
        {
            top = top->parent;
        }
        const auto number = std::find(m_nodes.begin(), m_nodes.end(), top) - m_nodes.begin();
        start = static_cast<unsigned>(number);
        if (m_dice.OneIn(8))
        {
            start = static_cast<unsigned>(m_dice.Below(8));
        }
        return Mutated(Path(target, top));
    }

private:
    /** @return any element, those that hold one text only more often than others. */
    xmlNodePtr Target()
    {
        xmlNodePtr element = nullptr;
        for (int tries = 0; tries != 5; ++tries)
        {
            element = m_elements[m_dice.Below(m_elements.size())];
            if (element->children != nullptr && element->children->type == XML_TEXT_NODE &&
                element->children->next == nullptr)
            {
                break;
            }
        }
        return element;
    }

    /** @return the segments from below @p top to @p element. */
    std::string Path(xmlNodePtr element, xmlNodePtr top)
    {
        if (element == top)
        {
            return "";
        }
        const std::string above = Path(element->parent, top);
        return above + (above.empty() ? "" : ".") + Segment(element);
    }

    std::string Segment(xmlNodePtr element)
    {
        std::string segment = Name(element->name);
        if (m_dice.OneIn(3))
        {
            segment += '@' + Term(element);
            while (m_dice.OneIn(3))
            {
                segment += m_dice.Pick({'|', '&'}) + Term(element);
            }
        }
        return segment;
    }

    std::string Term(xmlNodePtr element)
    {
        std::string name = m_dice.Pick({"n", "nm", "m"});
        if (element->properties != nullptr && !m_dice.OneIn(4))
        {
            name = Name(element->properties->name);
        }
        std::string value = m_dice.Pick({"1", "2", "", "=", "12", "mid", "xmidy"});
        xmlChar* const real = xmlGetProp(element, reinterpret_cast<const xmlChar*>(name.c_str()));
        if (real != nullptr && !m_dice.OneIn(3))
        {
            value = Name(real);
        }
        xmlFree(real);
        return name + '=' + value;
    }

    std::string Mutated(std::string key)
    {
        while (m_dice.OneIn(3))
        {
            Mutate(key);
        }
        return key;
    }

    void Mutate(std::string& key)
    {
        static const std::string alphabet("..@@==||&&aabcnm12\0\xC3", 20);
        const std::size_t at = m_dice.Below(key.size() + 1);
        const std::size_t count = m_dice.Below(4);
        switch (m_dice.Below(6))
        {
        case 0:
            key.insert(at, 1, alphabet[m_dice.Below(alphabet.size())]);
            break;
        case 1:
            key.erase(at, 1);
            break;
        case 2:
            key.replace(at, 1, 1, alphabet[m_dice.Below(alphabet.size())]);
            break;
        case 3: // once more what is there
            key.insert(at, key.substr(at, count));
            break;
        case 4:
            key += m_dice.Pick({".", ".", ".", ".a", ".ab", "@n=1", "|n=2", "&m=1"});
            break;
        default: // a level less
            const auto dot = key.find('.', at);
            key.erase(dot == std::string::npos ? key.size() : dot,
                      key.find('.', dot == std::string::npos ? dot : dot + 1) - dot);
            break;
        }
    }

    Dice& m_dice;
    const std::vector<xmlNodePtr> m_nodes;
    std::vector<xmlNodePtr> m_elements; ///< the root first
};

Operation DrawnOperation(Dice& dice, KeyWriter& keys)
{
    Operation operation;
    operation.call = dice.Pick({Call::Get, Call::Get, Call::GetInto, Call::GetInto, Call::GetInto,
                                Call::GetInPlace, Call::Collect, Call::Append, Call::Set, Call::Set,
                                Call::Set, Call::Update});
    const bool below = operation.call == Call::Collect || operation.call == Call::Append ||
                       operation.call == Call::Update;
    operation.mask = dice.Pick({0xFFFFFFFFu, 0xFFFFFFFFu, 0u, 0x800u, 0x20000200u});
    operation.key = below ? keys.Rest(operation.node) : keys.Whole();
    if (operation.call == Call::Set || operation.call == Call::Update)
    {
        operation.value = dice.Pick({"1", "1", "new", "2 2", "", "&amp;", "&e;", "a&b", "<x/>"});
    }
    else if (dice.OneIn(3))
    {
        operation.value = dice.Pick({"old", "\n", "two\nlines"});
    }
    return operation;
}

} // namespace

Case Generated(std::uint64_t seed)
{
    constexpr std::size_t kOperations = 20;
    Dice dice(seed);
    Case drawn;
    drawn.document = DocumentWriter(dice).Write();
    const xmlDocPtr document =
        xmlReadMemory(drawn.document.data(), static_cast<int>(drawn.document.size()), nullptr,
                      nullptr, XML_PARSE_NOERROR | XML_PARSE_NOWARNING);
    Reshape(document);
    if (document != nullptr)
    {
        KeyWriter keys(dice, document);
        while (drawn.operations.size() != kOperations)
        {
            drawn.operations.push_back(DrawnOperation(dice, keys));
        }
        xmlFreeDoc(document);
    }
    return drawn;
}

} // namespace kxmodel
