#ifndef KX_TOOLS_CHECKSAVING_H
#define KX_TOOLS_CHECKSAVING_H

#include "checks/Warnings.h"

#include <string>

class CXMLReader;

/** Warns of what a file loses or gains when the document of @p reader is saved to it unchanged. */
void CheckSaving(CXMLReader& reader, const std::string& file, Warnings& warnings);

#endif
