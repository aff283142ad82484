#ifndef KX_TOOLS_KEYTREE_H
#define KX_TOOLS_KEYTREE_H

#include "file/Load.h"

#include <libxml/tree.h>

#include <iosfwd>
#include <memory>
#include <string>

struct DocumentDeleter
{
    void operator()(xmlDoc* document) const
    {
        if (!IsKept(document))
        {
            xmlFreeDoc(document);
        }
    }
};

using KeyTree = std::unique_ptr<xmlDoc, DocumentDeleter>;

/**
 * Loads a file as LoadFile() does, but keeps only what keys and values consist of: the elements,
 * their attributes, and a text that is the only child of its element.
 *
 * The rest, such as white space between elements, is most of a document. Each element is reduced as
 * soon as it ends, so that a large file needs half the memory and time.
 *
 * @throws Failure as LoadFile() does.
 */
KeyTree LoadKeyTree(const std::string& path, std::istream* standardInput = nullptr);

#endif
