#ifndef KX_BENCH_LIBRARY_LOADED_H
#define KX_BENCH_LIBRARY_LOADED_H

#include "CXMLReader.h"
#include "CXMLWriter.h"
#include "CXmlParser.h"

#include <libxml/tree.h>

#include <memory>
#include <string>

namespace bench
{

// What works on the engine's document works on the very same one, whichever implementation it
// belongs to: where its nodes lie in memory makes no difference between them then.

/** @return a reader of the document at @p path, which is loaded once. */
std::shared_ptr<CXMLReader> LoadedReader(const std::string& path);

/** @return the document that LoadedReader() holds. */
xmlDoc* LoadedDocument(const std::string& path);

/** @return the root element of LoadedDocument(). */
xmlNode* LoadedRoot(const std::string& path);

/** @return a writer on LoadedDocument() that saves to a scratch file. */
std::shared_ptr<CXMLWriter> LoadedWriter(const std::string& path);

/** @return a document of the toolkit, loaded once. */
std::shared_ptr<CXmlParser> LoadedParser(const std::string& path);

/** @return the document that LoadedParser() holds. */
xmlDoc* ParserDocument(const std::string& path);

} // namespace bench

#endif
