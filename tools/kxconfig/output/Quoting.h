#ifndef KX_TOOLS_QUOTING_H
#define KX_TOOLS_QUOTING_H

#include <string>

// Text of unknown content, made safe for a terminal.

/** @return @p text with its control characters, and bytes that are not UTF-8, escaped. */
std::string OnOneLine(const std::string& text);

/** The same of a text of several lines, whose line ends and tabs remain. */
std::string OnItsLines(const std::string& text);

/** @return @p text in double quotes and on one line, as OnOneLine() writes it. */
std::string Quoted(const std::string& text);

/** The same of a text that may be as long as the file: only its start, and then "...". */
std::string QuotedStart(const std::string& text);

/** @return where the character at @p position begins: there a text can be cut. */
size_t StartOfCharacter(const std::string& text, size_t position);

#endif
