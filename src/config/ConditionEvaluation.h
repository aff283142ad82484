#ifndef KX_CONFIG_CONDITIONEVALUATION_H
#define KX_CONFIG_CONDITIONEVALUATION_H

#include "Condition.h"

#include <limits.h>

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

inline bool ShortNameHolds(const Term& term, xmlNode* element)
{
    xmlChar name[kShortName];
    memcpy(name, term.name.data, term.name.size);
    name[term.name.size] = 0;
    return HasValue(element, name, term.value);
}

inline bool LongNameHolds(const Term& term, xmlNode* element)
{
    if (term.name.size > INT_MAX)
    {
        return false;
    }
    xmlChar* const name = xmlStrndup(reinterpret_cast<const xmlChar*>(term.name.data),
                                     static_cast<int>(term.name.size));
    if (name == 0)
    {
        return false;
    }
    const bool holds = HasValue(element, name, term.value);
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
        accepted = joinedByOr ? accepted || holds : accepted && holds;
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
