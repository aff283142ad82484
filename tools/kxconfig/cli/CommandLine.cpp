#include "cli/CommandLine.h"

#include "cli/Options.h"
#include "cli/Usage.h"
#include "output/Failure.h"
#include "output/Quoting.h"
#include "output/Report.h"

#include <CLI/CLI.hpp>
#include <nlohmann/json.hpp>

#include <algorithm>
#include <sstream>

namespace
{

Failure BadUsage(const std::string& why)
{
    return {ExitStatus::BadUsage, why + " (kxconfig --help shows the usage)"};
}

/** @return the arguments that can be options: those before "--". */
std::vector<std::string> PossibleOptions(const std::vector<std::string>& arguments)
{
    return {arguments.begin(), std::find(arguments.begin(), arguments.end(), "--")};
}

bool IsFlag(const CLI::App& app, const std::string& name)
{
    const CLI::Option* const option = app.get_option_no_throw(name);
    return option != nullptr && option->get_items_expected_max() == 0;
}

bool IsFlagOfAny(const CLI::App& app, const std::string& name)
{
    const std::vector<const CLI::App*> commands = app.get_subcommands(nullptr);
    return IsFlag(app, name) ||
           std::any_of(commands.begin(), commands.end(),
                       [&](const CLI::App* command) { return IsFlag(*command, name); });
}

/** CLI11 would run "--dry-run=no" in earnest, and accept "--help=no". */
void RefuseFlagsWithValues(const CLI::App& app, const std::vector<std::string>& arguments)
{
    for (const std::string& word : PossibleOptions(arguments))
    {
        const std::string name = word.substr(0, word.find('='));
        if (name != word && IsFlagOfAny(app, name))
        {
            throw CLI::ArgumentMismatch(name + " takes no value");
        }
    }
}

/** Found ahead of all else, since bad usage is reported in JSON, too. */
bool AsksForJson(const std::vector<std::string>& arguments)
{
    const std::vector<std::string> options = PossibleOptions(arguments);
    return std::find(options.begin(), options.end(), "--json") != options.end();
}

/** @return the word in the place of a command; empty if a command was named. */
std::string UnknownCommand(const CLI::App& app)
{
    const std::vector<std::string> rest = app.remaining();
    const bool named = !app.get_subcommands().empty() || rest.empty() || rest.front()[0] == '-';
    return named ? "" : rest.front();
}

/** The answer to --help and --version. */
struct Information
{
    std::string text;

    std::string Line() const { return text; }
    Json InJson() const { return {{"text", text}}; }
};

/** @throws Failure unless @p error only means that the user asked for information. */
void AnswerOrRefuse(const CLI::App& app, const CLI::ParseError& error, Report& report)
{
    if (error.get_exit_code() != 0)
    {
        const std::string unknown = UnknownCommand(app);
        throw BadUsage(unknown.empty() ? error.what() : "unknown command " + Quoted(unknown));
    }
    std::ostringstream text;
    app.exit(error, text, text);
    report.Add(Information{text.str().substr(0, text.str().size() - 1)});
}

} // namespace

struct CommandLine::Parser
{
    Request request;
    CLI::App app{"Reads and changes values of XML configuration files by key path.", "kxconfig"};
};

CommandLine::CommandLine(std::istream& input) : m_parser(std::make_unique<Parser>())
{
    m_parser->request.input = &input;
    CLI::App& app = m_parser->app;
    app.footer(HelpFooter());
    app.require_subcommand(0, 1); // so that an unknown one is named
    app.fallthrough();
    AddOptions(app, m_parser->request);
}

CommandLine::~CommandLine() = default;

bool CommandLine::Parse(const std::vector<std::string>& arguments, Report& report)
{
    CLI::App& app = m_parser->app;
    if (arguments == std::vector<std::string>{"--man"})
    {
        report.AddLine(ManPage(app));
        return false;
    }
    if (AsksForJson(arguments))
    {
        report.AnswerInJson();
    }
    try
    {
        RefuseFlagsWithValues(app, arguments);
        app.parse(std::vector<std::string>(arguments.rbegin(), arguments.rend()));
    }
    catch (const CLI::ParseError& error)
    {
        AnswerOrRefuse(app, error, report);
        return false;
    }
    if (!m_parser->request.command)
    {
        throw BadUsage("a command is required: get, set, explain, check, keys, find or diff");
    }
    report.SetSubject(app.get_subcommands().front()->get_name(), m_parser->request.file);
    return true;
}

std::string CommandLine::LogMask() const
{
    return m_parser->request.trace ? "all" : m_parser->request.logMask;
}

ExitStatus CommandLine::RunCommand(Report& report) const
{
    return m_parser->request.command(report);
}
