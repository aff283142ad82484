#ifndef KX_TOOLS_KEYTREEBUILDER_H
#define KX_TOOLS_KEYTREEBUILDER_H

#include "file/KeyTree.h"

#include <map>
#include <optional>
#include <unordered_set>
#include <vector>

/** Makes the records of a KeyTree from the engine's elements. */
class KeyTreeBuilder
{
public:
    /** What has the texts of the records. */
    enum class Texts
    {
        InDocument, ///< which outlives the tree
        InTree
    };

    KeyTreeBuilder(KeyTree& tree, Texts texts) : m_tree(tree), m_texts(texts) {}

    /**
     * Adds a record of @p element, whose attributes are complete.
     *
     * @param parent  null for the root.
     * @param before  the last child of @p parent; null if it has none.
     */
    KeyElement* Add(const xmlNode* element, KeyElement* parent, KeyElement* before);

    /** Notes the value, if @p element, which is complete, has one. */
    void SetValue(KeyElement& record, const xmlNode* element);

private:
    using Defaults = std::map<std::string, std::vector<std::string>, std::less<>>;

    template <class Value>
    Value* Allocate(size_t count)
    {
        return static_cast<Value*>(
            m_tree.m_memory->allocate(count * sizeof(Value), alignof(Value)));
    }

    std::string_view Copy(std::string_view text);
    std::string_view CopyOnce(std::string_view text);
    std::string_view Keep(const xmlChar* text);
    void AddAttributes(const xmlNode* element, KeyElement& record);
    void Collect(const xmlNode* element);
    void CollectDefaults(const xmlNode* element);
    std::string_view ValueOf(const xmlAttr* attribute);
    bool IsCollected(std::string_view name);
    const Defaults& DefaultsOf(const xmlDoc* document);

    KeyTree& m_tree;
    const Texts m_texts;
    unsigned m_count = 0;
    std::unordered_set<std::string_view> m_copies;
    std::optional<Defaults> m_defaults;           ///< names of attributes, by those of elements
    std::vector<KeyAttribute> m_attributes;       ///< of one element
    std::unordered_set<std::string_view> m_names; ///< of the first of them, once they are many
};

#endif
