#ifndef KX_CONFIG_CONDITION_H
#define KX_CONFIG_CONDITION_H

#include "KeyPath.h"

namespace kx
{

/** One comparison of a condition: an attribute's name and the value that it must have. */
struct Term
{
    TextView name;
    TextView value;
    bool endsWithOr; ///< whether "|" follows the term: it decides how the next one is joined
};

/** Takes the terms off a condition, one after the other; linear in the condition's length. */
class TermCursor
{
public:
    explicit TermCursor(TextView condition) : m_remaining(condition), m_orAhead(true) {}

    bool AtEnd() const { return m_remaining.IsEmpty(); }
    Term Next();

private:
    size_t FindSeparator();

    TextView m_remaining;
    bool m_orAhead; ///< false once a search has shown that no "|" is left
};

/** A term made ready to be tested: the engine takes an attribute's name zero-terminated. */
class TermTest
{
public:
    explicit TermTest(const Term& term);

    bool Holds(xmlNode* element) const
    {
        return m_shortName[0] != 0 ? HasValue(element, m_shortName) : LongNameHolds(element);
    }

private:
    /** Longer than any sensible attribute name is: only such are copied to the heap. */
    static const size_t kShortName = 64;

    bool HasValue(xmlNode* element, const xmlChar* name) const
    {
        xmlChar* const text = xmlGetProp(element, name);
        if (text == 0)
        {
            return false;
        }
        const bool equal = SameText(text, m_value);
        xmlFree(text);
        return equal;
    }

    bool LongNameHolds(xmlNode* element) const;

    const TextView m_value;
    TextView m_longName;             ///< a name that is too long for the copy
    xmlChar m_shortName[kShortName]; ///< zero-terminated; empty if the name is long, or none
};

/**
 * What the attributes of an element must fulfil.
 *
 * One object tests all the elements of a level: most conditions have a single term, and the first
 * one is split and made ready only once.
 */
class Condition
{
public:
    /** @param text  not empty. */
    explicit Condition(TextView text) : m_others(text), m_first(m_others.Next()), m_test(m_first) {}

    /** Terms combine from left to right; a failed "&" or last term rejects at once. */
    template <class Observer>
    bool Holds(xmlNode* element) const
    {
        const bool firstHolds = m_test.Holds(element);
        Observer::Tested(m_first, firstHolds);
        return m_others.AtEnd() ? firstHolds : OthersHold<Observer>(element, firstHolds);
    }

private:
    /** ConditionEvaluation.h defines it; the library has it for the observer Silent. */
    template <class Observer>
    bool OthersHold(xmlNode* element, bool accepted) const;

    TermCursor m_others; ///< the terms after the first
    const Term m_first;
    const TermTest m_test;
};

} // namespace kx

#endif
