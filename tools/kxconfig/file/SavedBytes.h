#ifndef KX_TOOLS_SAVEDBYTES_H
#define KX_TOOLS_SAVEDBYTES_H

#include <libxml/tree.h>

#include <optional>
#include <string>

/** @return the bytes that CXMLWriter::SaveData() writes for @p document. */
std::string SavedBytes(xmlDoc* document);

/** @return the bytes of the file at @p path; none of what is not a regular file, or not readable.
 */
std::optional<std::string> BytesOf(const std::string& path);

#endif
