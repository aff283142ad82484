// TinyXML-2.

#include "Documents.h"
#include "Operations.h"

#include <tinyxml2.h>

#include <list>
#include <map>
#include <memory>
#include <utility>

namespace bench
{

namespace
{

const char* const kTinyXml2 = "TinyXML-2";

using Document = std::shared_ptr<tinyxml2::XMLDocument>;

Document Loaded(const std::string& path)
{
    static std::map<std::string, Document> documents;
    Document& document = documents[path];
    if (!document)
    {
        document = std::make_shared<tinyxml2::XMLDocument>();
        document->LoadFile(path.c_str());
    }
    return document;
}

std::string TextOf(const tinyxml2::XMLElement* element)
{
    const char* const text = element == nullptr ? nullptr : element->GetText();
    return text == nullptr ? "" : text;
}

const tinyxml2::XMLElement* Selected(const tinyxml2::XMLElement* root, const char* name,
                                     const char* attribute, const char* value)
{
    const tinyxml2::XMLElement* element = root->FirstChildElement(name);
    while (element != nullptr && element->Attribute(attribute, value) == nullptr)
    {
        element = element->NextSiblingElement(name);
    }
    return element;
}

std::string TextBelow(const tinyxml2::XMLElement* element, const std::vector<std::string>& names)
{
    for (const std::string& name : names)
    {
        element = element->FirstChildElement(name.c_str());
    }
    return TextOf(element);
}

std::string Read(const tinyxml2::XMLDocument& document, const FirstRead& read)
{
    const tinyxml2::XMLElement* const root = document.FirstChildElement(read.root.c_str());
    if (read.attribute.empty())
    {
        return TextBelow(root, read.names);
    }
    return TextOf(
        Selected(root, read.names[0].c_str(), read.attribute.c_str(), read.attributeValue.c_str())
            ->FirstChildElement(read.names[1].c_str()));
}

void AddLoads()
{
    for (const FirstRead& read : FirstReads())
    {
        if (!read.firstWillDo)
        {
            continue;
        }
        Add(read.workload, kTinyXml2, read.value,
            [read]
            {
                return [read]
                {
                    tinyxml2::XMLDocument document;
                    document.LoadFile(read.path.c_str());
                    return Read(document, read);
                };
            });
    }
}

void AddLookUps()
{
    for (const std::size_t count : kSiblingCounts)
    {
        Add(Sized(kLookUpPlain, count), kTinyXml2, std::string(kServiceValue),
            [count]
            {
                return [document = Loaded(Siblings(count))]
                { return TextOf(document->RootElement()->FirstChildElement("service")); };
            });
    }
    for (const std::size_t count : kItemCounts)
    {
        Add(Sized(kLookUpCondition, count), kTinyXml2, ItemName(count),
            [count]
            {
                return [document = Loaded(Items(count)), id = std::to_string(count)]
                {
                    return TextOf(Selected(document->RootElement(), "item", "id", id.c_str())
                                      ->FirstChildElement("name"));
                };
            });
    }
    for (const std::size_t count : kTextCounts)
    {
        Add(Sized(kLookUpTexts, count), kTinyXml2, AllTexts(count),
            [count]
            {
                return [document = Loaded(Texts(count))]
                {
                    std::string values;
                    for (const tinyxml2::XMLElement* item =
                             document->RootElement()->FirstChildElement("item");
                         item != nullptr; item = item->NextSiblingElement("item"))
                    {
                        values += values.empty() ? "" : "\n";
                        values += item->GetText();
                    }
                    return values;
                };
            });
    }
    for (const std::size_t levels : kDepths)
    {
        Add(Sized(kLookUpDepth, levels), kTinyXml2, std::string(kNestedValue),
            [levels]
            {
                return [document = Loaded(Nested(levels)), names = NestedNames(levels)]
                { return TextBelow(document->RootElement(), names); };
            });
    }
}

void AddUpdates()
{
    Add(kUpdate, kTinyXml2, std::string("after"),
        []
        {
            return [document = Loaded(Channels(kUpdatedChannels))]
            {
                tinyxml2::XMLElement* const label =
                    document->RootElement()->FirstChildElement("label");
                label->SetText("after");
                return TextOf(label);
            };
        });
    Add(kUpdateAndSave, kTinyXml2, true,
        []
        {
            const std::string path = ScratchFile("saved-by-tinyxml2.xml");
            return Seen(
                [document = Loaded(Channels(kUpdatedChannels)), path]
                {
                    document->RootElement()->FirstChildElement("label")->SetText("after");
                    return document->SaveFile(path.c_str()) == tinyxml2::XML_SUCCESS;
                },
                [path] { return IsUpdated(path); });
        });
}

std::list<std::pair<std::string, std::string>> AttributesOf(const tinyxml2::XMLElement* element)
{
    std::list<std::pair<std::string, std::string>> attributes;
    for (const tinyxml2::XMLAttribute* attribute = element->FirstAttribute(); attribute != nullptr;
         attribute = attribute->Next())
    {
        attributes.emplace_back(attribute->Name(), attribute->Value());
    }
    return attributes;
}

void AddNodes()
{
    Add(kListAttributes, kTinyXml2, kFourAttributes,
        []
        {
            const Document document = Loaded(FourAttributes());
            return [document, item = document->RootElement()->FirstChildElement("item")]
            { return AttributesOf(item).size(); };
        });
    Add(kIterate, kTinyXml2, kIteratedChildren,
        []
        {
            return [document = Loaded(Texts(kIteratedChildren))]
            {
                std::size_t count = 0;
                for (const tinyxml2::XMLElement* child =
                         document->RootElement()->FirstChildElement();
                     child != nullptr; child = child->NextSiblingElement())
                {
                    ++count;
                }
                return count;
            };
        });
    for (const std::size_t count : kFindChildCounts)
    {
        Add(Sized(kFindChild, count), kTinyXml2, true,
            [count]
            {
                return [document = Loaded(Siblings(count))]
                { return document->RootElement()->FirstChildElement("service") != nullptr; };
            });
    }
}

const Registration registration(
    []
    {
        Versions()[kTinyXml2] = std::to_string(TINYXML2_MAJOR_VERSION) + '.' +
                                std::to_string(TINYXML2_MINOR_VERSION) + '.' +
                                std::to_string(TINYXML2_PATCH_VERSION);
        AddLoads();
        AddLookUps();
        AddUpdates();
        AddNodes();
    });

} // namespace

} // namespace bench
