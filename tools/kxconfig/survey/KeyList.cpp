#include "survey/KeyList.h"

#include "file/Nodes.h"

#include <array>
#include <unordered_set>
#include <utility>

namespace
{

/** @return whether @p parent has few elements, and each of them its own name. */
bool HasOnlyOwnNames(const xmlNode* parent)
{
    std::array<const xmlNode*, 8> elements{};
    size_t count = 0;
    for (const xmlNode* node = kx::ElementFrom(parent->children); node != nullptr;
         node = kx::ElementFrom(node->next))
    {
        for (size_t i = 0; i != count; ++i)
        {
            if (xmlStrEqual(elements[i]->name, node->name) != 0)
            {
                return false;
            }
        }
        if (count == elements.size())
        {
            return false;
        }
        elements[count++] = node;
    }
    return true;
}

/** Visits the keys of the elements below one, in document order, each once. */
class KeyLister
{
public:
    KeyLister(const xmlNode* root, Levels& levels, const KeyVisitor& visit)
        : m_levels(levels), m_visit(visit), m_key(Text(root->name))
    {
    }

    /** @param isOnly  whether the key so far leads to @p parent alone. */
    void ListBelow(const xmlNode* parent, bool isOnly)
    {
        if (HasOnlyOwnNames(parent))
        {
            ListLevel(parent, nullptr, isOnly);
        }
        else if (isOnly)
        {
            const Level level = m_levels.Below(Elements{parent});
            ListLevel(parent, &level, true);
        }
        else
        {
            ListLevel(parent, &m_levels.Below(parent), false);
        }
    }

private:
    void ListLevel(const xmlNode* parent, const Level* level, bool isOnly)
    {
        std::vector<std::string> segments;
        if (level != nullptr)
        {
            segments = level->Segments();
        }
        size_t place = 0;
        for (const xmlNode* node = kx::ElementFrom(parent->children); node != nullptr && !m_isEnded;
             node = kx::ElementFrom(node->next), ++place)
        {
            if (IsFreeOf(".@", Text(node->name)))
            {
                std::string segment =
                    level == nullptr ? Text(node->name) : std::move(segments[place]);
                const bool isOnlyHere = level == nullptr || level->SelectsOnly(node, segment);
                m_steps.push_back({parent, level, std::move(segment), true});
                List(node, isOnly && isOnlyHere);
                m_steps.pop_back();
            }
        }
    }

    /** Lists what is at @p element and below it, which the last step leads to. */
    void List(const xmlNode* element, bool isOnly)
    {
        const size_t length = m_key.size();
        m_key += '.';
        m_key += m_steps.back().segment;
        if (kx::OnlyTextChild(element) == nullptr)
        {
            ListBelow(element, isOnly);
        }
        // A key that leads to one element alone is that of no other.
        else if (isOnly || m_listed.insert(m_key).second)
        {
            Visit(isOnly ? element : nullptr);
        }
        m_key.resize(length);
    }

    void Visit(const xmlNode* onlyBearer)
    {
        m_isEnded = !m_visit({m_key, onlyBearer, m_steps});
        if (onlyBearer == nullptr)
        {
            return;
        }
        for (auto step = m_steps.rbegin(); step != m_steps.rend() && step->isNew; ++step)
        {
            step->isNew = false;
        }
    }

    Levels& m_levels;
    const KeyVisitor& m_visit;
    std::string m_key;
    std::vector<KeyStep> m_steps;
    std::unordered_set<std::string> m_listed;
    bool m_isEnded = false; ///< by the visitor
};

} // namespace

void VisitKeys(const xmlNode* root, Levels& levels, const KeyVisitor& visit)
{
    if (IsFreeOf(".", Text(root->name)))
    {
        KeyLister(root, levels, visit).ListBelow(root, true);
    }
}
