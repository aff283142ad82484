#ifndef KX_TOOLS_LOCATIONS_H
#define KX_TOOLS_LOCATIONS_H

#include <libxml/tree.h>

#include <string>
#include <unordered_map>
#include <unordered_set>

/**
 * The location paths of many nodes of a document, which must not change meanwhile.
 *
 * They are what xmlGetNodePath() gives, which counts the siblings of a node anew for each path;
 * here the children of a node are counted once.
 */
class Locations
{
public:
    /** @return the location path of @p node, such as /cfg/net[2]/ip. */
    std::string Of(const xmlNode* node);

private:
    /** @return "[2]" and the like; empty if @p node needs none. */
    std::string PositionOf(const xmlNode* node);

    void CountChildren(const xmlNode* parent);

    std::unordered_set<const xmlNode*> m_counted;         ///< parents whose children are counted
    std::unordered_map<const xmlNode*, long> m_positions; ///< from 1; none if nothing is like it
};

#endif
