#include "KeyValues.h"

#include "Nodes.h"

namespace
{

std::vector<std::string> Segments(const std::string& key)
{
    std::vector<std::string> segments;
    for (size_t begin = 0; begin <= key.size();)
    {
        const size_t end = std::min(key.find('.', begin), key.size());
        segments.push_back(key.substr(begin, end - begin));
        begin = end + 1;
    }
    return segments;
}

/** @return the texts of @p elements as the lookup joins them. */
std::string Joined(const std::vector<const xmlNode*>& elements)
{
    std::string joined;
    for (const xmlNode* const element : elements)
    {
        const xmlNode* const text = OnlyTextOf(element);
        if (text != nullptr)
        {
            joined += (joined.empty() ? "" : "\n") + Text(text->content);
        }
    }
    return joined;
}

} // namespace

KeyValues::KeyValues(const xmlNode* root, Levels& levels) : m_levels(levels)
{
    m_path.push_back({Text(root->name), {root}});
}

std::string KeyValues::Under(const std::string& key)
{
    const std::vector<std::string> segments = Segments(key);
    size_t shared = 1; // the root
    while (shared < std::min(m_path.size(), segments.size()) &&
           m_path[shared].segment == segments[shared])
    {
        ++shared;
    }
    m_path.resize(shared);
    for (size_t i = shared; i != segments.size(); ++i)
    {
        m_path.push_back({segments[i], ReachedFrom(m_path.back().reached, segments[i])});
    }
    return Joined(m_path.back().reached);
}

/** @return what is reached one level further down. */
std::vector<const xmlNode*> KeyValues::ReachedFrom(const std::vector<const xmlNode*>& above,
                                                   const std::string& segment)
{
    std::vector<const xmlNode*> reached;
    for (const xmlNode* const parent : above)
    {
        // A lookup takes the text of every element on its way, and there is no way on below one.
        if (OnlyTextOf(parent) != nullptr)
        {
            reached.push_back(parent);
            continue;
        }
        for (const Sibling& sibling : m_levels.Below(parent).SelectedBy(segment))
        {
            reached.push_back(sibling.element);
        }
    }
    return reached;
}
