// pugixml.

#include "Documents.h"
#include "Operations.h"

#include <pugixml.hpp>

#include <list>
#include <map>
#include <memory>
#include <utility>

namespace bench
{

namespace
{

const char* const kPugixml = "pugixml";

using Document = std::shared_ptr<pugi::xml_document>;

Document Loaded(const std::string& path)
{
    static std::map<std::string, Document> documents;
    Document& document = documents[path];
    if (!document)
    {
        document = std::make_shared<pugi::xml_document>();
        document->load_file(path.c_str());
    }
    return document;
}

std::string TextBelow(pugi::xml_node node, const std::vector<std::string>& names)
{
    for (const std::string& name : names)
    {
        node = node.child(name.c_str());
    }
    return node.child_value();
}

std::string Read(const pugi::xml_document& document, const FirstRead& read)
{
    const pugi::xml_node root = document.child(read.root.c_str());
    if (read.attribute.empty())
    {
        return TextBelow(root, read.names);
    }
    return root
        .find_child_by_attribute(read.names[0].c_str(), read.attribute.c_str(),
                                 read.attributeValue.c_str())
        .child_value(read.names[1].c_str());
}

void AddLoads()
{
    for (const FirstRead& read : FirstReads())
    {
        if (!read.firstWillDo)
        {
            continue;
        }
        Add(read.workload, kPugixml, read.value,
            [read]
            {
                return [read]
                {
                    pugi::xml_document document;
                    document.load_file(read.path.c_str());
                    return Read(document, read);
                };
            });
    }
}

void AddLookUps()
{
    for (const std::size_t count : kSiblingCounts)
    {
        Add(Sized(kLookUpPlain, count), kPugixml, std::string(kServiceValue),
            [count]
            {
                return [document = Loaded(Siblings(count))]
                { return std::string(document->child("cfg").child_value("service")); };
            });
    }
    for (const std::size_t count : kItemCounts)
    {
        Add(Sized(kLookUpCondition, count), kPugixml, ItemName(count),
            [count]
            {
                return [document = Loaded(Items(count)), id = std::to_string(count)]
                {
                    return std::string(document->child("cfg")
                                           .find_child_by_attribute("item", "id", id.c_str())
                                           .child_value("name"));
                };
            });
    }
    for (const std::size_t count : kTextCounts)
    {
        Add(Sized(kLookUpTexts, count), kPugixml, AllTexts(count),
            [count]
            {
                return [document = Loaded(Texts(count))]
                {
                    std::string values;
                    for (const pugi::xml_node item : document->child("cfg").children("item"))
                    {
                        values += values.empty() ? "" : "\n";
                        values += item.child_value();
                    }
                    return values;
                };
            });
    }
    for (const std::size_t levels : kDepths)
    {
        Add(Sized(kLookUpDepth, levels), kPugixml, std::string(kNestedValue),
            [levels]
            {
                return [document = Loaded(Nested(levels)), names = NestedNames(levels)]
                { return TextBelow(document->child("cfg"), names); };
            });
    }
}

void AddUpdates()
{
    Add(kUpdate, kPugixml, true,
        []
        {
            return [document = Loaded(Channels(kUpdatedChannels))]
            { return document->child("cfg").child("label").text().set("after"); };
        });
    Add(kUpdateAndSave, kPugixml, true,
        []
        {
            const std::string path = ScratchFile("saved-by-pugixml.xml");
            return Seen(
                [document = Loaded(Channels(kUpdatedChannels)), path]
                {
                    return document->child("cfg").child("label").text().set("after") &&
                           document->save_file(path.c_str(), "", pugi::format_raw,
                                               pugi::encoding_utf8);
                },
                [path] { return IsUpdated(path); });
        });
}

std::list<std::pair<std::string, std::string>> AttributesOf(const pugi::xml_node element)
{
    std::list<std::pair<std::string, std::string>> attributes;
    for (const pugi::xml_attribute attribute : element.attributes())
    {
        attributes.emplace_back(attribute.name(), attribute.value());
    }
    return attributes;
}

void AddNodes()
{
    Add(kListAttributes, kPugixml, kFourAttributes,
        []
        {
            const Document document = Loaded(FourAttributes());
            return [document, item = document->child("cfg").child("item")]
            { return AttributesOf(item).size(); };
        });
    Add(kIterate, kPugixml, kIteratedChildren,
        []
        {
            return [document = Loaded(Texts(kIteratedChildren))]
            {
                std::size_t count = 0;
                for (pugi::xml_node child = document->child("cfg").first_child(); child;
                     child = child.next_sibling())
                {
                    ++count;
                }
                return count;
            };
        });
    for (const std::size_t count : kFindChildCounts)
    {
        Add(Sized(kFindChild, count), kPugixml, true,
            [count]
            {
                return [document = Loaded(Siblings(count))]
                { return !document->child("cfg").child("service").empty(); };
            });
    }
    for (const Query& query : kQueries)
    {
        Add(query.workload, kPugixml, kQueryHits,
            [query]
            {
                return [document = Loaded(Channels(query.channels)), query]
                { return document->select_nodes(query.expression).size(); };
            });
    }
}

const Registration registration(
    []
    {
        Versions()[kPugixml] = std::to_string(PUGIXML_VERSION / 1000) + '.' +
                               std::to_string(PUGIXML_VERSION / 10 % 100);
        AddLoads();
        AddLookUps();
        AddUpdates();
        AddNodes();
    });

} // namespace

} // namespace bench
