#ifndef KX_TOOLS_REPORT_H
#define KX_TOOLS_REPORT_H

#include "output/ExitStatus.h"

#include <nlohmann/json_fwd.hpp>

#include <iosfwd>
#include <optional>
#include <string>
#include <vector>

using Json = nlohmann::ordered_json;

/** @return the text as JSON, or null if there is none. */
Json OrNull(const std::optional<std::string>& text);

enum class Color
{
    Good,
    Bad,
    Faint
};

/** When colors are printed; Auto: on a terminal that shows them, unless NO_COLOR is set. */
enum class ColorChoice
{
    Auto,
    Always,
    Never
};

/**
 * Ends the process where std::terminate() would abort it: short of memory, functions of the parsers
 * of arguments and of JSON throw that must not. The message and the status are those of such a run.
 */
[[noreturn]] void EndTerminated();

/** What one run of kxconfig prints: lines for people, or one JSON object at the end. */
class Report
{
public:
    /** Neither stream is written to before the first line, message or Finish(). */
    Report(std::ostream& output, std::ostream& errors);
    ~Report();
    Report(const Report&) = delete;
    Report& operator=(const Report&) = delete;

    /** From now on results and messages are kept for the JSON object. */
    void AnswerInJson() { m_isJson = true; }
    bool IsJson() const { return m_isJson; }

    void ChooseColors(ColorChoice choice) { m_color = choice; }

    /** Names the command and the file in the JSON object. */
    void SetSubject(const std::string& verb, const std::string& file);

    /**
     * Adds one result, rendered in the form that was asked for and only in that.
     *
     * @param result  a value with the members `std::string Line() const` and `Json InJson() const`.
     */
    template <class Result>
    void Add(const Result& result)
    {
        if (m_isJson)
        {
            AddJson(result.InJson());
        }
        else
        {
            AddLine(result.Line());
        }
    }

    /** For what exists in one form only: nothing happens if the other one was asked for. */
    void AddLine(std::string line);
    void AddBytes(const std::string& bytes);

    /** Adds lines of a file, as they are; on a terminal with their control characters escaped. */
    void AddFileLines(const std::string& lines);
    void AddJson(Json result);

    /** Prints "kxconfig: " and @p message to the errors, on one line regardless of its content. */
    void Complain(const std::string& message);

    /** @return @p text in color if the output shows colors. */
    std::string Paint(Color color, const std::string& text) const;

    bool HasTerminalForErrors() const;

    /**
     * Leaves the output to a document: from now on results and the JSON object go to the errors.
     *
     * @return the output.
     */
    std::ostream& GiveOutput();

    /** Notes that a file is saved: what fails from now on fails after that. */
    void NoteSaved();

    /** Ends the output. @return @p status; NotSaved, or NotReported after NoteSaved(), if the
     * output could not be written. */
    ExitStatus Finish(ExitStatus status);

    /** The same after memory ran out: without the results that JSON would show. */
    ExitStatus FinishOutOfMemory();

private:
    void WriteAnswer(ExitStatus status);

    std::ostream* m_output;
    std::ostream& m_errors;
    ExitStatus m_failure = ExitStatus::NotSaved; ///< of a run whose output cannot be written
    bool m_isJson = false;
    ColorChoice m_color = ColorChoice::Auto;
    std::optional<std::string> m_verb;
    std::optional<std::string> m_file;
    std::vector<Json> m_results;
    std::vector<std::string> m_messages;
};

#endif
