#ifndef KX_CONFIG_UPDATELEVELS_H
#define KX_CONFIG_UPDATELEVELS_H

#include "KeyPath.h"

namespace kx
{

/**
 * What the elements on one level of an update are compared with.
 *
 * A key without a "." is its own rest: the levels below are compared with the same segment again.
 * docs/handbook/updates.md has the rules.
 */
struct UpdateLevel
{
    explicit UpdateLevel(TextView itsKey)
        : key(itsKey),
          rest(KeySplit(key).HasRest() ? KeySplit(key).Rest() : key),
          first(KeySplit(key).First()),
          later(rest)
    {
    }

    /** @return whether the key has no ".": then its rest is the same segment again. */
    bool IsLast() const { return rest.data == key.data; }

    TextView key;  ///< what this level was entered with
    TextView rest; ///< what the level below is entered with; the key itself if that has no "."
    Segment first; ///< for the first element child
    Segment later; ///< for the siblings after it: all of the rest, cut at its first "@" only
};

/**
 * The level that an update is on.
 *
 * An update goes up and down between neighboring levels, so the two that it met last are kept split
 * and others are split again when it comes back to them: no memory is needed, however deep the key.
 */
class UpdateLevels
{
public:
    explicit UpdateLevels(TextView key)
        : m_key(key),
          m_levelsBelowLast(0),
          m_current(&m_one),
          m_neighbor(&m_other),
          m_one(key),
          m_other(m_one)
    {
    }

    const UpdateLevel& Current() const { return *m_current; }

    bool IsTop() const { return m_levelsBelowLast == 0 && m_current->key.data == m_key.data; }

    void Descend()
    {
        if (m_current->IsLast())
        {
            ++m_levelsBelowLast;
            return;
        }
        GoTo(m_current->rest);
    }

    void Ascend()
    {
        if (m_levelsBelowLast != 0)
        {
            --m_levelsBelowLast;
            return;
        }
        const bool isAbove = m_neighbor->rest.data == m_current->key.data;
        GoTo(isAbove ? m_neighbor->key : KeyAbove(m_current->key.data));
    }

private:
    UpdateLevels(const UpdateLevels&);
    UpdateLevels& operator=(const UpdateLevels&);

    void GoTo(TextView key)
    {
        if (m_neighbor->key.data != key.data)
        {
            *m_neighbor = UpdateLevel(key);
        }
        UpdateLevel* const left = m_current;
        m_current = m_neighbor;
        m_neighbor = left;
    }

    /** @return the key of the level above, found by stepping back one segment from @p rest. */
    TextView KeyAbove(const char* rest) const
    {
        const char* begin = rest - 1;
        while (begin != m_key.data && begin[-1] != '.')
        {
            --begin;
        }
        return TextView(begin, static_cast<size_t>(m_key.data + m_key.size - begin));
    }

    const TextView m_key;
    size_t m_levelsBelowLast; ///< levels below the last segment that are compared with it again
    UpdateLevel* m_current;
    UpdateLevel* m_neighbor;
    UpdateLevel m_one;
    UpdateLevel m_other;
};

} // namespace kx

#endif
