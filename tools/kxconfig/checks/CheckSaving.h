#ifndef KX_TOOLS_CHECKSAVING_H
#define KX_TOOLS_CHECKSAVING_H

#include "checks/Findings.h"

#include <string>

class CXMLReader;

/** Checks what a file loses or gains when the document of @p reader is saved to it unchanged. */
void CheckSaving(CXMLReader& reader, const std::string& file, Findings& findings);

#endif
