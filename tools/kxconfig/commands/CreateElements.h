#ifndef KX_TOOLS_CREATEELEMENTS_H
#define KX_TOOLS_CREATEELEMENTS_H

#include "file/ElementChanges.h"

#include <string>

/**
 * Makes the elements of @p key that @p document does not have, and gives the last one @p value. An
 * element that is there and empty gets the value, too.
 *
 * @param key  one that starts with the name of the root, and under which there is no value.
 * @throws Failure if the key has a condition or names that no element can have, or if it does not
 *         lead to one place: then the document may be changed in part, and must not be saved.
 */
void CreateElements(xmlDoc* document, const std::string& key, const std::string& value,
                    ElementChanges& changes);

#endif
