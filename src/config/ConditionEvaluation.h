#ifndef KX_CONFIG_CONDITIONEVALUATION_H
#define KX_CONFIG_CONDITIONEVALUATION_H

#include "Condition.h"

namespace kx
{

template <class Observer>
bool Condition::OthersHold(xmlNode* element, bool accepted) const
{
    TermCursor terms(m_others);
    bool joinedByOr = m_first.endsWithOr;
    while ((joinedByOr || accepted) && !terms.AtEnd())
    {
        const Term term = terms.Next();
        const bool holds = TermTest(term).Holds(element);
        Observer::Tested(term, holds);
        // Whatever a "&" joins a term to has been accepted, or it would have rejected.
        accepted = (joinedByOr && accepted) || holds;
        joinedByOr = term.endsWithOr;
    }
    return accepted;
}

} // namespace kx

#endif
