#include "commands/CreateElements.h"

#include "file/Engine.h"
#include "file/Insertion.h"
#include "file/Nodes.h"
#include "file/StoredText.h"
#include "output/Failure.h"
#include "output/Quoting.h"

#include "CXmlNode.h"
#include "config/KeyPath.h"

#include <new>
#include <vector>

namespace
{

/** @return the names in @p key after the root's. */
std::vector<std::string> NamesBelowRoot(const std::string& key)
{
    std::vector<std::string> names;
    kx::KeySplit split((kx::TextView(key)));
    while (split.HasRest())
    {
        split = kx::KeySplit(split.Rest());
        names.push_back(Text(split.First()));
    }
    return names;
}

void RequireNames(const std::vector<std::string>& names, const std::string& key)
{
    if (key.find('@') != std::string::npos)
    {
        throw Failure(ExitStatus::NothingFound,
                      "nothing found: no element has a value under " + Quoted(key) +
                          ", and --create makes none for a key with a condition");
    }
    for (const std::string& name : names)
    {
        if (xmlValidateNCName(kx::ToEngine(name), 0) != 0)
        {
            throw Failure(ExitStatus::BadUsage, "malformed key " + Quoted(key) + ": " +
                                                    Quoted(name) +
                                                    " is not the name of an element");
        }
    }
}

/** @return the child of @p parent with the name; null if there is none. */
xmlNode* OnlyChild(const xmlNode* parent, const std::string& name, const std::string& key)
{
    xmlNode* found = nullptr;
    for (xmlNode* child = kx::ElementFrom(parent->children); child != nullptr;
         child = kx::ElementFrom(child->next))
    {
        const bool isNamesake = kx::SameText(child->name, kx::TextView(name));
        if (isNamesake && found != nullptr)
        {
            throw Failure(ExitStatus::NotSaved, "not saved: " + Quoted(key) +
                                                    " leads to several elements named " +
                                                    Quoted(name) + ", and has a value in none");
        }
        found = isNamesake ? child : found;
    }
    return found;
}

xmlNode* Create(xmlNode* parent, const std::string& name, const std::string& value,
                ElementChanges& changes)
{
    xmlNode* const created = AddElement(parent, nullptr, name, value);
    if (created == nullptr)
    {
        throw std::bad_alloc();
    }
    changes.NoteCreated(created);
    return created;
}

void Fill(xmlNode* element, const std::string& value, const std::string& key,
          ElementChanges& changes)
{
    if (element->children != nullptr)
    {
        throw Failure(ExitStatus::NothingFound,
                      "nothing found: the element under " + Quoted(key) +
                          " has no text that can be replaced: " + WhyNoValue(element));
    }
    changes.NoteChanged(element, "");
    CXmlNode(element).SetContent(value);
    RequireStored(element, value);
}

} // namespace

void CreateElements(xmlDoc* document, const std::string& key, const std::string& value,
                    ElementChanges& changes)
{
    const std::vector<std::string> names = NamesBelowRoot(key);
    RequireNames(names, key);
    const FirstEngineError error;
    xmlNode* element = xmlDocGetRootElement(document);
    bool isNew = false;
    for (size_t i = 0; i != names.size(); ++i)
    {
        const std::string content = i + 1 == names.size() ? value : "";
        xmlNode* const child = OnlyChild(element, names[i], key);
        isNew = child == nullptr;
        element = isNew ? Create(element, names[i], content, changes) : child;
    }
    if (!isNew)
    {
        Fill(element, value, key, changes);
    }
    error.RequireMemory();
}
