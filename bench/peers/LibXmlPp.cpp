// libxml++: the same engine behind C++ objects; values are found by XPath.

#include "Documents.h"
#include "Operations.h"

#include <libxml++/libxml++.h>
#include <libxml++config.h>

#include <list>
#include <map>
#include <memory>
#include <utility>

namespace bench
{

namespace
{

const char* const kLibXmlPp = "libxml++";

using Parser = std::shared_ptr<xmlpp::DomParser>;

Parser Loaded(const std::string& path)
{
    static std::map<std::string, Parser> parsers;
    Parser& parser = parsers[path];
    if (!parser)
    {
        parser = std::make_shared<xmlpp::DomParser>(path);
    }
    return parser;
}

std::string TextOf(const xmlpp::Node* node)
{
    const auto* const element = dynamic_cast<const xmlpp::Element*>(node);
    return element == nullptr ? std::string() : element->get_child_text()->get_content().raw();
}

/** The texts of the selected elements, separated by newlines. */
std::string Texts(const xmlpp::Node* root, const Glib::ustring& expression)
{
    std::string values;
    for (const xmlpp::Node* const node : root->find(expression))
    {
        values += values.empty() ? "" : "\n";
        values += TextOf(node);
    }
    return values;
}

void AddLookUp(const std::string& workload, const std::string& file, const std::string& expression,
               const std::string& expected)
{
    Add(workload, kLibXmlPp, expected,
        [file, expression]
        {
            return [parser = Loaded(file), expression = Glib::ustring(expression)]
            { return Texts(parser->get_document()->get_root_node(), expression); };
        });
}

void AddLoads()
{
    for (const FirstRead& read : FirstReads())
    {
        Add(read.workload, kLibXmlPp, read.value,
            [read]
            {
                return [path = read.path, expression = Glib::ustring(read.xpath)]
                {
                    xmlpp::DomParser parser(path);
                    return Texts(parser.get_document()->get_root_node(), expression);
                };
            });
    }
}

void AddLookUps()
{
    for (const std::size_t count : kSiblingCounts)
    {
        AddLookUp(Sized(kLookUpPlain, count), Siblings(count), "/cfg/service", kServiceValue);
    }
    for (const std::size_t count : kItemCounts)
    {
        AddLookUp(Sized(kLookUpCondition, count), Items(count),
                  "/cfg/item[@id='" + std::to_string(count) + "']/name", ItemName(count));
    }
    for (const std::size_t count : kTextCounts)
    {
        AddLookUp(Sized(kLookUpTexts, count), bench::Texts(count), "/cfg/item", AllTexts(count));
    }
    for (const std::size_t levels : kDepths)
    {
        std::string expression = "/cfg";
        for (const std::string& name : NestedNames(levels))
        {
            expression += '/' + name;
        }
        AddLookUp(Sized(kLookUpDepth, levels), Nested(levels), expression, kNestedValue);
    }
}

bool Update(const Parser& parser)
{
    xmlpp::Node* const root = parser->get_document()->get_root_node();
    auto* const label = dynamic_cast<xmlpp::Element*>(root->get_first_child("label"));
    label->set_child_text("after");
    return true;
}

void AddUpdates()
{
    Add(kUpdate, kLibXmlPp, true,
        []
        {
            const auto parser = Loaded(Channels(kUpdatedChannels));
            return Seen([parser] { return Update(parser); },
                        [parser]
                        {
                            xmlpp::Node* const root = parser->get_document()->get_root_node();
                            auto* const label =
                                dynamic_cast<xmlpp::Element*>(root->get_first_child("label"));
                            return label->get_child_text()->get_content() == "after";
                        });
        });
    Add(kUpdateAndSave, kLibXmlPp, true,
        []
        {
            const std::string path = ScratchFile("saved-by-libxmlpp.xml");
            return Seen(
                [parser = Loaded(Channels(kUpdatedChannels)), path]
                {
                    Update(parser);
                    parser->get_document()->write_to_file(path, "UTF-8");
                    return true;
                },
                [path] { return IsUpdated(path); });
        });
}

std::list<std::pair<Glib::ustring, Glib::ustring>> AttributesOf(const xmlpp::Element& element)
{
    std::list<std::pair<Glib::ustring, Glib::ustring>> attributes;
    for (const xmlpp::Attribute* const attribute : element.get_attributes())
    {
        attributes.emplace_back(attribute->get_name(), attribute->get_value());
    }
    return attributes;
}

std::size_t CountedByIteration(const xmlpp::Node* parent)
{
    std::size_t count = 0;
    for (const xmlpp::Node* child = parent->get_first_child(); child != nullptr;
         child = child->get_next_sibling())
    {
        count += dynamic_cast<const xmlpp::Element*>(child) != nullptr;
    }
    return count;
}

void AddNodes()
{
    Add(kIterate, kLibXmlPp, kIteratedChildren,
        []
        {
            return [parser = Loaded(bench::Texts(kIteratedChildren))]
            { return CountedByIteration(parser->get_document()->get_root_node()); };
        });
    Add(kListChildren, kLibXmlPp, kIteratedChildren,
        []
        {
            return [parser = Loaded(bench::Texts(kIteratedChildren))]
            { return parser->get_document()->get_root_node()->get_children("item").size(); };
        });
    for (const std::size_t count : kFindChildCounts)
    {
        Add(Sized(kFindChild, count), kLibXmlPp, true,
            [count]
            {
                return [parser = Loaded(Siblings(count)), name = Glib::ustring("service")] {
                    return parser->get_document()->get_root_node()->get_first_child(name) !=
                           nullptr;
                };
            });
    }
    Add(kListAttributes, kLibXmlPp, kFourAttributes,
        []
        {
            const Parser parser = Loaded(FourAttributes());
            const auto* const item = dynamic_cast<const xmlpp::Element*>(
                parser->get_document()->get_root_node()->get_first_child("item"));
            return [parser, item] { return AttributesOf(*item).size(); };
        });
    for (const Query& query : kQueries)
    {
        Add(query.workload, kLibXmlPp, kQueryHits,
            [query]
            {
                return [parser = Loaded(Channels(query.channels)),
                        expression = Glib::ustring(query.expression)]
                { return parser->get_document()->get_root_node()->find(expression).size(); };
            });
    }
}

const Registration registration(
    []
    {
        Versions()[kLibXmlPp] = std::to_string(LIBXMLXX_MAJOR_VERSION) + '.' +
                                std::to_string(LIBXMLXX_MINOR_VERSION) + '.' +
                                std::to_string(LIBXMLXX_MICRO_VERSION);
        AddLoads();
        AddLookUps();
        AddUpdates();
        AddNodes();
    });

} // namespace

} // namespace bench
