#ifndef KX_CONFIG_UPDATEWALK_H
#define KX_CONFIG_UPDATEWALK_H

#include "Condition.h"
#include "KeyPathUpdate.h"
#include "diag/Log.h"
#include "diag/Status.h"

namespace kx
{

/** What the elements on one level of the update are compared with. */
struct UpdateLevel
{
    UpdateLevel() : key(), first(key), later(key), rest(key), isLast(true) {}

    explicit UpdateLevel(TextView whole) : key(whole), first(key), later(key), rest(key)
    {
        const KeySplit split(whole);
        isLast = !split.hasRest;
        if (!isLast)
        {
            rest = split.rest;
            first = Segment(split.first);
            later = Segment(rest);
        }
    }

    TextView key;  ///< the part of the key that this level was entered with
    Segment first; ///< for the first element child
    Segment later; ///< for the siblings after it: all of the rest, cut at its first "@" only
    TextView rest; ///< what the level below is entered with: without a ".", the same key again
    bool isLast;   ///< whether the key has no "."
};

/**
 * The level that the walk is on.
 *
 * The walk goes up and down between neighbouring levels, so the two that it met last are kept split
 * and others are split again when it comes back to them: no memory is needed, however deep the key.
 */
class LevelCursor
{
public:
    explicit LevelCursor(TextView key)
        : m_start(key.data), m_end(key.data + key.size), m_repeats(0), m_current(0)
    {
        m_levels[0] = UpdateLevel(key);
    }

    const UpdateLevel& Level() const { return m_levels[m_current]; }

    void Descend()
    {
        if (Level().isLast)
        {
            ++m_repeats;
            return;
        }
        const TextView key = Level().rest;
        m_current = 1 - m_current;
        if (Level().key.data != key.data)
        {
            m_levels[m_current] = UpdateLevel(key);
        }
    }

    void Ascend()
    {
        if (m_repeats != 0)
        {
            --m_repeats;
            return;
        }
        const char* const key = Level().key.data;
        m_current = 1 - m_current;
        if (Level().rest.data != key)
        {
            m_levels[m_current] = UpdateLevel(KeyAbove(key));
        }
    }

private:
    /** @return the key whose rest begins at @p rest: it reaches back to the "." before the last. */
    TextView KeyAbove(const char* rest) const
    {
        const char* begin = rest - 1;
        while (begin != m_start && begin[-1] != '.')
        {
            --begin;
        }
        return TextView(begin, static_cast<size_t>(m_end - begin));
    }

    const char* m_start;
    const char* m_end;
    size_t m_repeats; ///< levels below the key's last segment that search for it again
    UpdateLevel m_levels[2];
    int m_current;
};

/**
 * The walk of an update, in document order.
 *
 * It finds its way back by the parent pointers of the elements that it entered, and the status to
 * return is always that of the level left last. So it needs no recursion, and a document of any
 * depth costs no stack.
 */
template <class Observer>
class UpdateWalk
{
public:
    UpdateWalk(TextView key, const char* value, unsigned int& updated)
        : m_cursor(key), m_sought(0), m_parent(0), m_depth(0), m_value(value), m_updated(updated)
    {
    }

    int Run(xmlNode* top)
    {
        int status = StatusOk;
        xmlNode* element = EnterLevel(top);
        while (element != 0 || m_depth != 0)
        {
            if (element == 0)
            {
                element = LeaveLevel();
            }
            else if (!Visit(*element))
            {
                SeekAfterRejection();
                element = ElementFrom(element->next);
            }
            else if (m_cursor.Level().rest.IsEmpty())
            {
                Observer::EmptyKey(element);
                status = StatusMissing; // a key that ends in "." names nothing on the level below
                m_sought = &m_cursor.Level().later;
                element = ElementFrom(element->next);
            }
            else
            {
                status = StatusOk;
                m_cursor.Descend();
                ++m_depth;
                element = EnterLevel(element);
            }
        }
        return status;
    }

private:
    UpdateWalk(const UpdateWalk&);
    UpdateWalk& operator=(const UpdateWalk&);

    /** @return the first element on the level below @p parent. */
    xmlNode* EnterLevel(xmlNode* parent)
    {
        KX_VALUE_AS("XMLSetValue", "Key :: %s", m_cursor.Level().key.data);
        Observer::EnterLevel(parent);
        m_sought = &m_cursor.Level().first;
        m_parent = parent;
        return ElementFrom(parent->children);
    }

    /** @return the element after the one whose level is left. */
    xmlNode* LeaveLevel()
    {
        Observer::LeaveLevel();
        const xmlNode* const left = m_parent;
        m_parent = left->parent;
        --m_depth;
        m_cursor.Ascend();
        // Only the first element child is compared with the segment itself, the siblings after it
        // with the rest of the key. Clients rely on what an update reaches by that.
        m_sought = &m_cursor.Level().later;
        return ElementFrom(left->next);
    }

    /** Updates @p element if it is sought. @return false if a condition rejects it. */
    bool Visit(xmlNode& element)
    {
        Observer::Compare(&element, *m_sought);
        if (!m_sought->Names(&element))
        {
            Observer::OtherName();
            return true;
        }
        if (!m_sought->condition.IsEmpty() &&
            !Condition(m_sought->condition).Holds<Observer>(&element))
        {
            Observer::Rejected();
            return false;
        }
        Observer::Selected(false);
        // Also in the middle of a path: an element that holds only text is meant.
        const xmlNode* const text = OnlyTextChild(&element);
        Observer::Value(text);
        if (text != 0)
        {
            xmlNodeSetContent(&element, reinterpret_cast<const xmlChar*>(m_value));
            m_updated = 1;
        }
        return true;
    }

    /**
     * After a rejected element its sibling is compared with the segment again. The last segment of
     * a key is lost instead, and an empty name sought: clients rely on the siblings staying as they
     * are.
     */
    void SeekAfterRejection()
    {
        m_sought = m_cursor.Level().isLast ? &m_nothing : &m_cursor.Level().first;
    }

    LevelCursor m_cursor;
    const Segment m_nothing;
    const Segment* m_sought; ///< what the next element is compared with
    const xmlNode* m_parent; ///< whose children are visited
    size_t m_depth;          ///< levels below the top's children
    const char* m_value;
    unsigned int& m_updated;
};

template <class Observer>
int UpdateValues(xmlNode* top, TextView key, const char* value, unsigned int& updated)
{
    if (top == 0 || key.IsEmpty())
    {
        Observer::EmptyKey(top);
        return StatusMissing;
    }
    UpdateWalk<Observer> walk(key, value, updated);
    return walk.Run(top);
}

} // namespace kx

#endif
