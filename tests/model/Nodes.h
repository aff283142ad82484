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

} // namespace kxmodel

#endif
