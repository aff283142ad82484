#ifndef KX_TOOLS_SELECTEDELEMENTS_H
#define KX_TOOLS_SELECTEDELEMENTS_H

#include "survey/Levels.h"

#include <map>
#include <memory>
#include <set>
#include <string>
#include <vector>

/** A level that a key leads to, and the segment that a lookup compares the level's elements with.
 */
struct Comparison
{
    const KeyElement* parent;
    std::string segment;
};

/**
 * Elements that the first segments of keys select, and what further segments select below them.
 *
 * All keys that select the elements share one object, and with it one index of all their children.
 * So the elements that suspend each other's conditions, which many keys select, are walked once.
 */
class SelectedElements
{
public:
    /** @param levels  must outlive the object, like the document of @p elements. */
    SelectedElements(Levels& levels, const Elements& elements);

    /** @return the elements with a value, which a lookup takes whatever segments follow. */
    const Elements& Bearers() const { return m_bearers; }

    /**
     * Selects below the elements what @p segment selects there.
     *
     * @param selections  gets what is selected, in parts that have no element in common.
     * @param comparisons  gets the levels on which the order of elements can matter to the segment,
     *        if it has a condition, but for those on which it matters as to a segment before.
     */
    void Select(const std::string& segment, std::vector<SelectedElements*>& selections,
                std::vector<Comparison>& comparisons);

private:
    /** Elements below that are selected together, and where they are found again. */
    struct Part
    {
        const std::string& name;
        const Siblings& siblings;
        bool withSuspended;
    };

    const Level& Children();
    void Add(const Part& part, std::vector<SelectedElements*>& selections);
    void Compare(const std::string& name, const std::string& segment,
                 std::vector<Comparison>& comparisons);

    Levels& m_levels;
    Elements m_bearers;
    Elements m_parents;                      ///< the elements without a value
    std::unique_ptr<const Level> m_children; ///< of several parents
    std::map<std::string, std::unique_ptr<SelectedElements>> m_parts; ///< null if empty
    std::map<std::string, Elements> m_uncompared; ///< parents of elements of a name
    std::set<std::string> m_compared;             ///< segments
};

#endif
