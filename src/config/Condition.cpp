#include "Condition.h"

#include "ConditionEvaluation.h"
#include "Observer.h"

namespace kx
{

namespace
{

/** An attribute name that is empty or holds a NUL names no attribute. */
bool NamesAnAttribute(TextView name)
{
    return !name.IsEmpty() && name.Find('\0') == name.size;
}

} // namespace

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

TermTest::TermTest(const Term& term) : m_value(term.value)
{
    m_shortName[0] = 0;
    if (!NamesAnAttribute(term.name))
    {
        return;
    }
    if (term.name.size < kShortName)
    {
        memcpy(m_shortName, term.name.data, term.name.size);
        m_shortName[term.name.size] = 0;
    }
    else
    {
        m_longName = term.name;
    }
}

bool TermTest::LongNameHolds(xmlNode* element) const
{
    if (m_longName.IsEmpty())
    {
        return false;
    }
    xmlChar* const name = static_cast<xmlChar*>(xmlMalloc(m_longName.size + 1));
    if (name == 0)
    {
        return false;
    }
    memcpy(name, m_longName.data, m_longName.size);
    name[m_longName.size] = 0;
    const bool holds = HasValue(element, name);
    xmlFree(name);
    return holds;
}

template bool Condition::OthersHold<Silent>(xmlNode* element, bool accepted) const;

} // namespace kx
