#ifndef KX_TOOLS_KEYTREE_H
#define KX_TOOLS_KEYTREE_H

#include "file/Load.h"

#include <libxml/tree.h>

#include <iosfwd>
#include <memory>
#include <memory_resource>
#include <string>
#include <string_view>

/** An attribute as a condition finds it: by its name without a prefix. */
struct KeyAttribute
{
    std::string_view name;
    std::string_view value;
};

/** What keys and values consist of in an element. */
struct KeyElement
{
    /** @return whether a lookup reads the element: its only child is a text. */
    bool HasValue() const { return value.data() != nullptr; }

    const KeyAttribute* begin() const { return attributes; }
    const KeyAttribute* end() const { return attributes + attributeCount; }

    std::string_view name;
    std::string_view value; ///< without data() if there is none
    const KeyElement* parent = nullptr;
    const KeyElement* children = nullptr; ///< the first one
    const KeyElement* next = nullptr;
    const KeyAttribute* attributes = nullptr; ///< the first of each name, and defaults of the DTD
    unsigned attributeCount = 0;
    unsigned place = 0;            ///< in document order
    const xmlNode* node = nullptr; ///< null if the engine's document is not kept
};

/**
 * The elements of a document, without all that is between them.
 *
 * It needs a fifth of the memory of the engine's document, and fewer steps to walk.
 */
class KeyTree
{
public:
    /** Takes the elements of @p document, which must outlive the tree. */
    explicit KeyTree(const xmlDoc* document);

    /** @return the root element. */
    const KeyElement* Root() const { return m_root; }

private:
    friend class KeyTreeBuilder;
    friend KeyTree LoadKeyTree(const std::string& path, std::istream* standardInput);

    KeyTree() = default;

    LoadedReader m_reader; ///< of a document that is kept for the tree
    std::unique_ptr<std::pmr::monotonic_buffer_resource> m_memory =
        std::make_unique<std::pmr::monotonic_buffer_resource>();
    const KeyElement* m_root = nullptr;
};

/**
 * Loads a file as LoadFile() does, but keeps only its elements. The engine's nodes of an element
 * are freed as soon as it ends. If log records are wanted, the library loads the file instead, so
 * that its records are written.
 *
 * @throws Failure as LoadFile() does.
 */
KeyTree LoadKeyTree(const std::string& path, std::istream* standardInput = nullptr);

#endif
