#include "output/Report.h"

#include "output/Progress.h"
#include "output/Quoting.h"
#include "output/Terminal.h"

#include <nlohmann/json.hpp>

#include <atomic>
#include <cstdlib>
#include <exception>
#include <new>
#include <ostream>
#include <utility>

#include <unistd.h>

namespace
{

bool IsSet(const char* variable)
{
    const char* const value = std::getenv(variable);
    return value != nullptr && *value != 0;
}

bool ShowsColors(const std::ostream& stream, ColorChoice choice)
{
    if (choice != ColorChoice::Auto)
    {
        return choice == ColorChoice::Always;
    }
    return IsTerminal(stream) && !IsDumbTerminal() && !IsSet("NO_COLOR");
}

const char* StartOf(Color color)
{
    switch (color)
    {
    case Color::Good:
        return "\x1B[32m";
    case Color::Bad:
        return "\x1B[31m";
    default:
        return "\x1B[2m";
    }
}

std::string Colored(Color color, const std::string& text)
{
    return StartOf(color) + text + "\x1B[0m";
}

/** The status of a process that ends short of memory. */
std::atomic<ExitStatus> g_failure{ExitStatus::NotSaved};

} // namespace

Json OrNull(const std::optional<std::string>& text)
{
    return text ? Json(*text) : Json();
}

void EndTerminated()
{
    try
    {
        std::rethrow_exception(std::current_exception());
    }
    catch (const std::bad_alloc&)
    {
        const char message[] = "kxconfig: out of memory\n";
        static_cast<void>(!write(STDERR_FILENO, message, sizeof message - 1));
        _exit(static_cast<int>(g_failure.load()));
    }
    catch (...)
    {
        std::abort();
    }
}

Report::Report(std::ostream& output, std::ostream& errors) : m_output(&output), m_errors(errors)
{
    g_failure = m_failure;
}

void Report::NoteSaved()
{
    m_failure = ExitStatus::NotReported;
    g_failure = m_failure;
}

Report::~Report() = default;

void Report::SetSubject(const std::string& verb, const std::string& file)
{
    m_verb = verb;
    m_file = file;
}

void Report::AddLine(std::string line)
{
    line += '\n';
    AddBytes(line);
}

void Report::AddBytes(const std::string& bytes)
{
    if (!m_isJson)
    {
        Progress::End();
        *m_output << bytes;
    }
}

void Report::AddFileLines(const std::string& lines)
{
    AddBytes(IsTerminal(*m_output) ? OnItsLines(lines) : lines);
}

void Report::AddJson(Json result)
{
    if (m_isJson)
    {
        m_results.push_back(std::move(result));
    }
}

void Report::Complain(const std::string& message)
{
    if (m_isJson)
    {
        m_messages.push_back(message);
        return;
    }
    Progress::End();
    const std::string name = "kxconfig:";
    m_errors << (ShowsColors(m_errors, m_color) ? Colored(Color::Bad, name) : name) + " " +
                    OnOneLine(message) + "\n";
}

std::string Report::Paint(Color color, const std::string& text) const
{
    return !m_isJson && ShowsColors(*m_output, m_color) ? Colored(color, text) : text;
}

bool Report::HasTerminalForErrors() const
{
    return IsTerminal(m_errors);
}

std::ostream& Report::GiveOutput()
{
    Progress::End();
    std::ostream& output = *m_output;
    m_output = &m_errors;
    return output;
}

ExitStatus Report::Finish(ExitStatus status)
{
    Progress::End();
    if (m_isJson)
    {
        WriteAnswer(status);
    }
    if (m_output->flush())
    {
        return status;
    }
    m_isJson = false; // no one could read it
    Complain("cannot write to standard output");
    return m_failure;
}

ExitStatus Report::FinishOutOfMemory()
{
    std::vector<Json>().swap(m_results); // there may be no memory to write them
    Complain("out of memory");
    return Finish(m_failure);
}

void Report::WriteAnswer(ExitStatus status)
{
    Json answer = {{"file", OrNull(m_file)},
                   {"verb", OrNull(m_verb)},
                   {"status", static_cast<int>(status)},
                   {"results", Json::array()},
                   {"messages", m_messages}};
    answer["results"].get_ref<Json::array_t&>().swap(m_results);
    // Bytes that are not UTF-8 become U+FFFD, so that any parser accepts the object.
    *m_output << answer.dump(2, ' ', false, Json::error_handler_t::replace) << '\n';
}
