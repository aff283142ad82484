#ifndef KX_TOOLS_LEVELS_H
#define KX_TOOLS_LEVELS_H

#include "file/KeyTree.h"

#include <optional>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

// What the segments of keys select, for many keys of one document: a lookup compares a segment with
// every sibling, here the siblings are sorted by the segments that select them.

using Elements = std::vector<const KeyElement*>;

/** An element and its place among the elements of its level. */
struct Sibling
{
    size_t place;
    const KeyElement* element;
    bool suspended; ///< right after an element of another name: no condition rejects it
};

using Siblings = std::vector<Sibling>;

/** A part of a key: the name of an element, and a condition of one attribute or none. */
struct KeySegment
{
    std::string Text() const
    {
        std::string text;
        AppendTo(text);
        return text;
    }

    void AppendTo(std::string& text) const;

    std::string_view name;
    const KeyAttribute* condition; ///< null if there is none
};

/** The elements on a level whose order matters to a condition; null where there is none. */
template <class Element>
struct OrderAmong
{
    const Element* other = nullptr;     ///< would suspend the condition if it came first
    const Element* rejected = nullptr;  ///< would then be taken; matters only if none is
    const Element* taken = nullptr;     ///< is taken like that in the present order
    const Element* suspender = nullptr; ///< suspended the condition for it
};

using Order = OrderAmong<KeyElement>;

/** The element children of one node, or of several. */
class Level
{
public:
    explicit Level(const Elements& parents);

    /**
     * @return a segment for each element, in their order: its name and, if others bear it too, the
     * first condition with a single attribute that only this element fulfills; without such a
     * condition its name.
     */
    std::vector<KeySegment> Segments() const;

    /** @return whether a lookup takes only @p element for its own segment on this level. */
    bool SelectsOnly(const KeyElement* element, const KeySegment& segment) const;

    const Siblings& Named(std::string_view name) const;

    /** @return those of the name that no condition rejects. */
    const Siblings& Suspended(std::string_view name) const;

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
    void AddChildrenOf(const KeyElement* parent);
    void Add(const KeyElement* element, bool suspended, Namesakes& namesakes);
    const KeyElement* FirstNotNamed(std::string_view name) const;
    const KeyElement* SuspenderOf(const Sibling& suspended, const Siblings& namesakes) const;

    Elements m_elements;
    const KeyElement* m_otherThanFirst =
        nullptr; ///< the first with another name than the first has
    std::unordered_map<std::string_view, Namesakes> m_byName;
};

/** The levels of a document, each sorted when it is first asked for. */
class Levels
{
public:
    const Level& Below(const KeyElement* parent);

private:
    std::unordered_map<const KeyElement*, Level> m_levels;
};

#endif
