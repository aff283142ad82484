#ifndef KX_TOOLS_OUTPUT_H
#define KX_TOOLS_OUTPUT_H

#include "output/ExitStatus.h"

#include <nlohmann/json.hpp>

#include <string>

// All that kxconfig says passes through here: as lines for people, or as one JSON object.

using Json = nlohmann::ordered_json;

/** From now on results and complaints are kept for one JSON object, which Finish() prints. */
void AnswerInJson();

/** @return whether they are: whoever has many results need not make the lines, or the objects. */
bool AnswersInJson();

/** Names the verb and the file in that object. */
void AnswerFor(const std::string& verb, const std::string& file);

/** Gives one result: prints @p line, or keeps @p result. */
void Print(const std::string& line, const Json& result);

/** One half of it each: a line without a result of its own, a result without a line. */
void PrintLine(const std::string& line);
void PrintResult(const Json& result);

/** Prints "kxconfig: " and @p message as one line, whatever it holds, on standard error. */
void Complain(const std::string& message);

/** Ends the output. @return @p status, or NotSaved if the output could not be written. */
ExitStatus Finish(ExitStatus status);

/** The same when memory ran out on the way: says so, without the results in JSON. */
ExitStatus FinishOutOfMemory();

enum class Colour
{
    Good,
    Bad,
    Faint
};

/** @return @p text in colour if standard output is a terminal and the user has not said no. */
std::string Painted(Colour colour, const std::string& text);

/** @return @p text with its control characters, and bytes that are no UTF-8, written as escapes. */
std::string OnOneLine(const std::string& text);

/** @return @p text in double quotes and on one line, as OnOneLine() writes it. */
std::string Quoted(const std::string& text);

/** The same of a text that may be as long as the file: only its start, and then "...". */
std::string QuotedStart(const std::string& text);

/** @return where the character begins that @p position is in: there a text can be cut. */
size_t StartOfCharacter(const std::string& text, size_t position);

#endif
