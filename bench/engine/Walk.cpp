// What one would write by hand over libxml2: the limit of the engine. Fixed paths, names compared
// by strcmp, nothing allocated but the result and what the engine allocates for an attribute read.
// Walks with a condition come in two forms: with xmlGetProp(), as one would write them, and reading
// the attribute in place, which holds for attributes of a single text only.
//
// The walks find every match, as a lookup of the library does.

#include "Documents.h"
#include "Operations.h"
#include "library/Loaded.h"

#include <libxml/parser.h>
#include <libxml/tree.h>

#include <cstring>
#include <iterator>
#include <stdexcept>

namespace bench
{

namespace
{

const char* Text(const xmlChar* text)
{
    return reinterpret_cast<const char*>(text);
}

const xmlChar* EngineText(const char* text)
{
    return reinterpret_cast<const xmlChar*>(text);
}

bool IsNamed(const xmlNode* node, const char* name)
{
    return node->type == XML_ELEMENT_NODE && std::strcmp(Text(node->name), name) == 0;
}

/** The root is a step of the path, too: its name is compared. */
xmlNode* RootOf(const xmlDoc* document)
{
    xmlNode* const root = xmlDocGetRootElement(document);
    if (!IsNamed(root, "cfg"))
    {
        throw std::runtime_error("another document");
    }
    return root;
}

bool HoldsOnlyText(const xmlNode* element)
{
    const xmlNode* const child = element->children;
    return child != nullptr && child->type == XML_TEXT_NODE && child->next == nullptr;
}

void AppendText(const xmlNode* element, std::string& result)
{
    if (!HoldsOnlyText(element))
    {
        return;
    }
    if (!result.empty())
    {
        result += '\n';
    }
    result += Text(element->children->content);
}

void AppendTexts(const xmlNode* parent, const char* name, std::string& result)
{
    for (const xmlNode* child = parent->children; child != nullptr; child = child->next)
    {
        if (IsNamed(child, name))
        {
            AppendText(child, result);
        }
    }
}

bool HasAttribute(xmlNode* element, const char* name, const char* value)
{
    xmlChar* const text = xmlGetProp(element, EngineText(name));
    if (text == nullptr)
    {
        return false;
    }
    const bool equal = std::strcmp(Text(text), value) == 0;
    xmlFree(text);
    return equal;
}

bool HasAttributeInPlace(xmlNode* element, const char* name, const char* value)
{
    for (const xmlAttr* attribute = element->properties; attribute != nullptr;
         attribute = attribute->next)
    {
        if (std::strcmp(Text(attribute->name), name) == 0)
        {
            const xmlNode* const text = attribute->children;
            return text != nullptr && text->next == nullptr && text->type == XML_TEXT_NODE &&
                   std::strcmp(Text(text->content), value) == 0;
        }
    }
    return false;
}

/** One of the two ways to test an attribute. */
using Test = bool (*)(xmlNode* element, const char* name, const char* value);

using Names = std::vector<std::string>;

void AppendBelow(const xmlNode* parent, Names::const_iterator name, Names::const_iterator last,
                 std::string& result)
{
    if (name == last)
    {
        AppendTexts(parent, name->c_str(), result);
        return;
    }
    for (const xmlNode* child = parent->children; child != nullptr; child = child->next)
    {
        if (IsNamed(child, name->c_str()))
        {
            AppendBelow(child, std::next(name), last, result);
        }
    }
}

std::string TextsBelow(const xmlNode* root, const Names& names)
{
    std::string result;
    AppendBelow(root, names.begin(), std::prev(names.end()), result);
    return result;
}

/** The texts of the elements @p name in those children @p item that @p holds selects. */
template <class Holds>
std::string TextsInSelected(const xmlNode* root, const char* item, const char* name, Holds holds)
{
    std::string result;
    for (xmlNode* child = root->children; child != nullptr; child = child->next)
    {
        if (IsNamed(child, item) && holds(child))
        {
            AppendTexts(child, name, result);
        }
    }
    return result;
}

std::string Read(const xmlNode* root, const FirstRead& read)
{
    if (std::strcmp(Text(root->name), read.root.c_str()) != 0)
    {
        return std::string();
    }
    if (read.attribute.empty())
    {
        return TextsBelow(root, read.names);
    }
    return TextsInSelected(
        root, read.names[0].c_str(), read.names[1].c_str(),
        [&](xmlNode* node)
        { return HasAttribute(node, read.attribute.c_str(), read.attributeValue.c_str()); });
}

struct ExpectedAttribute
{
    std::string name;
    std::string value;
};

template <Test test>
bool AllHold(xmlNode* element, const std::vector<ExpectedAttribute>& terms)
{
    for (const ExpectedAttribute& term : terms)
    {
        if (!test(element, term.name.c_str(), term.value.c_str()))
        {
            return false;
        }
    }
    return true;
}

/** Tests every term, as the library has to. */
template <Test test>
bool AnyHolds(xmlNode* element, const std::vector<ExpectedAttribute>& terms)
{
    bool any = false;
    for (const ExpectedAttribute& term : terms)
    {
        any = test(element, term.name.c_str(), term.value.c_str()) || any;
    }
    return any;
}

std::vector<ExpectedAttribute> AndTerms(std::size_t count)
{
    std::vector<ExpectedAttribute> terms;
    for (std::size_t term = 0; term != count; ++term)
    {
        terms.push_back({TermName(term), TermValue(term)});
    }
    return terms;
}

std::vector<ExpectedAttribute> OrTerms(std::size_t count)
{
    std::vector<ExpectedAttribute> terms = AndTerms(count);
    for (std::size_t term = 0; term + 1 < count; ++term)
    {
        terms[term].value = "other";
    }
    return terms;
}

/** Visits the whole tree. @return how many elements were given the text. */
int Update(xmlNode* parent, const char* name, const char* text)
{
    int updated = 0;
    for (xmlNode* child = parent->children; child != nullptr; child = child->next)
    {
        if (child->type != XML_ELEMENT_NODE)
        {
            continue;
        }
        if (std::strcmp(Text(child->name), name) == 0 && HoldsOnlyText(child))
        {
            xmlNodeSetContent(child, EngineText(text));
            ++updated;
        }
        updated += Update(child, name, text);
    }
    return updated;
}

void AddLoads()
{
    for (const FirstRead& read : FirstReads())
    {
        Add(read.workload, kWalk, read.value,
            [read]
            {
                return [read]
                {
                    xmlDoc* const document = xmlParseFile(read.path.c_str());
                    std::string value = Read(xmlDocGetRootElement(document), read);
                    xmlFreeDoc(document);
                    return value;
                };
            });
    }
}

void AddLookUpsBySiblings()
{
    for (const std::size_t count : Joined(kSiblingCounts, kMoreSiblingCounts))
    {
        Add(Sized(kLookUpPlain, count), kWalk, std::string(kServiceValue),
            [count]
            {
                return [document = LoadedDocument(Siblings(count))]
                {
                    std::string value;
                    AppendTexts(RootOf(document), "service", value);
                    return value;
                };
            });
    }
    for (const std::size_t count : Joined(kTextCounts, kMoreTextCounts))
    {
        Add(Sized(kLookUpTexts, count), kWalk, AllTexts(count),
            [count]
            {
                return [document = LoadedDocument(Texts(count))]
                {
                    std::string value;
                    AppendTexts(RootOf(document), "item", value);
                    return value;
                };
            });
    }
}

void AddLookUpsByDepth()
{
    for (const std::size_t levels : Joined(kDepths, kMoreDepths))
    {
        Add(Sized(kLookUpDepth, levels), kWalk, std::string(kNestedValue),
            [levels]
            {
                return [document = LoadedDocument(Nested(levels)), names = NestedNames(levels)]
                { return TextsBelow(RootOf(document), names); };
            });
    }
}

template <Test test>
void AddLookUpsWithConditions(const char* implementation)
{
    for (const std::size_t count : Joined(kItemCounts, kMoreItemCounts))
    {
        Add(Sized(kLookUpCondition, count), implementation, ItemName(count),
            [count]
            {
                return [document = LoadedDocument(Items(count)), id = std::to_string(count)]
                {
                    return TextsInSelected(RootOf(document), "item", "name",
                                           [&id](xmlNode* item)
                                           { return test(item, "id", id.c_str()); });
                };
            });
    }
    for (const std::size_t count : kTermCounts)
    {
        Add(Sized(kLookUpAndTerms, count), implementation, std::string(kAttributedValue),
            [count]
            {
                return [document = LoadedDocument(Attributed()), terms = AndTerms(count)]
                {
                    return TextsInSelected(RootOf(document), "item", "name",
                                           [&terms](xmlNode* item)
                                           { return AllHold<test>(item, terms); });
                };
            });
        Add(Sized(kLookUpOrTerms, count), implementation, std::string(kAttributedValue),
            [count]
            {
                return [document = LoadedDocument(Attributed()), terms = OrTerms(count)]
                {
                    return TextsInSelected(RootOf(document), "item", "name",
                                           [&terms](xmlNode* item)
                                           { return AnyHolds<test>(item, terms); });
                };
            });
    }
}

/** Gives the text to the elements @p name in those "item" whose "id" it is. */
template <Test test>
int UpdateSelected(const xmlNode* root, const char* id, const char* name, const char* text)
{
    int updated = 0;
    for (xmlNode* child = root->children; child != nullptr; child = child->next)
    {
        if (IsNamed(child, "item") && test(child, "id", id))
        {
            updated += Update(child, name, text);
        }
    }
    return updated;
}

template <Test test>
void AddUpdatesWithConditions(const char* implementation)
{
    Add(Sized(kUpdateCondition, kUpdatedItems), implementation, 1,
        []
        {
            return [document = LoadedDocument(Items(kUpdatedItems)),
                    id = std::to_string(kUpdatedItems), text = ItemName(kUpdatedItems)]
            { return UpdateSelected<test>(RootOf(document), id.c_str(), "name", text.c_str()); };
        });
}

void AddUpdates()
{
    Add(kUpdate, kWalk, 1,
        []
        {
            return [document = LoadedDocument(Channels(kUpdatedChannels))]
            { return Update(RootOf(document), "label", "after"); };
        });
    Add(kUpdateAndSave, kWalk, true,
        []
        {
            const std::string path = ScratchFile("saved.xml");
            return Seen(
                [document = LoadedDocument(Channels(kUpdatedChannels)), path]
                {
                    const int updated = Update(RootOf(document), "label", "after");
                    return updated == 1 && xmlSaveFileEnc(path.c_str(), document, "UTF-8") >= 0;
                },
                [path] { return IsUpdated(path); });
        });
}

const Registration registration(
    []
    {
        Versions()["libxml2"] = LIBXML_DOTTED_VERSION;
        AddLoads();
        AddLookUpsBySiblings();
        AddLookUpsByDepth();
        AddLookUpsWithConditions<HasAttribute>(kWalk);
        AddLookUpsWithConditions<HasAttributeInPlace>(kWalkInPlace);
        AddUpdates();
        AddUpdatesWithConditions<HasAttribute>(kWalk);
        AddUpdatesWithConditions<HasAttributeInPlace>(kWalkInPlace);
    });

} // namespace

} // namespace bench
