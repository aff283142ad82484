#ifndef KX_CONFIG_OBSERVER_H
#define KX_CONFIG_OBSERVER_H

#include "KeyPath.h"

namespace kx
{

struct Term;

/**
 * The observer of a walk that nobody watches, and the list of what an observer is told.
 *
 * Lookup and update are templates over their observer, whose functions are static so that no walk
 * has to carry it along. The library's own walks have this one: its calls vanish and cost neither
 * an instruction nor a byte of stack. kxconfig builds the same walks with an observer that tells.
 */
struct Silent
{
    /** The children of @p parent come next. */
    static void EnterLevel(const xmlNode*) {}
    static void LeaveLevel() {}

    /** The key ends in ".": nothing is sought below @p parent. */
    static void EmptyKey(const xmlNode*) {}

    /** An element is compared with a segment; one of the next three calls tells the outcome. */
    static void Compare(const xmlNode*, const Segment&) {}
    static void OtherName() {}
    static void Rejected() {}
    /** @param suspended  whether the segment's condition, if it has one, was left out. */
    static void Selected(bool) {}

    /** A term of the condition that is in force was evaluated. */
    static void Tested(const Term&, bool) {}

    /** The element that was selected has this text to read or replace, or none: null. */
    static void Value(const xmlNode*) {}
};

} // namespace kx

#endif
