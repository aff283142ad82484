#ifndef KX_TOOLS_KEYARGUMENT_H
#define KX_TOOLS_KEYARGUMENT_H

#include <string>

class CXMLReader;

/** Throws a Failure unless @p key names the root element and at least one more. */
void RequireWellFormedKey(const std::string& key);

/** @return the message that @p key starts with another name than the root of @p reader, which is
 * @p file. */
std::string OtherRootMessage(const std::string& key, const std::string& file, CXMLReader& reader);

/**
 * Requires that @p key is well-formed and starts with the name of the root of @p reader: to the
 * library itself another name is success.
 *
 * @param file  the name of the document, for the message.
 */
void RequireKey(const std::string& key, const std::string& file, CXMLReader& reader);

#endif
