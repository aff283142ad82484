#ifndef KX_TOOLS_LOAD_H
#define KX_TOOLS_LOAD_H

#include "CXMLReader.h"
#include "CXmlParser.h"

#include <functional>
#include <iosfwd>
#include <memory>
#include <string>

struct _xmlDoc;

/**
 * From now on keeps what is loaded until the process ends, unless its end is logged: the system
 * takes back the memory of a process at once, which is faster than to free each node.
 */
void KeepLoaded();

/** Keeps @p loaded where a leak checker finds it, if it is to be kept. @return whether it is. */
bool Keep(void* loaded);

struct LoadedDeleter
{
    template <class Loaded>
    void operator()(Loaded* loaded) const
    {
        if (!Keep(loaded))
        {
            delete loaded;
        }
    }
};

using LoadedReader = std::unique_ptr<CXMLReader, LoadedDeleter>;
using LoadedParser = std::unique_ptr<CXmlParser, LoadedDeleter>;

/**
 * Loads a file of this machine; URLs and other names that the engine would fetch are not files. A
 * pipe is read to its end.
 *
 * @param standardInput  what the path "-" stands for; if null, it is a file's name.
 * @return a reader that holds a document.
 * @throws Failure with the line number if the file is not well-formed.
 */
LoadedReader LoadFile(const std::string& path, std::istream* standardInput = nullptr);

/**
 * Opens a file as LoadFile() does, and throws what it throws if @p load fails.
 *
 * @param load  loads the file with the given name. @return whether it is well-formed.
 */
void LoadWith(const std::function<bool(const std::string&)>& load, const std::string& path,
              std::istream* standardInput);

/** Loads a file in the same way, with its blanks, into a document of the toolkit. */
void LoadDocument(const std::string& path, CXmlParser& document,
                  std::istream* standardInput = nullptr);

/** @return the document that @p reader holds. */
_xmlDoc* DocumentOf(CXMLReader& reader);

/** @return the root element of the document that @p reader holds. */
const _xmlNode* RootOf(CXMLReader& reader);

#endif
