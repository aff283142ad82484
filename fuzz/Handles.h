#ifndef KX_FUZZ_HANDLES_H
#define KX_FUZZ_HANDLES_H

// The handles of a client that keeps to the contract: it forgets a handle when its node is freed.

#include "CXmlNode.h"

#include <libxml/tree.h>

#include <cstddef>

namespace kxfuzz
{

/**
 * A few handles, and which of them may still be used.
 *
 * The engine reports each node that it frees; the handles on it become null handles. Declarations
 * are freed without a report, together with their DTD.
 */
class Handles
{
public:
    Handles();
    ~Handles();
    Handles(const Handles&) = delete;
    Handles& operator=(const Handles&) = delete;

    CXmlNode& At(std::size_t index) { return m_slots[index % kCount].handle; }
    void Put(std::size_t index, const CXmlNode& handle);

    /** @return the node that @p handle designates; null for a null handle. */
    static xmlNodePtr NodeOf(const CXmlNode& handle);

    /** Watches one more pointer, which becomes null when its node is freed. */
    void Watch(std::size_t index, xmlNodePtr node) { m_watched[index % kWatched] = node; }
    xmlNodePtr Watched(std::size_t index) const { return m_watched[index % kWatched]; }

    /** To be called after whatever may have reset the engine. */
    static void ListenToEngine();

private:
    struct Slot
    {
        CXmlNode handle;
        xmlNodePtr node = nullptr;
        xmlDocPtr document = nullptr;
        bool isDeclaration = false;
    };

    static void OnFreed(xmlNodePtr node);
    void Forget(xmlNodePtr node);

    static constexpr std::size_t kCount = 16;
    static constexpr std::size_t kWatched = 2;
    static Handles* s_listening;
    Slot m_slots[kCount];
    xmlNodePtr m_watched[kWatched] = {};
};

} // namespace kxfuzz

#endif
