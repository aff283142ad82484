#include "model/Model.h"

namespace kxmodel
{

namespace
{

constexpr auto kNone = std::string::npos;

std::string Text(const xmlChar* text)
{
    return text == nullptr ? std::string() : std::string(reinterpret_cast<const char*>(text));
}

/** What a log call makes of a string: it ends at the first NUL. */
std::string Logged(const std::string& text)
{
    return text.c_str();
}

bool HasValue(xmlNodePtr element)
{
    const xmlNodePtr first = element->children;
    return first != nullptr && first->type == XML_TEXT_NODE && first->next == nullptr;
}

bool AttributeEquals(xmlNodePtr element, const std::string& name, const std::string& value)
{
    // The engine takes names up to a NUL, and no attribute's name holds one.
    if (name.find('\0') != kNone)
    {
        return false;
    }
    xmlChar* const property = xmlGetProp(element, reinterpret_cast<const xmlChar*>(name.c_str()));
    if (property == nullptr)
    {
        return false;
    }
    const std::string text = Text(property);
    xmlFree(property);
    return text == value;
}

bool Accepts(std::string condition, xmlNodePtr element)
{
    bool accumulated = true;
    bool previousWasOr = false;
    std::string remaining = condition;
    while (!remaining.empty())
    {
        std::string term;
        std::string::size_type separator = remaining.find('|');
        if (separator == kNone)
        {
            separator = remaining.find('&');
        }
        if (separator != kNone)
        {
            term = remaining.substr(0, separator);
        }
        else
        {
            term = remaining;
            separator = remaining.size() - 1;
        }

        std::string name;
        std::string value;
        const std::string::size_type equals = term.find('=');
        if (equals != kNone)
        {
            name = term.substr(0, equals);
            value = term.substr(equals + 1);
        }
        const bool equal = AttributeEquals(element, name, value);

        if (previousWasOr)
        {
            accumulated = accumulated || equal;
        }
        else
        {
            accumulated = accumulated && equal;
        }
        previousWasOr = remaining[separator] == '|';
        if (!previousWasOr && !accumulated)
        {
            return false;
        }
        remaining = remaining.substr(separator + 1);
    }
    return accumulated;
}

} // namespace

void Model::Log(int level, const std::string& tag, const std::string& text)
{
    m_records.push_back({level, tag, text});
}

kxtest::Records Model::TakeRecords()
{
    kxtest::Records taken;
    taken.swap(m_records);
    return taken;
}

// --- Lookup

std::string Model::GetValue(std::string key)
{
    Log(11, "GetValue", "Key " + Logged(key));
    std::string result;
    if (m_document == nullptr || key.empty())
    {
        Log(9, "GetValue", "Document structure pointer m_pXmlDoc is NULL");
        return result;
    }
    const xmlNodePtr root = xmlDocGetRootElement(m_document);
    const std::string::size_type dot = key.find('.');
    if (root != nullptr && dot != kNone && key.substr(0, dot) == Text(root->name))
    {
        result = XMLGetValue(root, key.substr(dot + 1));
    }
    Log(29, "GetValue", "Parsed Value :: " + Logged(result));
    return result;
}

int Model::GetValue(std::string key, std::string& value)
{
    Log(11, "GetValue", "+");
    if (m_document == nullptr || key.empty())
    {
        Log(9, "GetValue", "Document structure pointer m_pXmlDoc is NULL");
        Log(11, "GetValue", "-");
        return 22;
    }
    Log(29, "GetValue", "Key is " + Logged(key));
    int status = 0;
    const xmlNodePtr root = xmlDocGetRootElement(m_document);
    const std::string::size_type dot = key.find('.');
    if (root == nullptr)
    {
        Log(9, "GetValue", "Root Node ptr is NULL");
        status = 22;
    }
    else if (dot == kNone)
    {
        status = 7;
    }
    else if (key.substr(0, dot) != Text(root->name))
    {
        status = 0;
    }
    else
    {
        unsigned found = 0;
        XMLGetValue(root, key.substr(dot + 1), value, found);
        status = found != 0 ? 0 : -2;
    }
    Log(29, "GetValue", "Parsed Value :: " + Logged(value));
    Log(11, "GetValue", "-");
    return status;
}

std::string Model::XMLGetValue(xmlNodePtr node, std::string key)
{
    std::string result;
    if (node == nullptr || key.empty())
    {
        return result;
    }
    std::string head = key.substr(0, key.find('.'));
    const std::string savedHead = head;
    for (xmlNodePtr child = node->children; child != nullptr; child = child->next)
    {
        if (child->type != XML_ELEMENT_NODE)
        {
            continue;
        }
        std::string condition;
        const std::string::size_type at = head.find('@');
        if (at != kNone)
        {
            condition = head.substr(at + 1);
            head = head.substr(0, at);
        }
        if (Text(child->name) != head)
        {
            continue; // the head stays cut
        }
        if (condition.empty() || Accepts(condition, child))
        {
            if (HasValue(child))
            {
                result = result + Text(child->children->content);
            }
            if (key.find('.') != kNone)
            {
                const std::string below = XMLGetValue(child, key.substr(key.find('.') + 1));
                if (!result.empty() && !below.empty())
                {
                    result = result + "\n";
                }
                result = result + below;
            }
        }
        head = savedHead;
    }
    return result;
}

int Model::XMLGetValue(xmlNodePtr node, std::string key, std::string& value, unsigned& found)
{
    Log(11, "XMLGetValue", "+");
    if (node == nullptr || key.empty())
    {
        Log(11, "XMLGetValue", "-");
        return 22;
    }
    Log(29, "XMLGetValue", "Key :: " + Logged(key));
    int status = -2;
    std::string head = key.substr(0, key.find('.'));
    const std::string savedHead = head;
    for (xmlNodePtr child = node->children; child != nullptr; child = child->next)
    {
        if (child->type != XML_ELEMENT_NODE)
        {
            continue;
        }
        std::string condition;
        const std::string::size_type at = head.find('@');
        if (at != kNone)
        {
            condition = head.substr(at + 1);
            head = head.substr(0, at);
        }
        if (Text(child->name) != head)
        {
            continue; // the head stays cut
        }
        if (condition.empty() || Accepts(condition, child))
        {
            if (HasValue(child))
            {
                if (!value.empty())
                {
                    value = value + "\n";
                }
                value = value + Text(child->children->content);
                found = 1;
            }
            if (key.find('.') != kNone)
            {
                status = XMLGetValue(child, key.substr(key.find('.') + 1), value, found);
            }
        }
        head = savedHead;
    }
    Log(11, "XMLGetValue", "-");
    return status;
}

// --- Update

int Model::SetValue(std::string key, std::string value)
{
    Log(11, "SetValue", "Key " + Logged(key));
    if (m_document == nullptr || key.empty())
    {
        Log(9, "SetValue", "Document structure pointer m_pXmlDoc is NULL");
        return 7;
    }
    const xmlNodePtr root = xmlDocGetRootElement(m_document);
    if (root == nullptr)
    {
        return 22;
    }
    const std::string::size_type dot = key.find('.');
    if (dot == kNone)
    {
        return 7;
    }
    const std::string first = key.substr(0, dot);
    const std::string rest = key.substr(dot + 1);
    if (first != Text(root->name))
    {
        return 0;
    }
    unsigned updated = 0;
    const int status = XMLSetValue(root, rest, value, updated);
    return updated == 0 ? -2 : status;
}

int Model::XMLSetValue(xmlNodePtr node, std::string key, std::string value, unsigned& updated)
{
    if (key.empty() || node == nullptr)
    {
        return 22;
    }
    Log(29, "XMLSetValue", "Key :: " + Logged(key));
    std::string current = key;
    std::string saved;
    const std::string::size_type dot = current.find('.');
    if (dot != kNone)
    {
        current = current.substr(0, dot);
        saved = current;
    }
    int result = 0;
    for (xmlNodePtr child = node->children; child != nullptr; child = child->next)
    {
        if (child->type != XML_ELEMENT_NODE)
        {
            continue;
        }
        std::string condition;
        const std::string::size_type at = current.find('@');
        if (at != kNone)
        {
            condition = current.substr(at + 1);
            current = current.substr(0, at);
        }
        if (current == Text(child->name))
        {
            if (!condition.empty() && !Accepts(condition, child))
            {
                current = saved;
                continue;
            }
            if (HasValue(child))
            {
                // Before 2.9 the engine makes an empty child out of an empty text.
                const auto text = reinterpret_cast<const xmlChar*>(value.c_str());
                xmlNodeSetContent(child, value.empty() ? nullptr : text);
                updated = 1;
            }
        }
        current = dot != kNone ? key.substr(dot + 1) : key;
        result = XMLSetValue(child, current, value, updated);
    }
    return result;
}

} // namespace kxmodel
