#ifndef KX_TOOLS_KEYLIST_H
#define KX_TOOLS_KEYLIST_H

#include "survey/Levels.h"

#include <functional>
#include <string>
#include <vector>

/** A step on the way to an element: the level that it is on, and its segment there. */
struct KeyStep
{
    const KeyElement* parent;
    const Level* level; ///< null where all names differ, so that no segment has a condition
    KeySegment segment;
    bool isNew; ///< no key with an only bearer had it before
};

/** A key path under which there is a value. */
struct ListedKey
{
    const std::string& key;

    /** The element, if the key leads to it and to nothing else; null if that is not plain:
     * KeyValues finds out. */
    const KeyElement* onlyBearer;

    const std::vector<KeyStep>& steps; ///< from the root's children on; of an only bearer
};

/** @return whether to go on. */
using KeyVisitor = std::function<bool(const ListedKey&)>;

/**
 * Visits the key path of each element with a value, in document order and each key once. It has a
 * condition where others bear the same name and an attribute distinguishes them.
 *
 * @param levels  gets those levels below which a key can lead to several elements. The others are
 *                not kept.
 */
void VisitKeys(const KeyElement* root, Levels& levels, const KeyVisitor& visit);

#endif
