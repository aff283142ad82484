#ifndef KX_TOOLS_ELEMENTCHANGES_H
#define KX_TOOLS_ELEMENTCHANGES_H

#include "output/Change.h"

#include <libxml/tree.h>

#include <optional>
#include <string>
#include <unordered_map>
#include <vector>

/** What several updates of one document did to its elements in the end. */
class ElementChanges
{
public:
    /** Starts a series of notes that is in document order. */
    void BeginUpdate() { ++m_updates; }

    /** Notes that @p element had the text @p before; only the first note of an element counts. */
    void NoteChanged(const xmlNode* element, const std::string& before);

    /** Notes that @p element is new. */
    void NoteCreated(const xmlNode* element);

    /** @return the elements that are new or have another text than before, in document order. */
    std::vector<Change> List(xmlDoc* document) const;

    /** @return how many of them have neither elements nor a text that an update could replace. */
    size_t CountTextless() const;

private:
    void Note(const xmlNode* element, std::optional<std::string> before);
    std::vector<const xmlNode*> InDocumentOrder(xmlDoc* document) const;

    int m_updates = 0;
    std::vector<const xmlNode*> m_noted;
    std::unordered_map<const xmlNode*, std::optional<std::string>> m_before; ///< null for new ones
};

#endif
