#include "checks/CheckElements.h"

#include "file/Nodes.h"
#include "output/Quoting.h"
#include "walk/Trail.h"

#include <iterator>
#include <string_view>

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
        else if (isText && !IsBlankText(child))
        {
            text += Text(child->content);
        }
    }
    return text;
}

bool IsRoot(const xmlNode* element)
{
    return element == RootOf(element->doc);
}

void CheckName(const xmlNode* element, Findings& findings)
{
    if (!IsFreeOf(".", Text(element->name)))
    {
        findings.Add(
            element, Kind::UnreachableElement,
            findings.LocationOf(element) +
                " cannot be named by a key: its name contains a \".\", which ends a segment");
    }
}

/** @return whether @p element has text of its own beside elements, as prose has. */
bool IsMixed(const xmlNode* element)
{
    return kx::ElementFrom(element->children) != nullptr;
}

void CheckText(const xmlNode* element, Findings& findings)
{
    const bool isValue = kx::OnlyTextChild(element) != nullptr;
    const Kind kind = IsMixed(element) ? Kind::MixedContent : Kind::InvisibleValue;
    if ((isValue && !IsRoot(element)) || !findings.Want(kind))
    {
        return;
    }
    const std::string text = OwnText(element);
    if (!text.empty())
    {
        findings.Add(element, kind,
                     findings.LocationOf(element) + " has no value although it contains " +
                         QuotedStart(text) + ": " +
                         (isValue ? "it is the root, and a key names elements below it"
                                  : WhyNoValue(element)));
    }
}

using Group = std::vector<const xmlNode*>;             // siblings of one name
using Attributes = std::map<std::string, std::string>; // values by name

/** @return of each element of @p group the attributes that can distinguish it: those that do not
 * have one and the same value in all of them. */
std::vector<Attributes> DistinguishingAttributes(const Group& group, const Levels& levels)
{
    std::vector<Attributes> distinguishing;
    std::map<Attributes::value_type, size_t> bearers;
    for (const xmlNode* const element : group)
    {
        distinguishing.push_back(levels.AttributesOf(element));
        for (const auto& attribute : distinguishing.back())
        {
            ++bearers[attribute];
        }
    }
    for (Attributes& attributes : distinguishing)
    {
        for (auto attribute = attributes.begin(); attribute != attributes.end();)
        {
            const bool distinguishes = bearers[*attribute] != group.size();
            attribute = distinguishes ? std::next(attribute) : attributes.erase(attribute);
        }
    }
    return distinguishing;
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

/** An element whose distinguishing attributes are those of one before it. */
struct Repeat
{
    const xmlNode* element;
    const xmlNode* before;
    const Attributes* attributes;
};

/** The elements of a group that bear the same distinguishing attributes. */
using Alike = std::map<Attributes, Group>;

/** @return whether the attributes seem to identify elements, so that a repeat is a mistake: those
 * that do repeat are no more than the elements that are distinguished. */
bool Identify(const Alike& alike)
{
    std::ptrdiff_t balance = 0;
    for (const auto& [attributes, elements] : alike)
    {
        const bool isUnique = elements.size() == 1;
        balance += isUnique ? 1 : attributes.empty() ? 0 : -1;
    }
    return balance >= 0;
}

/** @param distinguishing  what DistinguishingAttributes() gives for @p group. */
std::vector<Repeat> RepeatsIn(const Group& group, const std::vector<Attributes>& distinguishing)
{
    Alike groups;
    std::vector<Repeat> repeats;
    for (size_t i = 0; i != group.size(); ++i)
    {
        Group& alike = groups[distinguishing[i]];
        alike.push_back(group[i]);
        if (alike.size() > 1 && !distinguishing[i].empty())
        {
            repeats.push_back({group[i], alike.front(), &distinguishing[i]});
        }
    }
    return Identify(groups) ? repeats : std::vector<Repeat>();
}

void CheckGroup(const Group& group, const Levels& levels, Findings& findings)
{
    if (group.size() == 1 || !findings.Want(Kind::RepeatedAttribute))
    {
        return;
    }
    const std::vector<Attributes> distinguishing = DistinguishingAttributes(group, levels);
    const std::vector<Repeat> repeats = RepeatsIn(group, distinguishing);
    if (repeats.empty())
    {
        return;
    }
    const Repeat& first = repeats.front();
    const size_t more = repeats.size() - 1;
    findings.Add(
        first.element, Kind::RepeatedAttribute,
        findings.LocationOf(first.element) + " has the same " + Listed(*first.attributes) + " as " +
            findings.Place(first.before) +
            (more == 0 ? "" : "; " + std::to_string(more) + " more of that name repeat others"));
}

/** Checks elements from the innermost to the outermost. */
class ElementChecker
{
public:
    ElementChecker(const Levels& levels, Findings& findings)
        : m_levels(levels), m_findings(findings)
    {
    }

    /** @return whether @p element or one below it has a value. */
    bool Check(const xmlNode* element)
    {
        CheckText(element, m_findings);
        const bool hasValue = CheckBelow(element) || kx::OnlyTextChild(element) != nullptr;
        if (hasValue)
        {
            CheckName(element, m_findings);
        }
        return hasValue;
    }

private:
    bool CheckBelow(const xmlNode* parent)
    {
        std::map<std::string_view, Group> groups; // of elements with values, by their names
        for (const xmlNode* child = kx::ElementFrom(parent->children); child != nullptr;
             child = kx::ElementFrom(child->next))
        {
            if (Check(child))
            {
                groups[reinterpret_cast<const char*>(child->name)].push_back(child);
            }
        }
        for (const auto& [name, group] : groups)
        {
            CheckGroup(group, m_levels, m_findings);
        }
        return !groups.empty();
    }

    const Levels& m_levels;
    Findings& m_findings;
};

} // namespace

void CheckElements(const xmlNode* root, const Levels& levels, Findings& findings)
{
    ElementChecker(levels, findings).Check(root);
}
