#ifndef KX_TOOLS_SAVEDIFFERENCES_H
#define KX_TOOLS_SAVEDIFFERENCES_H

#include "CXMLReader.h"

#include <string>
#include <vector>

/** Something that a file loses or gains when it is loaded and saved. */
struct Difference
{
    long line; ///< of the file as it is
    std::string what;
};

/**
 * @return the first difference in the XML declaration and the first one after it; none, if the
 * writer would save @p reader's document as @p file has it, byte for byte. None either for what is
 * not a regular file: the engine has read its bytes, which are gone.
 *
 * What would be saved is compared while the engine produces it; neither it nor the file is held in
 * memory.
 */
std::vector<Difference> DifferencesAfterSaving(CXMLReader& reader, const std::string& path);

#endif
