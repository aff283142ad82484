#include "Commands.h"
#include "Document.h"
#include "Nodes.h"

#include <iostream>
#include <map>
#include <set>
#include <vector>

namespace
{

/** @return whether @p text can stand in a key, where these bytes would end it. */
bool IsFreeOf(const char* separators, const std::string& text)
{
    return text.find_first_of(separators) == std::string::npos;
}

struct Attribute
{
    std::string name;
    std::string value;
};

/** @return the attributes of @p element that a condition can ask for. */
std::vector<Attribute> UsableAttributes(const xmlNode* element)
{
    std::vector<Attribute> usable;
    for (const xmlAttr* attribute = element->properties; attribute != nullptr;
         attribute = attribute->next)
    {
        const std::string name = Text(attribute->name);
        const std::string value = AttributeOf(element, name);
        if (IsFreeOf(".|&=@", name) && IsFreeOf(".|&\t\n", value))
        {
            usable.push_back({name, value});
        }
    }
    return usable;
}

/** The element children of one node: how often each name, and each attribute under it, occurs. */
class Siblings
{
public:
    explicit Siblings(const xmlNode* parent)
    {
        for (const xmlNode* node = parent->children; node != nullptr; node = node->next)
        {
            if (node->type == XML_ELEMENT_NODE)
            {
                Count(node);
            }
        }
    }

    /** @return the segment for @p element: its name, and a condition if others bear it too. */
    std::string SegmentOf(const xmlNode* element) const
    {
        const std::string name = Text(element->name);
        if (m_counts.at(name) == 1)
        {
            return name;
        }
        for (const Attribute& attribute : UsableAttributes(element))
        {
            const std::string segment = name + "@" + attribute.name + "=" + attribute.value;
            if (m_counts.at(segment) == 1)
            {
                return segment;
            }
        }
        return name;
    }

private:
    void Count(const xmlNode* element)
    {
        const std::string name = Text(element->name);
        ++m_counts[name];
        for (const Attribute& attribute : UsableAttributes(element))
        {
            ++m_counts[name + "@" + attribute.name + "=" + attribute.value];
        }
    }

    std::map<std::string, int> m_counts; ///< by the segment that would select them
};

/** Prints the keys of the elements below one whose key is given, in document order, each once. */
class KeyPrinter
{
public:
    explicit KeyPrinter(CXMLReader& reader) : m_reader(reader) {}

    void PrintBelow(const xmlNode* parent, const std::string& key)
    {
        const Siblings siblings(parent);
        for (const xmlNode* node = parent->children; node != nullptr; node = node->next)
        {
            if (node->type == XML_ELEMENT_NODE && IsFreeOf(".@", Text(node->name)))
            {
                const std::string keyOfNode = key + "." + siblings.SegmentOf(node);
                if (OnlyTextOf(node) != nullptr)
                {
                    Print(keyOfNode);
                }
                PrintBelow(node, keyOfNode);
            }
        }
    }

    bool PrintedAny() const { return !m_printed.empty(); }

private:
    /** The value is what the lookup finds: more than one element's where a key cannot tell. */
    void Print(const std::string& key)
    {
        std::string value;
        if (m_printed.insert(key).second && m_reader.GetValue(key, value) == 0)
        {
            std::cout << key << '\t' << Quoted(value) << '\n';
        }
    }

    CXMLReader& m_reader;
    std::set<std::string> m_printed;
};

} // namespace

ExitStatus Keys(const std::string& file)
{
    const std::unique_ptr<CXMLReader> reader = LoadFile(file);
    if (reader == nullptr)
    {
        return ExitStatus::BadFile;
    }
    const xmlNode* const root = xmlDocGetRootElement(static_cast<xmlDoc*>(reader->GetDataPtr()));
    KeyPrinter printer(*reader);
    if (IsFreeOf(".", Text(root->name)))
    {
        printer.PrintBelow(root, Text(root->name));
    }
    if (!printer.PrintedAny())
    {
        Complain("nothing found: " + file + " holds no value that a key path can name");
        return ExitStatus::NothingFound;
    }
    return ExitStatus::Done;
}
