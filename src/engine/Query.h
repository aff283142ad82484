#ifndef KX_ENGINE_QUERY_H
#define KX_ENGINE_QUERY_H

/**
 * @file Query.h
 * Which XPath queries the engine evaluates forever.
 *
 * A reference's child is the declaration of its entity, and the declaration's parent is the DTD. So
 * the engine's axes "following" and "preceding" can go around in circles, with every version.
 */

#include <libxml/xpath.h>

namespace kx
{

/**
 * @return whether the evaluation of @p expression ends.
 *
 * If it may not end, the steps of @p context are limited: the evaluation fails after some seconds.
 * Engines before 2.9.10 have no such limit, and the result is false. It is also false where the
 * engine does not count the steps.
 */
bool QueryEnds(xmlXPathContext* context, const char* expression);

} // namespace kx

#endif
