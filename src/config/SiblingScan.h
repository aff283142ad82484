#ifndef KX_CONFIG_SIBLINGSCAN_H
#define KX_CONFIG_SIBLINGSCAN_H

#include "KeyPath.h"
#include "engine/Node.h"

namespace kx
{

/**
 * One level of a lookup: goes along the element children of a node, in document order, and answers
 * which of them a segment selects.
 *
 * An element of another name suspends the condition: the next element of the name is selected
 * regardless of its attributes, and only then is the condition in force again. Clients rely on it.
 */
class SiblingScan
{
public:
    /** @p segment must outlive the scan. */
    SiblingScan(const xmlNode* parent, const Segment& segment)
        : m_name(segment.name),
          m_condition(segment.condition),
          m_next(parent->children),
          m_element(0),
          m_isNamed(true), // so that nothing suspends the condition for the first element
          m_isSuspended(false)
    {
    }

    /** Goes on to the next element, the first one at first. @return false if there is none. */
    bool Next()
    {
        m_isSuspended = !m_isNamed;
        m_element = ElementFrom(m_next);
        if (m_element == 0)
        {
            return false;
        }
        m_next = m_element->next;
        m_isNamed = SameText(m_element->name, m_name);
        return true;
    }

    const xmlNode* Element() const { return m_element; }

    /** @return whether the element bears the segment's name. */
    bool IsNamed() const { return m_isNamed; }

    /**
     * @return whether a named element is selected regardless of the condition, because the element
     *         before it has another name; also true without a condition.
     */
    bool IsSuspended() const { return m_isSuspended; }

    bool IsSelected() const
    {
        return m_isNamed && (m_isSuspended || m_condition.Admits(m_element));
    }

private:
    SiblingScan(const SiblingScan&);
    SiblingScan& operator=(const SiblingScan&);

    const TextView m_name;
    const Condition& m_condition;
    xmlNode* m_next;
    const xmlNode* m_element;
    bool m_isNamed;
    bool m_isSuspended;
};

} // namespace kx

#endif
