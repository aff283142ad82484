#include "survey/KeyList.h"

#include "survey/ByteSet.h"

#include <algorithm>
#include <array>
#include <unordered_set>

namespace
{

/** End a name in a key. */
constexpr ByteSet kSeparators(".@");

/** @return whether @p parent has few elements, and each of them its own name. */
bool HasOnlyOwnNames(const KeyElement* parent)
{
    std::array<std::string_view, 8> names{};
    size_t count = 0;
    for (const KeyElement* element = parent->children; element != nullptr; element = element->next)
    {
        const auto end = names.begin() + count;
        if (count == names.size() || std::find(names.begin(), end, element->name) != end)
        {
            return false;
        }
        names[count++] = element->name;
    }
    return true;
}

/** Visits the keys of the elements below one, in document order, each once. */
class KeyLister
{
public:
    KeyLister(const KeyElement* root, Levels& levels, const KeyVisitor& visit)
        : m_levels(levels), m_visit(visit), m_key(root->name)
    {
    }

    /** @param isOnly  whether the key so far leads to @p parent alone. */
    void ListBelow(const KeyElement* parent, bool isOnly)
    {
        if (HasOnlyOwnNames(parent))
        {
            ListLevel(parent, nullptr, isOnly);
        }
        else if (isOnly)
        {
            const Level level(Elements{parent});
            ListLevel(parent, &level, true);
        }
        else
        {
            ListLevel(parent, &m_levels.Below(parent), false);
        }
    }

private:
    void ListLevel(const KeyElement* parent, const Level* level, bool isOnly)
    {
        std::vector<KeySegment> segments;
        if (level != nullptr)
        {
            segments = level->Segments();
        }
        size_t place = 0;
        for (const KeyElement* element = parent->children; element != nullptr && !m_isEnded;
             element = element->next, ++place)
        {
            if (!kSeparators.IsIn(element->name))
            {
                const KeySegment segment =
                    level == nullptr ? KeySegment{element->name, nullptr} : segments[place];
                const bool isOnlyHere = level == nullptr || level->SelectsOnly(element, segment);
                m_steps.push_back({parent, level, segment, true});
                List(element, isOnly && isOnlyHere);
                m_steps.pop_back();
            }
        }
    }

    /** Lists what is at @p element and below it, which the last step leads to. */
    void List(const KeyElement* element, bool isOnly)
    {
        const size_t length = m_key.size();
        m_key += '.';
        m_steps.back().segment.AppendTo(m_key);
        if (!element->HasValue())
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

    void Visit(const KeyElement* onlyBearer)
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

void VisitKeys(const KeyElement* root, Levels& levels, const KeyVisitor& visit)
{
    if (!ByteSet(".").IsIn(root->name))
    {
        KeyLister(root, levels, visit).ListBelow(root, true);
    }
}
