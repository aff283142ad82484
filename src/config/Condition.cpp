#include "Condition.h"

namespace kx
{

namespace
{

bool HasValue(xmlNode* element, const xmlChar* name, const TextView& value)
{
    xmlChar* const text = xmlGetProp(element, name);
    if (text == 0)
    {
        return false;
    }
    const bool equal = SameText(text, value);
    xmlFree(text);
    return equal;
}

/** Beyond the length of any sensible attribute name: only longer ones are copied to the heap. */
const size_t kShortName = 64;

/** @return whether @p term holds; @p name is room for its name and a NUL. */
bool NameHolds(const Term& term, xmlNode* element, xmlChar* name)
{
    memcpy(name, term.name.data, term.name.size);
    name[term.name.size] = 0;
    return HasValue(element, name, term.value);
}

bool ShortNameHolds(const Term& term, xmlNode* element)
{
    xmlChar name[kShortName];
    return NameHolds(term, element, name);
}

bool LongNameHolds(const Term& term, xmlNode* element)
{
    xmlChar* const name = static_cast<xmlChar*>(xmlMalloc(term.name.size + 1));
    if (name == 0)
    {
        return false;
    }
    const bool holds = NameHolds(term, element, name);
    xmlFree(name);
    return holds;
}

/** An attribute name that is empty or holds a NUL names no attribute. */
bool NamesAnAttribute(const TextView& name)
{
    return !name.IsEmpty() && name.Find('\0') == name.size;
}

bool TermHolds(const Term& term, xmlNode* element)
{
    if (!NamesAnAttribute(term.name))
    {
        return false;
    }
    return term.name.size < kShortName ? ShortNameHolds(term, element)
                                       : LongNameHolds(term, element);
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

bool ConditionHolds(const TextView& condition, xmlNode* element)
{
    bool accepted = true;
    bool joinedByOr = false;
    for (TermCursor terms(condition); !terms.AtEnd();)
    {
        const Term term = terms.Next();
        const bool holds = TermHolds(term, element);
        // Whatever a "&" joins a term to has been accepted, or it would have rejected.
        accepted = joinedByOr ? accepted || holds : holds;
        joinedByOr = term.endsWithOr;
        if (!joinedByOr && !accepted)
        {
            return false;
        }
    }
    return accepted;
}

} // namespace kx
