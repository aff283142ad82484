#include "file/KeyTreeBuilder.h"

#include "file/Nodes.h"

#include <algorithm>
#include <cstring>
#include <new>

namespace
{

/** More attributes than these are searched by an index. */
const size_t kFewAttributes = 8;

using Names = std::vector<std::string>;

void AddDefaulted(const xmlDtd* dtd, std::map<std::string, Names, std::less<>>& defaulted)
{
    const xmlNode* node = dtd == nullptr ? nullptr : dtd->children;
    for (; node != nullptr; node = node->next)
    {
        const auto declaration = reinterpret_cast<const xmlAttribute*>(node);
        // One with a prefix would be the default of every element, for a condition asks for the
        // whole name and finds no attribute that an element bears itself: it distinguishes none.
        if (node->type == XML_ATTRIBUTE_DECL && declaration->defaultValue != nullptr &&
            declaration->prefix == nullptr)
        {
            defaulted[Text(declaration->elem)].push_back(Text(declaration->name));
        }
    }
}

} // namespace

KeyElement* KeyTreeBuilder::Add(const xmlNode* element, KeyElement* parent, KeyElement* before)
{
    KeyElement* const record = new (Allocate<KeyElement>(1)) KeyElement;
    record->name = Keep(element->name);
    record->parent = parent;
    record->place = m_count++;
    if (element->properties != nullptr || !DefaultsOf(element->doc).empty())
    {
        AddAttributes(element, *record);
    }
    if (m_texts == Texts::InDocument)
    {
        record->node = element;
    }
    const KeyElement*& link = parent == nullptr   ? m_tree.m_root
                              : before == nullptr ? parent->children
                                                  : before->next;
    link = record;
    return record;
}

void KeyTreeBuilder::SetValue(KeyElement& record, const xmlNode* element)
{
    if (const xmlNode* const text = kx::OnlyTextChild(element))
    {
        record.value = Keep(text->content);
    }
}

std::string_view KeyTreeBuilder::Copy(std::string_view text)
{
    char* const copy = Allocate<char>(text.size());
    std::memcpy(copy, text.data(), text.size());
    return {copy, text.size()};
}

// Many attributes can have the text of one entity or default, which a small file makes long.
std::string_view KeyTreeBuilder::CopyOnce(std::string_view text)
{
    const auto copy = m_copies.find(text);
    return copy != m_copies.end() ? *copy : *m_copies.insert(Copy(text)).first;
}

std::string_view KeyTreeBuilder::Keep(const xmlChar* text)
{
    const std::string_view view = kx::FromEngine(text);
    return m_texts == Texts::InTree ? Copy(view) : view;
}

void KeyTreeBuilder::AddAttributes(const xmlNode* element, KeyElement& record)
{
    m_attributes.clear();
    m_names.clear();
    Collect(element);
    CollectDefaults(element);
    KeyAttribute* const attributes = Allocate<KeyAttribute>(m_attributes.size());
    std::uninitialized_copy(m_attributes.begin(), m_attributes.end(), attributes);
    record.attributes = attributes;
    record.attributeCount = static_cast<unsigned>(m_attributes.size());
}

void KeyTreeBuilder::Collect(const xmlNode* element)
{
    for (const xmlAttr* attribute = element->properties; attribute != nullptr;
         attribute = attribute->next)
    {
        if (!IsCollected(kx::FromEngine(attribute->name)))
        {
            m_attributes.push_back({Keep(attribute->name), ValueOf(attribute)});
        }
    }
}

void KeyTreeBuilder::CollectDefaults(const xmlNode* element)
{
    const Defaults& defaults = DefaultsOf(element->doc);
    if (defaults.empty())
    {
        return;
    }
    const auto names = defaults.find(std::string_view(kx::FromEngine(element->name)));
    for (const std::string& name : names == defaults.end() ? Names() : names->second)
    {
        if (HasAttribute(element, name) && !IsCollected(name))
        {
            m_attributes.push_back({CopyOnce(name), CopyOnce(AttributeOf(element, name))});
        }
    }
}

/** @return the value of @p attribute; nearly always it is one text. */
std::string_view KeyTreeBuilder::ValueOf(const xmlAttr* attribute)
{
    const xmlNode* const text = kx::OnlyText(attribute->children);
    return text == nullptr ? CopyOnce(ContentOf(reinterpret_cast<const xmlNode*>(attribute)))
                           : Keep(text->content);
}

bool KeyTreeBuilder::IsCollected(std::string_view name)
{
    if (m_attributes.size() < kFewAttributes)
    {
        return std::any_of(m_attributes.begin(), m_attributes.end(),
                           [=](const KeyAttribute& attribute) { return attribute.name == name; });
    }
    for (size_t i = m_names.size(); i != m_attributes.size(); ++i)
    {
        m_names.insert(m_attributes[i].name);
    }
    return m_names.count(name) != 0;
}

const KeyTreeBuilder::Defaults& KeyTreeBuilder::DefaultsOf(const xmlDoc* document)
{
    if (!m_defaults)
    {
        m_defaults.emplace();
        AddDefaulted(document->intSubset, *m_defaults);
        AddDefaulted(document->extSubset, *m_defaults);
    }
    return *m_defaults;
}
