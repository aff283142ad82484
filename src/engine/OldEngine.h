#ifndef KX_ENGINE_OLDENGINE_H
#define KX_ENGINE_OLDENGINE_H

/**
 * @file OldEngine.h
 * Calls that crash or answer differently with engines before 2.9.10.
 *
 * The version is checked at run time: a library compiled with newer headers may run with an older
 * engine. With a newer engine each function is the engine's call and nothing else.
 */

#include <libxml/tree.h>

namespace kx
{

/** @return whether the engine is older than 2.9.10. */
bool IsOldEngine();

/**
 * Replaces the content of @p node by xmlNodeSetContent.
 *
 * With an older engine an empty text leaves no child either, and a reference to an entity that
 * contains itself is stored like any other.
 */
void SetContent(xmlNode* node, const xmlChar* text);

/** Creates an element by xmlNewDocNode, with @p content as by SetContent; it may be null. */
xmlNode* NewElement(xmlDoc* document, xmlNs* space, const xmlChar* name, const xmlChar* content);

} // namespace kx

#endif
