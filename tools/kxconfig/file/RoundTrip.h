#ifndef KX_TOOLS_ROUNDTRIP_H
#define KX_TOOLS_ROUNDTRIP_H

#include "CXMLReader.h"

#include <string>
#include <vector>

/** Something that a file loses or gains when it is loaded and saved. */
struct Difference
{
    long line; ///< of the file as it is
    std::string what;
};

/** @return the first difference in the XML declaration and the first one after it; none, if the
 * writer would save @p reader's document as @p file has it, byte for byte. None either of what is
 * no regular file: its bytes were there to be read once, by the engine. */
std::vector<Difference> WhatSavingChanges(CXMLReader& reader, const std::string& file);

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
