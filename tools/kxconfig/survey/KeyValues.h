#ifndef KX_TOOLS_KEYVALUES_H
#define KX_TOOLS_KEYVALUES_H

#include "survey/Levels.h"

#include <string>
#include <vector>

using Elements = std::vector<const xmlNode*>;

/** @return the value of @p element, which has one. */
const char* ValueOf(const xmlNode* element);

/** @return the values of @p elements as a lookup joins them. */
std::string JoinedValues(const Elements& elements);

/** A level that a key leads to, and the segment that a lookup compares the level's elements with.
 */
struct Comparison
{
    const xmlNode* parent;
    std::string segment;
};

/**
 * What is under many keys of one document: the values as GetValue() gives them.
 *
 * A lookup compares with every sibling on its way. This reaches the same elements by segments
 * (Levels), and what a key shares with the one before it is not walked again.
 */
class KeyValues
{
public:
    /** @param levels  must outlive the object, like the document. */
    KeyValues(const xmlNode* root, Levels& levels);

    /**
     * @param key  one that ListKeys() listed.
     * @return the elements that give the values under @p key, in document order.
     */
    Elements BearersUnder(const std::string& key);

    /** @return the levels that the last key led to and the one before it did not, in the order in
     * which a lookup comes to them. */
    const std::vector<Comparison>& NewComparisons() const { return m_comparisons; }

private:
    /** A segment of the last key, and what the key selects up to it. */
    struct Step
    {
        std::string segment;
        Elements reached;
    };

    void ReachFrom(const xmlNode* element, size_t depth);

    Levels& m_levels;
    std::vector<Step> m_path; ///< starts with the root
    std::vector<Comparison> m_comparisons;
};

#endif
