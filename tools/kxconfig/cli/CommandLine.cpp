#include "cli/CommandLine.h"

#include "cli/Completion.h"
#include "cli/Options.h"
#include "cli/Usage.h"
#include "output/Failure.h"
#include "output/Quoting.h"
#include "output/Report.h"
#include "output/Terminal.h"

#include <CLI/CLI.hpp>
#include <nlohmann/json.hpp>

#include <algorithm>
#include <utility>

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

/** Gives --backup the value that it may lack: CLI11 would take the next argument. */
std::vector<std::string> WithBackupSuffix(std::vector<std::string> arguments)
{
    const auto end = std::find(arguments.begin(), arguments.end(), "--");
    std::replace(arguments.begin(), end, std::string("--backup"), std::string("--backup=~"));
    return arguments;
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

ColorChoice ColorChoiceOf(const std::string& when)
{
    return when == "auto"     ? ColorChoice::Auto
           : when == "always" ? ColorChoice::Always
                              : ColorChoice::Never;
}

/** The answer to --help and --version. */
struct Information
{
    std::string text;

    std::string Line() const { return text; }
    Json InJson() const { return {{"text", text}}; }
};

/** @return the command that was named; null if none was. */
const CLI::App* NamedCommand(const CLI::App& app)
{
    const std::vector<CLI::App*> named = app.get_subcommands();
    return named.empty() ? nullptr : named.front();
}

/** @return @p argument as it is typed into a shell. */
std::string InShell(const std::string& argument)
{
    const char* const plain =
        "0123456789abcdefghijklmnopqrstuvwxyzABCDEFGHIJKLMNOPQRSTUVWXYZ_.,:=@/+-";
    if (!argument.empty() && argument.find_first_not_of(plain) == std::string::npos)
    {
        return argument;
    }
    std::string quoted = "'";
    for (const char c : argument)
    {
        quoted += c == '\'' ? "'\\''" : std::string(1, c);
    }
    return quoted + "'";
}

/** @return the command line with "--" in front of @p dashed, which a dash makes an option. */
std::string WithSeparator(const std::vector<std::string>& arguments, const std::string& dashed)
{
    std::string line = "kxconfig";
    const auto end = std::find(arguments.begin(), arguments.end(), dashed);
    for (auto argument = arguments.begin(); argument != end; ++argument)
    {
        line += " " + InShell(*argument);
    }
    line += " --";
    for (auto argument = end; argument != arguments.end(); ++argument)
    {
        line += " " + InShell(*argument);
    }
    return line;
}

/** VALUE is not required beside --value-from. */
bool IsRequired(const CLI::Option& option)
{
    return option.get_positional() && (option.get_required() || option.get_name(true) == "VALUE");
}

bool LacksArgument(const CLI::App& command)
{
    const std::vector<const CLI::Option*> options = command.get_options();
    return std::any_of(options.begin(), options.end(),
                       [](const CLI::Option* option)
                       { return IsRequired(*option) && option->empty(); });
}

/** @return what is wrong with arguments that no option and no argument takes, and what to type. */
std::string SurplusError(const CLI::App& command, const std::string& surplus,
                         const std::vector<std::string>& arguments)
{
    const bool isDashed = surplus.size() > 1 && surplus[0] == '-';
    if (isDashed && LacksArgument(command))
    {
        return Quoted(surplus) +
               " is not an option; for an argument that starts with a dash, use --: " +
               WithSeparator(arguments, surplus);
    }
    if (isDashed)
    {
        return "unknown option " + Quoted(surplus) + "; kxconfig " + command.get_name() +
               " --help lists the options";
    }
    return "surplus argument " + Quoted(surplus) + "; usage: kxconfig " + command.get_name() +
           " [options]" + Arguments(command) + "; an argument with spaces needs quotes";
}

/** @return the names of all commands, as "get, set or find". */
std::string CommandNames(const CLI::App& app)
{
    const std::vector<const CLI::App*> commands = app.get_subcommands(nullptr);
    std::string names;
    for (const CLI::App* const command : commands)
    {
        const bool isFirst = command == commands.front();
        const bool isLast = command == commands.back();
        names += (isFirst ? "" : isLast ? " or " : ", ") + command->get_name();
    }
    return names;
}

bool IsError(const CLI::ParseError& error, CLI::ExitCodes code)
{
    return error.get_exit_code() == static_cast<int>(code);
}

Failure BadUsage(const CLI::App& app, const CLI::ParseError& error,
                 const std::vector<std::string>& arguments)
{
    const std::string unknown = UnknownCommand(app);
    if (!unknown.empty())
    {
        return BadUsage("unknown command " + Quoted(unknown));
    }
    const CLI::App* const command = NamedCommand(app);
    const std::vector<std::string> surplus = app.remaining(true);
    const bool isAboutNumber = IsError(error, CLI::ExitCodes::ExtrasError) ||
                               IsError(error, CLI::ExitCodes::RequiredError);
    return command == nullptr || surplus.empty() || !isAboutNumber
               ? BadUsage(error.what())
               : BadUsage(SurplusError(*command, surplus.front(), arguments));
}

/** @throws Failure unless @p error only means that the user asked for information. */
void AnswerOrRefuse(const CLI::App& app, const CLI::ParseError& error,
                    const std::vector<std::string>& arguments, Report& report)
{
    if (error.get_exit_code() != 0)
    {
        throw BadUsage(app, error, arguments);
    }
    const bool isHelp = error.get_name() == "CallForHelp";
    const std::string text =
        isHelp ? Help(app, NamedCommand(app), OutputWidth()) : error.what() + std::string("\n");
    report.Add(Information{text.substr(0, text.size() - 1)});
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
    if (!arguments.empty() && arguments.front() == "--complete")
    {
        report.AddBytes(Complete(app, {arguments.begin() + 1, arguments.end()}).Lines());
        return false;
    }
    if (AsksForJson(arguments))
    {
        report.AnswerInJson();
    }
    try
    {
        RefuseFlagsWithValues(app, arguments);
        std::vector<std::string> words = WithBackupSuffix(arguments);
        std::reverse(words.begin(), words.end()); // as CLI11 takes them
        app.parse(std::move(words));
    }
    catch (const CLI::ParseError& error)
    {
        AnswerOrRefuse(app, error, arguments, report);
        return false;
    }
    if (!m_parser->request.command)
    {
        throw BadUsage("a command is required: " + CommandNames(app));
    }
    report.ChooseColors(ColorChoiceOf(m_parser->request.color));
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
