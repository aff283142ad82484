#ifndef KX_TOOLS_ROUNDTRIP_H
#define KX_TOOLS_ROUNDTRIP_H

#include "CXMLReader.h"

#include <string>

/** @return the bytes that CXMLWriter::SaveData() writes for @p reader's document. */
std::string SavedBytes(CXMLReader& reader);

/**
 * Requires that @p bytes, which are about to be saved, load.
 *
 * @param target  the file to save to, for the message.
 * @throws Failure with the line and the engine's reason.
 */
void RequireLoadsAgain(const std::string& bytes, const std::string& target);

#endif
