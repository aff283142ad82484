#include "survey/KeyList.h"

#include "file/Nodes.h"

#include <unordered_set>

namespace
{

/** Lists the keys of the elements below one whose key is given, in document order, each once. */
class KeyLister
{
public:
    explicit KeyLister(Levels& levels) : m_levels(levels) {}

    void ListBelow(const xmlNode* parent, const std::string& key)
    {
        const Level& level = m_levels.Below(parent);
        for (const xmlNode* node = kx::ElementFrom(parent->children); node != nullptr;
             node = kx::ElementFrom(node->next))
        {
            if (IsFreeOf(".@", Text(node->name)))
            {
                const std::string keyOfNode = key + "." + level.SegmentOf(node);
                if (kx::OnlyTextChild(node) != nullptr)
                {
                    List(keyOfNode);
                }
                else
                {
                    ListBelow(node, keyOfNode);
                }
            }
        }
    }

    std::vector<std::string> Take() { return std::move(m_keys); }

private:
    void List(const std::string& key)
    {
        if (m_listed.insert(key).second)
        {
            m_keys.push_back(key);
        }
    }

    Levels& m_levels;
    std::vector<std::string> m_keys;
    std::unordered_set<std::string> m_listed;
};

} // namespace

std::vector<std::string> ListKeys(const xmlNode* root, Levels& levels)
{
    KeyLister lister(levels);
    if (IsFreeOf(".", Text(root->name)))
    {
        lister.ListBelow(root, Text(root->name));
    }
    return lister.Take();
}
