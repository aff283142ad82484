#include "checks/CheckElements.h"

#include "file/Nodes.h"
#include "output/Quoting.h"

#include <iterator>

namespace
{

/** @return the text directly in @p element that is more than white space. */
std::string OwnText(const xmlNode* element)
{
    std::string text;
    for (const xmlNode* child = element->children; child != nullptr; child = child->next)
    {
        const bool isText = child->type == XML_TEXT_NODE || child->type == XML_CDATA_SECTION_NODE;
        if (child->type == XML_ENTITY_REF_NODE)
        {
            // A small file can refer to more than the memory holds, or to what is not there.
            text += "&" + Text(child->name) + ";";
        }
        else if (isText && xmlIsBlankNode(child) != 1)
        {
            text += Text(child->content);
        }
    }
    return text;
}

bool IsRoot(const xmlNode* element)
{
    return element == xmlDocGetRootElement(element->doc);
}

void CheckName(const xmlNode* element, Warnings& warnings)
{
    if (!IsFreeOf(".", Text(element->name)))
    {
        warnings.Warn(
            element, "unreachable element",
            warnings.LocationOf(element) +
                " cannot be named by a key: its name contains a \".\", which ends a segment");
    }
}

void CheckText(const xmlNode* element, Warnings& warnings)
{
    const bool isValue = kx::OnlyTextChild(element) != nullptr;
    const std::string text = isValue && !IsRoot(element) ? "" : OwnText(element);
    if (!text.empty())
    {
        warnings.Warn(element, "invisible value",
                      warnings.LocationOf(element) + " has no value although it contains " +
                          QuotedStart(text) + ": " +
                          (isValue ? "it is the root, and a key names elements below it"
                                   : WhyNoValue(element)));
    }
}

using Group = std::vector<const xmlNode*>;             // siblings of one name
using Attributes = std::map<std::string, std::string>; // values by name

/** @return of each element of @p group the attributes that can tell it apart: those that do not
 * have one and the same value in all of them. */
std::vector<Attributes> TellingAttributes(const Group& group, const Levels& levels)
{
    std::vector<Attributes> telling;
    std::map<Attributes::value_type, size_t> bearers;
    for (const xmlNode* const element : group)
    {
        telling.push_back(levels.AttributesOf(element));
        for (const auto& attribute : telling.back())
        {
            ++bearers[attribute];
        }
    }
    for (Attributes& attributes : telling)
    {
        for (auto attribute = attributes.begin(); attribute != attributes.end();)
        {
            const bool tells = bearers[*attribute] != group.size();
            attribute = tells ? std::next(attribute) : attributes.erase(attribute);
        }
    }
    return telling;
}

/** @return the first of @p attributes as they stand in a tag. */
std::string Listed(const Attributes& attributes)
{
    const int kListed = 3;
    std::string list;
    int count = 0;
    for (const auto& [name, value] : attributes)
    {
        if (++count > kListed)
        {
            return list + " ...";
        }
        list += (list.empty() ? "" : " ") + name + "=" + QuotedStart(value);
    }
    return list;
}

/** An element that none of its telling attributes tells from one before it. */
struct Repeat
{
    const xmlNode* element;
    const xmlNode* before;
    const Attributes* attributes;
};

/** @param telling  what TellingAttributes() gives for @p group. */
std::vector<Repeat> RepeatsIn(const Group& group, const std::vector<Attributes>& telling)
{
    std::vector<Repeat> repeats;
    std::map<Attributes, const xmlNode*> bearers;
    for (size_t i = 0; i != group.size(); ++i)
    {
        const auto bearer = bearers.emplace(telling[i], group[i]);
        if (!bearer.second && !telling[i].empty())
        {
            repeats.push_back({group[i], bearer.first->second, &telling[i]});
        }
    }
    return repeats;
}

void CheckGroup(const Group& group, const Levels& levels, Warnings& warnings)
{
    const std::vector<Attributes> telling = TellingAttributes(group, levels);
    const std::vector<Repeat> repeats = RepeatsIn(group, telling);
    if (repeats.empty())
    {
        return;
    }
    const Repeat& first = repeats.front();
    const size_t more = repeats.size() - 1;
    warnings.Warn(
        first.element, "repeated attribute",
        warnings.LocationOf(first.element) + " has the same " + Listed(*first.attributes) + " as " +
            warnings.Place(first.before) +
            (more == 0 ? "" : "; " + std::to_string(more) + " more of that name repeat others"));
}

/** @return the children of @p parent that are elements, by their names. */
std::map<std::string, Group> GroupsBelow(const xmlNode* parent)
{
    std::map<std::string, Group> groups;
    for (const xmlNode* child = kx::ElementFrom(parent->children); child != nullptr;
         child = kx::ElementFrom(child->next))
    {
        groups[Text(child->name)].push_back(child);
    }
    return groups;
}

} // namespace

void CheckElements(const xmlNode* element, const Levels& levels, Warnings& warnings)
{
    CheckName(element, warnings);
    CheckText(element, warnings);
    for (const auto& [name, group] : GroupsBelow(element))
    {
        CheckGroup(group, levels, warnings);
    }
    for (const xmlNode* child = kx::ElementFrom(element->children); child != nullptr;
         child = kx::ElementFrom(child->next))
    {
        CheckElements(child, levels, warnings);
    }
}
