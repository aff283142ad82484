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
    explicit TermCursor(const TextView& condition) : m_remaining(condition), m_orAhead(true) {}

    bool AtEnd() const { return m_remaining.IsEmpty(); }
    Term Next();

private:
    size_t FindSeparator();

    TextView m_remaining;
    bool m_orAhead; ///< false once a search has shown that no "|" is left
};

/**
 * @return whether the attributes of @p element fulfil @p condition, which is not empty.
 *
 * Terms combine from left to right; a failed "&" or last term rejects at once.
 * ConditionEvaluation.h defines it; the library has it for the observer Silent.
 */
template <class Observer>
bool ConditionHolds(const TextView& condition, xmlNode* element);

} // namespace kx

#endif
