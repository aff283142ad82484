#include "Commands.h"
#include "Document.h"
#include "KeyList.h"
#include "Nodes.h"
#include "Output.h"

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
        if (IsFreeOf(".|&=@", name) && IsFreeOf(".|&\t\r\n", value))
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

/** Lists the keys of the elements below one whose key is given, in document order, each once. */
class KeyLister
{
public:
    void ListBelow(const xmlNode* parent, const std::string& key)
    {
        const Siblings siblings(parent);
        for (const xmlNode* node = parent->children; node != nullptr; node = node->next)
        {
            if (node->type == XML_ELEMENT_NODE && IsFreeOf(".@", Text(node->name)))
            {
                const std::string keyOfNode = key + "." + siblings.SegmentOf(node);
                if (OnlyTextOf(node) != nullptr)
                {
                    List(keyOfNode);
                }
                ListBelow(node, keyOfNode);
            }
        }
    }

    std::vector<std::string> Take() { return std::move(m_keys); }

private:
    void List(const std::string& key)
    {
        if (m_listed.insert(key).second)
        {
            m_keys.push_back(key);
        }
    }

    std::vector<std::string> m_keys;
    std::set<std::string> m_listed;
};

} // namespace

std::vector<std::string> ListKeys(const xmlNode* root)
{
    KeyLister lister;
    if (IsFreeOf(".", Text(root->name)))
    {
        lister.ListBelow(root, Text(root->name));
    }
    return lister.Take();
}

ExitStatus Keys(const std::string& file)
{
    const std::unique_ptr<CXMLReader> reader = LoadFile(file);
    if (reader == nullptr)
    {
        return ExitStatus::BadFile;
    }
    bool printed = false;
    for (const std::string& key : ListKeys(RootOf(*reader)))
    {
        // The value is what the lookup finds: more than one element's where a key cannot tell.
        std::string value;
        if (reader->GetValue(key, value) == 0)
        {
            Print(key + '\t' + Quoted(value), {{"key", key}, {"value", value}});
            printed = true;
        }
    }
    if (!printed)
    {
        Complain("nothing found: " + file + " holds no value that a key path can name");
        return ExitStatus::NothingFound;
    }
    return ExitStatus::Done;
}
