#ifndef KX_ENGINE_IDS_H
#define KX_ENGINE_IDS_H

/**
 * @file Ids.h
 * The engine's table of IDs, which points to attributes: no entry may outlive its attribute.
 *
 * A change of an attribute's value leaves the table alone, as the engine does. Each call steps
 * through the table at most once, and not at all if no attribute that is freed is an ID.
 */

#include <libxml/tree.h>

namespace kx
{

/** Takes every attribute that is freed with @p top out of the table of IDs. */
void ForgetIdsWithin(xmlNode* top);

/** Takes every attribute that is freed with the children of @p top out of the table of IDs. */
void ForgetIdsBelow(const xmlNode* top);

/** Empties the table of IDs, before a DTD is freed to whose entities their values may refer. */
void ForgetAllIds(xmlDoc* document);

} // namespace kx

#endif
