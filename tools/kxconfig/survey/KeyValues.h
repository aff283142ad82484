#ifndef KX_TOOLS_KEYVALUES_H
#define KX_TOOLS_KEYVALUES_H

#include "survey/KeyList.h"
#include "survey/SelectedElements.h"

#include <limits>
#include <string>
#include <vector>

/** @return the values of @p elements as a lookup joins them. */
std::string JoinedValues(const Elements& elements);

/** The elements that give the values under a key. */
struct Bearers
{
    size_t count;
    Elements first; ///< in document order, as many as were asked for
};

/**
 * What is under many keys of one document: the values as GetValue() gives them.
 *
 * A lookup compares with every sibling on its way. This reaches the same elements by segments
 * (SelectedElements), and what a key shares with the one before it is not walked again.
 */
class KeyValues
{
public:
    /** @param levels  must outlive the object, like the document. */
    KeyValues(const KeyElement* root, Levels& levels);

    /**
     * @param key  one that VisitKeys() visits.
     * @param most  the number of elements that are wanted.
     */
    Bearers BearersUnder(const std::string& key, size_t most = std::numeric_limits<size_t>::max());

    /** @return the same of a key that is visited. */
    Bearers BearersUnder(const ListedKey& listed, size_t most = std::numeric_limits<size_t>::max())
    {
        return listed.onlyBearer != nullptr ? Bearers{1, {listed.onlyBearer}}
                                            : BearersUnder(listed.key, most);
    }

    /** @return the levels that the last key led to and no key before it did with the same outcome,
     * of the segments with a condition, in the order in which a lookup comes to them. */
    const std::vector<Comparison>& NewComparisons();

private:
    /** A segment of the last key, and what the key selects with it: parts without an element in
     * common. */
    struct Step
    {
        std::string segment;
        std::vector<SelectedElements*> selected;
    };

    void Follow(const std::vector<std::string>& segments);

    SelectedElements m_start;
    std::vector<Step> m_path; ///< starts with the root
    std::vector<Comparison> m_comparisons;
};

#endif
