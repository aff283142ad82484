#ifndef KX_CONFIG_CONDITIONEVALUATION_H
#define KX_CONFIG_CONDITIONEVALUATION_H

#include "Condition.h"

namespace kx
{

inline bool HasValue(xmlNode* element, const xmlChar* name, const TextView& value)
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
inline bool NameHolds(const Term& term, xmlNode* element, xmlChar* name)
{
    memcpy(name, term.name.data, term.name.size);
    name[term.name.size] = 0;
    return HasValue(element, name, term.value);
}

inline bool ShortNameHolds(const Term& term, xmlNode* element)
{
    xmlChar name[kShortName];
    return NameHolds(term, element, name);
}

inline bool LongNameHolds(const Term& term, xmlNode* element)
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
inline bool NamesAnAttribute(const TextView& name)
{
    return !name.IsEmpty() && name.Find('\0') == name.size;
}

inline bool TermHolds(const Term& term, xmlNode* element)
{
    if (!NamesAnAttribute(term.name))
    {
        return false;
    }
    return term.name.size < kShortName ? ShortNameHolds(term, element)
                                       : LongNameHolds(term, element);
}

template <class Observer>
bool ConditionHolds(const TextView& condition, xmlNode* element)
{
    bool accepted = true;
    bool joinedByOr = false;
    for (TermCursor terms(condition); !terms.AtEnd();)
    {
        const Term term = terms.Next();
        const bool holds = TermHolds(term, element);
        Observer::Tested(term, holds);
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

#endif
