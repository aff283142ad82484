#ifndef KX_TOOLS_KEYVALUES_H
#define KX_TOOLS_KEYVALUES_H

#include "Levels.h"

#include <string>
#include <vector>

/**
 * The values under many keys of one document, each as GetValue() gives it.
 *
 * A lookup compares with every sibling on its way. This reaches the same elements by segments
 * (Levels), and what a key shares with the one before it is not walked again.
 */
class KeyValues
{
public:
    /** @param levels  must outlive the object, like the document. */
    KeyValues(const xmlNode* root, Levels& levels);

    /** @param key  one that ListKeys() listed. */
    std::string Under(const std::string& key);

private:
    /** A segment of the last key, and what the key selects up to it. */
    struct Step
    {
        std::string segment;
        std::vector<const xmlNode*> reached;
    };

    std::vector<const xmlNode*> ReachedFrom(const std::vector<const xmlNode*>& above,
                                            const std::string& segment);

    Levels& m_levels;
    std::vector<Step> m_path; ///< starts with the root
};

#endif
