#include "Condition.h"

namespace kx
{

Term TermCursor::Next()
{
    const TextView text = m_remaining.Before(FindSeparator());
    m_remaining = m_remaining.After(text.size);

    Term term;
    const size_t equals = text.Find('=');
    if (equals != text.size)
    {
        term.name = text.Before(equals);
        term.value = text.After(equals);
    }
    return term;
}

size_t TermCursor::FindSeparator()
{
    if (m_termEndsWithOr)
    {
        const size_t separator = m_remaining.Find('|');
        if (separator != m_remaining.size)
        {
            return separator;
        }
        m_termEndsWithOr = false;
    }
    return m_remaining.Find('&');
}

bool ConditionTest::Next()
{
    const bool joinedByOr = m_others.TermEndsWithOr();
    if (m_others.AtEnd() || !(joinedByOr || m_accepted))
    {
        return false;
    }
    m_term = m_others.Next();
    m_termHolds = HasAttribute(m_element, m_term);
    // Reached by "&" only if the terms so far are accepted.
    m_accepted = (joinedByOr && m_accepted) || m_termHolds;
    return true;
}

bool Condition::TestTerms(const xmlNode* element) const
{
    ConditionTest test(*this, element);
    while (test.Next())
    {
    }
    return test.IsAccepted();
}

} // namespace kx
