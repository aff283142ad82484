#ifndef KX_TOOLS_VALUEARGUMENT_H
#define KX_TOOLS_VALUEARGUMENT_H

#include <iosfwd>
#include <string>

struct _xmlDoc;

/** Ends a command with the message that the new text is not XML text, and @p why. */
[[noreturn]] void RefuseValue(const std::string& why);

/** Throws a Failure unless @p value is text as an XML file holds it, with references. */
void RequireXmlText(const std::string& value);

/** Throws a Failure if @p value, which is XML text, refers to an entity that @p document does not
 * declare. With an external DTD an engine that does not read it cannot know. */
void RequireDeclaredEntities(const std::string& value, const _xmlDoc* document);

/**
 * @return the content of @p file, or of @p input if that is "-", without one line end at its end.
 * @throws Failure if it cannot be read.
 */
std::string ReadValue(const std::string& file, std::istream& input);

/** The reason for the most common mistake in a value. */
extern const char* const kBareAmpersand;

#endif
