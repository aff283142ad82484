#include "file/KeyTree.h"

#include "file/KeyTreeBuilder.h"
#include "file/Nodes.h"

namespace
{

/** A record whose children are being added. */
struct OpenRecord
{
    KeyElement* record;
    KeyElement* lastChild;
    const xmlNode* next; ///< child of the engine's element
};

} // namespace

KeyTree::KeyTree(const xmlDoc* document)
{
    KeyTreeBuilder builder(*this, KeyTreeBuilder::Texts::InDocument);
    const xmlNode* const root = xmlDocGetRootElement(const_cast<xmlDoc*>(document));
    std::vector<OpenRecord> open = {{builder.Add(root, nullptr, nullptr), nullptr, root->children}};
    builder.SetValue(*open.back().record, root);
    while (!open.empty())
    {
        const xmlNode* const element = kx::ElementFrom(const_cast<xmlNode*>(open.back().next));
        if (element == nullptr)
        {
            open.pop_back();
            continue;
        }
        OpenRecord& parent = open.back();
        parent.next = element->next;
        parent.lastChild = builder.Add(element, parent.record, parent.lastChild);
        builder.SetValue(*parent.lastChild, element);
        open.push_back({parent.lastChild, nullptr, element->children});
    }
}
