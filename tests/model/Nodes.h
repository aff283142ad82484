#ifndef KX_TESTS_MODEL_NODES_H
#define KX_TESTS_MODEL_NODES_H

#include <libxml/tree.h>

#include <vector>

namespace kxmodel
{

/**
 * @return the nodes of @p document, which may be null, that a call can start from, in document
 *         order: first none at all, then the document itself, then what is in it.
 */
std::vector<xmlNodePtr> NodesOf(xmlDocPtr document);

/**
 * Gives attributes shapes that no parser makes but that clients can: those whose value begins with
 * "#" lose their children, or get a text without content, two texts or a CDATA section instead.
 *
 * What a shape is follows from the value, so that a case stays a text. @p document may be null.
 */
void Reshape(xmlDocPtr document);

} // namespace kxmodel

#endif
