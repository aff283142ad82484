#include "commands/Add.h"

#include "commands/EditedDocument.h"
#include "commands/ValueArgument.h"
#include "file/Engine.h"
#include "file/Insertion.h"
#include "file/Locations.h"
#include "file/Nodes.h"
#include "file/StoredText.h"
#include "output/Failure.h"
#include "output/Quoting.h"

#include <new>

namespace
{

void RequireArguments(const AddArguments& arguments)
{
    RequireName(arguments.name);
    RequireXmlText(arguments.content);
    if (arguments.attribute && arguments.name == "xmlns")
    {
        throw Failure(ExitStatus::BadUsage, "\"xmlns\" declares a namespace, and is no attribute");
    }
}

void RequirePlace(const xmlNode* node, const AddArguments& arguments)
{
    if (node->type != XML_ELEMENT_NODE)
    {
        throw Failure(ExitStatus::BadUsage, Quoted(arguments.expression) + " selects " +
                                                KindName(node) + "; add needs an element");
    }
    if (arguments.after && node->parent->type != XML_ELEMENT_NODE)
    {
        throw Failure(ExitStatus::NotSaved,
                      "not saved: a document has one root element, and no other after it");
    }
}

/** The library adds a second attribute of the same name, too. */
void RequireNoAttribute(xmlNode* element, const std::string& name, Locations& locations)
{
    const xmlAttr* const attribute = xmlHasNsProp(element, kx::ToEngine(name), nullptr);
    if (attribute != nullptr && attribute->type == XML_ATTRIBUTE_NODE)
    {
        throw Failure(ExitStatus::NotSaved, "not saved: " + locations.Of(element) +
                                                " has an attribute " + Quoted(name) + " already");
    }
}

xmlNode* AddAttribute(xmlNode* element, const AddArguments& arguments)
{
    CXmlNode handle(element);
    if (handle.AddNewAttribute(arguments.name, "") != 0)
    {
        return nullptr;
    }
    const auto added =
        reinterpret_cast<xmlNode*>(xmlHasNsProp(element, kx::ToEngine(arguments.name), nullptr));
    CXmlNode(added).SetContent(arguments.content); // as XML text, like that of an element
    RequireStored(added, arguments.content);
    return added;
}

xmlNode* AddNode(xmlNode* place, const AddArguments& arguments)
{
    if (arguments.attribute)
    {
        return AddAttribute(place, arguments);
    }
    return arguments.after ? AddElement(place->parent, place, arguments.name, arguments.content)
                           : AddElement(place, nullptr, arguments.name, arguments.content);
}

/** @return the new nodes, one at each of the @p places. */
std::vector<xmlNode*> AddNodes(const std::vector<xmlNode*>& places, const AddArguments& arguments)
{
    const FirstEngineError error;
    std::vector<xmlNode*> added;
    for (xmlNode* const place : places)
    {
        added.push_back(AddNode(place, arguments));
        error.RequireMemory();
        if (added.back() == nullptr)
        {
            throw std::bad_alloc();
        }
    }
    return added;
}

void RequirePlaces(const std::vector<xmlNode*>& places, const AddArguments& arguments)
{
    Locations locations;
    for (xmlNode* const place : places)
    {
        RequirePlace(place, arguments);
        if (arguments.attribute)
        {
            RequireNoAttribute(place, arguments.name, locations);
        }
    }
}

std::vector<Change> Additions(const std::vector<xmlNode*>& added)
{
    std::vector<Change> changes;
    changes.reserve(added.size());
    Locations locations;
    for (const xmlNode* const node : added)
    {
        changes.push_back({locations.Of(node), std::nullopt, ContentOf(node)});
    }
    return changes;
}

} // namespace

ExitStatus Add(const AddArguments& arguments, Report& report)
{
    RequireArguments(arguments);
    Edit edit(arguments.file, arguments.saving, report);
    EditedDocument document(arguments.file);
    RequireDeclaredEntities(arguments.content, document.Get());
    const std::vector<xmlNode*> places = document.Select(arguments.expression, arguments.all);
    RequirePlaces(places, arguments);
    const std::vector<xmlNode*> added = AddNodes(places, arguments);
    edit.RequireLoadable(document.Get(), arguments.content);
    return edit.Finish(document.Get(), Additions(added));
}
