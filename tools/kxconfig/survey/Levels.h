#ifndef KX_TOOLS_LEVELS_H
#define KX_TOOLS_LEVELS_H

#include <libxml/tree.h>

#include <map>
#include <optional>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

// What the segments of keys select, for many keys of one document: a lookup compares a segment with
// every sibling, here the siblings are sorted by the segments that select them.

using Elements = std::vector<const xmlNode*>;

/** An element and its place among the elements of its level. */
struct Sibling
{
    size_t place;
    const xmlNode* element;
    bool suspended; ///< right after an element of another name: no condition rejects it
};

using Siblings = std::vector<Sibling>;

/** The elements on a level whose order matters to a condition; null where there is none. */
struct Order
{
    const xmlNode* other = nullptr;     ///< would suspend the condition if it came first
    const xmlNode* rejected = nullptr;  ///< would then be taken; matters only if none is
    const xmlNode* taken = nullptr;     ///< is taken like that in the present order
    const xmlNode* suspender = nullptr; ///< suspended the condition for it
};

/** The element children of one node, or of several. */
class Level
{
public:
    /** @param defaulted  the attributes that the DTD gives to elements, by the elements' name. */
    Level(const Elements& parents,
          const std::map<std::string, std::vector<std::string>>& defaulted);

    /**
     * @return a segment for each element, in their order: its name and, if others bear it too, the
     * first condition with a single attribute that only this element fulfills; without such a
     * condition its name.
     */
    std::vector<std::string> Segments() const;

    /** @return whether a lookup takes only @p element for its own segment on this level. */
    bool SelectsOnly(const xmlNode* element, const std::string& segment) const;

    const Siblings& Named(const std::string& name) const;

    /** @return those of the name that no condition rejects. */
    const Siblings& Suspended(const std::string& name) const;

    /** @return those of the name that @p segment starts with that fulfill the segment's condition,
     * which Segments() gave for some level. */
    const Siblings& Fulfilling(const std::string& segment) const;

    /** @return the elements of one parent whose order matters to @p segment, which has a condition
     * and which Segments() gave for some level. */
    Order OrderFor(const std::string& segment) const;

private:
    using ByCondition = std::unordered_map<std::string, Siblings>; ///< "@name=value"

    struct Namesakes
    {
        Siblings all;
        Siblings suspended;
        mutable std::optional<ByCondition> fulfilling; ///< sorted when a condition is asked for
    };

    const Namesakes& NamesakesOf(std::string_view name) const;
    const Siblings& Fulfilling(const Namesakes& namesakes, const std::string& condition) const;
    ByCondition SortByCondition(const Siblings& siblings) const;
    void AddConditions(const Siblings& namesakes, std::vector<std::string>& segments) const;
    void AddChildrenOf(const xmlNode* parent);
    void Add(const xmlNode* element, bool suspended, Namesakes& namesakes);
    std::vector<std::string> ConditionsOf(const xmlNode* element) const;
    const xmlNode* FirstNotNamed(const std::string& name) const;
    const xmlNode* SuspenderOf(const Sibling& suspended, const Siblings& namesakes) const;

    const std::map<std::string, std::vector<std::string>>& m_defaulted;
    Elements m_elements;
    const xmlNode* m_otherThanFirst = nullptr; ///< the first with another name than the first has
    std::unordered_map<std::string_view, Namesakes> m_byName;
};

/** The levels of a document, each sorted when it is first asked for. */
class Levels
{
public:
    explicit Levels(const xmlDoc* document);

    const Level& Below(const xmlNode* parent);

    /** @return the children of all @p parents, as one level, which is not kept. */
    Level Below(const Elements& parents) const { return {parents, m_defaulted}; }

    /** @return the attributes that conditions find in @p element, by the names that they find them
     * by: without a prefix, and with the defaults of the DTD. */
    std::map<std::string, std::string> AttributesOf(const xmlNode* element) const;

private:
    std::map<std::string, std::vector<std::string>> m_defaulted;
    std::unordered_map<const xmlNode*, Level> m_levels;
};

/** @return whether none of the bytes in @p separators is in @p text, which they would end in a key.
 */
bool IsFreeOf(const char* separators, const std::string& text);

#endif
