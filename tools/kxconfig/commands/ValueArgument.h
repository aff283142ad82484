#ifndef KX_TOOLS_VALUEARGUMENT_H
#define KX_TOOLS_VALUEARGUMENT_H

#include <string>

/** Ends a command with the message that VALUE is not XML text, and @p why. */
[[noreturn]] void RefuseValue(const std::string& why);

/** Throws a Failure unless @p value is text as an XML file holds it, with references. */
void RequireXmlText(const std::string& value);

/** The reason for the most common mistake in a value. */
extern const char* const g_bareAmpersand;

#endif
