#include "Condition.h"

#include "ConditionEvaluation.h"
#include "Observer.h"

namespace kx
{

Term TermCursor::Next()
{
    const size_t separator = FindSeparator();
    const TextView text = m_remaining.Before(separator);
    const size_t equals = text.Find('=');

    Term term;
    term.endsWithOr = separator != m_remaining.size && m_remaining.data[separator] == '|';
    if (equals != text.size)
    {
        term.name = text.Before(equals);
        term.value = text.After(equals);
    }
    m_remaining = m_remaining.After(separator);
    return term;
}

// "|" is searched first and over all that remains, so that a "&" ahead of it becomes part of the
// term's value. Conditions in the field are written for this reading.
size_t TermCursor::FindSeparator()
{
    if (m_orAhead)
    {
        const size_t separator = m_remaining.Find('|');
        if (separator != m_remaining.size)
        {
            return separator;
        }
        m_orAhead = false;
    }
    return m_remaining.Find('&');
}

template bool ConditionHolds<Silent>(const TextView& condition, xmlNode* element);

} // namespace kx
