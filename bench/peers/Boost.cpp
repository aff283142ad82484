// Boost.PropertyTree.

#include "Documents.h"
#include "Operations.h"

#include <boost/property_tree/ptree.hpp>
#include <boost/property_tree/xml_parser.hpp>
#include <boost/version.hpp>

#include <map>
#include <memory>

namespace bench
{

namespace
{

namespace pt = boost::property_tree;

const char* const kBoost = "Boost.PropertyTree";

using Tree = std::shared_ptr<pt::ptree>;

Tree Parsed(const std::string& path)
{
    const Tree tree = std::make_shared<pt::ptree>();
    pt::read_xml(path, *tree);
    return tree;
}

Tree Loaded(const std::string& path)
{
    static std::map<std::string, Tree> trees;
    Tree& tree = trees[path];
    if (!tree)
    {
        tree = Parsed(path);
    }
    return tree;
}

/** The text of @p name in the first @p item whose attribute has @p value. */
std::string TextInSelected(const pt::ptree& parent, const std::string& item,
                           const pt::ptree::path_type& attribute, const std::string& value,
                           const std::string& name)
{
    const auto range = parent.equal_range(item);
    for (auto child = range.first; child != range.second; ++child)
    {
        const auto text = child->second.get_child_optional(attribute);
        if (text && text->data() == value)
        {
            return child->second.get<std::string>(name);
        }
    }
    return std::string();
}

std::string KeyOf(const std::string& root, const std::vector<std::string>& names)
{
    std::string key = root;
    for (const std::string& name : names)
    {
        key += '.' + name;
    }
    return key;
}

std::string Read(const pt::ptree& tree, const FirstRead& read)
{
    if (read.attribute.empty())
    {
        return tree.get<std::string>(KeyOf(read.root, read.names));
    }
    return TextInSelected(tree.get_child(read.root), read.names[0], "<xmlattr>." + read.attribute,
                          read.attributeValue, read.names[1]);
}

void AddLookUp(const std::string& workload, const std::string& file, const std::string& key,
               const std::string& expected)
{
    Add(workload, kBoost, expected,
        [file, key] { return [tree = Loaded(file), key] { return tree->get<std::string>(key); }; });
}

void AddLoads()
{
    for (const FirstRead& read : FirstReads())
    {
        if (read.firstWillDo)
        {
            Add(read.workload, kBoost, read.value,
                [read] { return [read] { return Read(*Parsed(read.path), read); }; });
        }
    }
}

void AddLookUps()
{
    for (const std::size_t count : kSiblingCounts)
    {
        AddLookUp(Sized(kLookUpPlain, count), Siblings(count), "cfg.service", kServiceValue);
    }
    for (const std::size_t count : kItemCounts)
    {
        Add(Sized(kLookUpCondition, count), kBoost, ItemName(count),
            [count]
            {
                return [tree = Loaded(Items(count)), id = std::to_string(count),
                        attribute = pt::ptree::path_type("<xmlattr>.id")]
                { return TextInSelected(tree->get_child("cfg"), "item", attribute, id, "name"); };
            });
    }
    for (const std::size_t count : kTextCounts)
    {
        Add(Sized(kLookUpTexts, count), kBoost, AllTexts(count),
            [count]
            {
                return [tree = Loaded(Texts(count))]
                {
                    std::string values;
                    const auto range = tree->get_child("cfg").equal_range("item");
                    for (auto child = range.first; child != range.second; ++child)
                    {
                        values += values.empty() ? "" : "\n";
                        values += child->second.data();
                    }
                    return values;
                };
            });
    }
    for (const std::size_t levels : kDepths)
    {
        AddLookUp(Sized(kLookUpDepth, levels), Nested(levels), KeyOf("cfg", NestedNames(levels)),
                  kNestedValue);
    }
}

void AddUpdates()
{
    Add(kUpdate, kBoost, true,
        []
        {
            const auto tree = Loaded(Channels(kUpdatedChannels));
            return Seen(
                [tree]
                {
                    tree->put("cfg.label", "after");
                    return true;
                },
                [tree] { return tree->get<std::string>("cfg.label") == "after"; });
        });
    Add(kUpdateAndSave, kBoost, true,
        []
        {
            const std::string path = ScratchFile("saved-by-boost.xml");
            return Seen(
                [tree = Loaded(Channels(kUpdatedChannels)), path]
                {
                    tree->put("cfg.label", "after");
                    pt::write_xml(path, *tree);
                    return true;
                },
                [path] { return IsUpdated(path); });
        });
}

const Registration registration(
    []
    {
        Versions()[kBoost] = BOOST_LIB_VERSION;
        AddLoads();
        AddLookUps();
        AddUpdates();
    });

} // namespace

} // namespace bench
