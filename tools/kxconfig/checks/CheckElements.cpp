#include "checks/CheckElements.h"

#include "file/Nodes.h"
#include "output/Quoting.h"
#include "survey/ByteSet.h"
#include "survey/KeyAttributes.h"

#include <algorithm>
#include <iterator>
#include <map>
#include <string_view>
#include <vector>

namespace
{

constexpr ByteSet kEndOfSegment(".");

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

void CheckName(const KeyElement* element, Findings& findings)
{
    if (kEndOfSegment.IsIn(element->name))
    {
        findings.Add(
            element->node, Kind::UnreachableElement,
            findings.LocationOf(element->node) +
                " cannot be named by a key: its name contains a \".\", which ends a segment");
    }
}

// Text beside elements is mixed content, as prose has.
void CheckText(const KeyElement* record, Findings& findings)
{
    const bool isRoot = record->parent == nullptr;
    const Kind kind = record->children != nullptr ? Kind::MixedContent : Kind::InvisibleValue;
    if ((record->HasValue() && !isRoot) || !findings.Want(kind))
    {
        return;
    }
    const xmlNode* const element = record->node;
    const std::string text = OwnText(element);
    if (!text.empty())
    {
        findings.Add(element, kind,
                     findings.LocationOf(element) + " has no value although it contains " +
                         QuotedStart(text) + ": " +
                         (record->HasValue() ? "it is the root, and a key names elements below it"
                                             : WhyNoValue(element)));
    }
}

using Group = std::vector<const KeyElement*>; // siblings of one name
using Attributes = std::vector<KeyAttribute>; // by their names

bool IsLess(const KeyAttribute& one, const KeyAttribute& other)
{
    return CompareAttributes(one, other) < 0;
}

Attributes AttributesOf(const KeyElement* element)
{
    Attributes attributes(element->begin(), element->end());
    std::sort(attributes.begin(), attributes.end(), IsLess);
    return attributes;
}

bool Contains(const Attributes& attributes, const KeyAttribute& attribute)
{
    return std::binary_search(attributes.begin(), attributes.end(), attribute, IsLess);
}

template <class Predicate>
void EraseThose(Attributes& attributes, const Predicate& predicate)
{
    attributes.erase(std::remove_if(attributes.begin(), attributes.end(), predicate),
                     attributes.end());
}

/** @return the attributes that all of @p bearers have, with one and the same value. */
Attributes CommonOf(const std::vector<Attributes>& bearers)
{
    Attributes common = bearers.front();
    for (auto bearer = bearers.begin(); bearer != bearers.end() && !common.empty(); ++bearer)
    {
        EraseThose(common,
                   [&](const KeyAttribute& attribute) { return !Contains(*bearer, attribute); });
    }
    return common;
}

/** @return of each element of @p group the attributes that can distinguish it: those that do not
 * have one and the same value in all of them. */
std::vector<Attributes> DistinguishingAttributes(const Group& group)
{
    std::vector<Attributes> distinguishing;
    distinguishing.reserve(group.size());
    std::transform(group.begin(), group.end(), std::back_inserter(distinguishing), AttributesOf);
    const Attributes common = CommonOf(distinguishing);
    for (Attributes& attributes : distinguishing)
    {
        EraseThose(attributes,
                   [&](const KeyAttribute& attribute) { return Contains(common, attribute); });
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
        list += (list.empty() ? "" : " ") + Text(name) + "=" + QuotedStart(Text(value));
    }
    return list;
}

/** An element of a group, and what distinguishes it. */
struct Member
{
    size_t hash; ///< of the attributes
    const Attributes* attributes;
    const KeyElement* element;
};

bool HasLess(const Member& one, const Member& other)
{
    return one.hash != other.hash
               ? one.hash < other.hash
               : std::lexicographical_compare(one.attributes->begin(), one.attributes->end(),
                                              other.attributes->begin(), other.attributes->end(),
                                              IsLess);
}

/** @return the elements of @p group, those that are alike in document order behind each other. */
std::vector<Member> SortedMembers(const Group& group, const std::vector<Attributes>& distinguishing)
{
    std::vector<Member> members;
    members.reserve(group.size());
    for (size_t i = 0; i != group.size(); ++i)
    {
        size_t hash = 0;
        for (const KeyAttribute& attribute : distinguishing[i])
        {
            hash = hash * 31 + HashOf(attribute);
        }
        members.push_back({hash, &distinguishing[i], group[i]});
    }
    std::sort(members.begin(), members.end(),
              [](const Member& left, const Member& right)
              {
                  return HasLess(left, right) ||
                         (!HasLess(right, left) && left.element->place < right.element->place);
              });
    return members;
}

/** The elements whose distinguishing attributes are those of one before them. */
struct Repeats
{
    const Member* first = nullptr; ///< in document order
    const Member* before = nullptr;
    size_t count = 0;
};

/**
 * @return the repeats, if the attributes seem to identify elements, so that a repeat is a mistake:
 * those that do repeat are no more than the elements that are distinguished.
 */
Repeats RepeatsAmong(const std::vector<Member>& members)
{
    Repeats repeats;
    std::ptrdiff_t balance = 0;
    for (auto at = members.begin(), next = at; at != members.end(); at = next)
    {
        next = std::find_if(at, members.end(),
                            [at](const Member& other) { return HasLess(*at, other); });
        const bool isUnique = next - at == 1;
        balance += isUnique ? 1 : at->attributes->empty() ? 0 : -1;
        if (!isUnique && !at->attributes->empty())
        {
            repeats.count += static_cast<size_t>(next - at) - 1;
            if (repeats.first == nullptr || at[1].element->place < repeats.first->element->place)
            {
                repeats.first = &at[1];
                repeats.before = &at[0];
            }
        }
    }
    return balance >= 0 ? repeats : Repeats();
}

void CheckGroup(const Group& group, Findings& findings)
{
    if (group.size() == 1 || !findings.Want(Kind::RepeatedAttribute))
    {
        return;
    }
    const std::vector<Attributes> distinguishing = DistinguishingAttributes(group);
    const std::vector<Member> members = SortedMembers(group, distinguishing);
    const Repeats repeats = RepeatsAmong(members);
    if (repeats.count == 0)
    {
        return;
    }
    const xmlNode* const first = repeats.first->element->node;
    const size_t more = repeats.count - 1;
    findings.Add(
        first, Kind::RepeatedAttribute,
        findings.LocationOf(first) + " has the same " + Listed(*repeats.first->attributes) +
            " as " + findings.Place(repeats.before->element->node) +
            (more == 0 ? "" : "; " + std::to_string(more) + " more of that name repeat others"));
}

/** Checks elements from the innermost to the outermost. */
class ElementChecker
{
public:
    explicit ElementChecker(Findings& findings) : m_findings(findings) {}

    /** @return whether @p element or one below it has a value. */
    bool Check(const KeyElement* element)
    {
        CheckText(element, m_findings);
        const bool hasValue = CheckBelow(element) || element->HasValue();
        if (hasValue)
        {
            CheckName(element, m_findings);
        }
        return hasValue;
    }

private:
    bool CheckBelow(const KeyElement* parent)
    {
        std::map<std::string_view, Group> groups; // of elements with values, by their names
        Group* last = nullptr;
        for (const KeyElement* child = parent->children; child != nullptr; child = child->next)
        {
            if (Check(child))
            {
                const bool isSameName = last != nullptr && last->back()->name == child->name;
                last = isSameName ? last : &groups[child->name];
                last->push_back(child);
            }
        }
        for (const auto& [name, group] : groups)
        {
            CheckGroup(group, m_findings);
        }
        return !groups.empty();
    }

    Findings& m_findings;
};

} // namespace

void CheckElements(const KeyElement* root, Findings& findings)
{
    ElementChecker(findings).Check(root);
}
