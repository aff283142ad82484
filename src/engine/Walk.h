#ifndef KX_ENGINE_WALK_H
#define KX_ENGINE_WALK_H

#include <libxml/tree.h>

namespace kx
{

/**
 * @return what follows @p node among all that is freed with @p top, or null: an element's
 *         attributes precede its children; an entity's declaration is not below its references.
 */
xmlNode* NextWithin(const xmlNode* top, xmlNode* node);

} // namespace kx

#endif
