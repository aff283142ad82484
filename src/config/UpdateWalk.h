#ifndef KX_CONFIG_UPDATEWALK_H
#define KX_CONFIG_UPDATEWALK_H

#include "UpdateLevels.h"
#include "diag/Log.h"
#include "diag/Status.h"

namespace kx
{

/**
 * The walk of an update: stands on the elements below a node in turn, in document order, and
 * answers which of them the key addresses.
 *
 * It goes below every element that no condition rejects, including those of another name. It finds
 * its way back by the elements' parents, and the status to return is always that of the level left
 * last: without recursion, a document of any depth costs no stack.
 */
class UpdateWalk
{
public:
    /** @p key is zero-terminated and not empty. */
    UpdateWalk(const xmlNode* top, TextView key)
        : m_top(top),
          m_element(0),
          m_wanted(&m_nothing),
          m_isNamed(false),
          m_isSelected(false),
          m_status(StatusOk),
          m_levels(key)
    {
    }

    /**
     * Goes on to the next element, the first one at first. @return false if there is none.
     *
     * What is below an element is read only when the walk leaves it: its text may be replaced.
     */
    bool Next()
    {
        xmlNode* next = m_element == 0 ? First()
                        : IsRejected() ? SiblingAfterRejection()
                                       : BelowOrSibling();
        while (next == 0 && m_element != 0 && !m_levels.IsTop())
        {
            next = SiblingOfParent();
        }
        if (next == 0)
        {
            return false;
        }
        StandOn(next);
        return true;
    }

    xmlNode* Element() const { return m_element; }

    /** @return what the element is compared with. */
    const Segment& Wanted() const { return *m_wanted; }

    /** @return whether the element bears the wanted name. */
    bool IsNamed() const { return m_isNamed; }

    bool IsSelected() const { return m_isSelected; }

    /** @return whether an update replaces the element's text: also in the middle of a path. */
    bool ReplacesText() const { return m_isSelected && OnlyTextChild(m_element) != 0; }

    /** @return whether a condition keeps the walk from the element and all that is below it. */
    bool IsRejected() const { return m_isNamed && !m_isSelected; }

    /** @return whether the key ends in ".", so that it names nothing below the element. */
    bool EndsHere() const { return m_levels.Current().rest.IsEmpty(); }

    /** @return the status of the last descent; after the last element, that of the update. */
    int GetStatus() const { return m_status; }

private:
    UpdateWalk(const UpdateWalk&);
    UpdateWalk& operator=(const UpdateWalk&);

    static void LogKey(TextView key)
    {
        KX_LOG_OF(LogLevelValue, "XMLSetValue", "Key :: %s", key.data);
    }

    void StandOn(xmlNode* element)
    {
        m_element = element;
        m_isNamed = m_wanted->Names(element);
        m_isSelected = m_isNamed && m_wanted->condition.Admits(element);
    }

    xmlNode* First()
    {
        LogKey(m_levels.Current().key);
        m_wanted = &m_levels.Current().first;
        return ElementFrom(m_top->children);
    }

    /**
     * After a rejected element its sibling is compared with the segment again. The last segment of
     * a key is lost instead, and an empty name wanted: clients rely on the siblings staying as they
     * are.
     */
    xmlNode* SiblingAfterRejection()
    {
        m_wanted = m_levels.Current().IsLast() ? &m_nothing : &m_levels.Current().first;
        return ElementFrom(m_element->next);
    }

    /** @return the first element of the level below, or the next of this one if there is none. */
    xmlNode* BelowOrSibling()
    {
        if (EndsHere())
        {
            m_status = StatusMissing;
            return SiblingByRest();
        }
        m_status = StatusOk;
        LogKey(m_levels.Current().rest);
        xmlNode* const child = ElementFrom(m_element->children);
        if (child == 0)
        {
            return SiblingByRest();
        }
        m_levels.Descend();
        m_wanted = &m_levels.Current().first;
        return child;
    }

    /** Leaves the level. @return the element after the one whose level it was. */
    xmlNode* SiblingOfParent()
    {
        m_element = m_element->parent;
        m_levels.Ascend();
        return SiblingByRest();
    }

    /**
     * Only the first element child is compared with the segment itself, the siblings after it with
     * the rest of the key. Clients rely on what an update reaches by that.
     */
    xmlNode* SiblingByRest()
    {
        m_wanted = &m_levels.Current().later;
        return ElementFrom(m_element->next);
    }

    const xmlNode* m_top;
    xmlNode* m_element; ///< null before the first one
    const Segment* m_wanted;
    bool m_isNamed;
    bool m_isSelected;
    int m_status;
    UpdateLevels m_levels;
    const Segment m_nothing;
};

} // namespace kx

#endif
