#ifndef KX_CONFIG_CONDITION_H
#define KX_CONFIG_CONDITION_H

#include "engine/Attribute.h"

namespace kx
{

/**
 * One comparison of a condition: an attribute that the element must have.
 *
 * A term without "=" has an empty name, which names no attribute.
 */
typedef AttributeView Term;

/**
 * Takes the terms off a condition, one after the other; linear in the condition's length.
 *
 * "|" is searched first and over all that remains, so that a "&" ahead of it becomes part of the
 * term's value. Conditions in the field are written for this reading.
 */
class TermCursor
{
public:
    explicit TermCursor(TextView condition) : m_remaining(condition), m_termEndsWithOr(true) {}

    bool AtEnd() const { return m_remaining.IsEmpty(); }
    Term Next();

    /** @return whether "|" follows the term taken last: it decides how the next one is joined. */
    bool TermEndsWithOr() const { return m_termEndsWithOr; }

private:
    size_t FindSeparator();

    TextView m_remaining;
    bool m_termEndsWithOr; ///< once false, no "|" is left
};

/**
 * What the attributes of an element must fulfill; without a text, nothing.
 *
 * The first term is split once for all elements of a level: most conditions have no other.
 */
struct Condition
{
    Condition() : others(text) {}

    explicit Condition(TextView whole)
        : text(whole), others(whole), first(IsEmpty() ? Term() : others.Next())
    {
    }

    bool IsEmpty() const { return text.IsEmpty(); }

    /** @return whether @p element fulfills the condition; any does if it is empty. */
    bool Admits(const xmlNode* element) const
    {
        return IsEmpty() || (others.AtEnd() ? HasAttribute(element, first) : TestTerms(element));
    }

    bool TestTerms(const xmlNode* element) const;

    TextView text;
    TermCursor others; ///< the terms after the first
    Term first;
};

/**
 * Tests a condition, which is not empty, on an element: term by term, from left to right, without
 * precedence of one separator over the other.
 *
 * The constructor tests the first term.
 */
class ConditionTest
{
public:
    ConditionTest(const Condition& condition, const xmlNode* element)
        : m_element(element),
          m_others(condition.others),
          m_term(condition.first),
          m_termHolds(HasAttribute(element, m_term)),
          m_accepted(m_termHolds)
    {
    }

    /** Tests the next term. @return false if there is none, or if a term has rejected for good. */
    bool Next();

    const Term& GetTerm() const { return m_term; }
    bool TermEndsWithOr() const { return m_others.TermEndsWithOr(); }
    bool TermHolds() const { return m_termHolds; }

    /** @return what all terms so far amount to. */
    bool IsAccepted() const { return m_accepted; }

private:
    const xmlNode* m_element;
    TermCursor m_others;
    Term m_term;
    bool m_termHolds;
    bool m_accepted;
};

} // namespace kx

#endif
