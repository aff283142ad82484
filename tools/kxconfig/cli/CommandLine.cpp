#include "cli/CommandLine.h"

#include "cli/LogMaskChoice.h"
#include "cli/Usage.h"
#include "commands/Check.h"
#include "commands/Explain.h"
#include "commands/Find.h"
#include "commands/Get.h"
#include "commands/Keys.h"
#include "commands/Set.h"
#include "output/Failure.h"
#include "output/Quoting.h"
#include "output/Report.h"

#include "LogMask.h"

#include <CLI/CLI.hpp>
#include <nlohmann/json.hpp>

#include <algorithm>
#include <functional>
#include <sstream>

namespace
{

/** What the user asked for. */
struct Request
{
    GetArguments get;
    SetArguments set;
    ExplainArguments explain;
    CheckArguments check;
    KeysArguments keys;
    FindArguments find;
    std::string logMask;
    bool trace = false;
    std::string file;                           ///< of the command
    std::function<ExitStatus(Report&)> command; ///< empty if no command was named
};

Failure BadUsage(const std::string& why)
{
    return {ExitStatus::BadUsage, why + " (kxconfig --help shows the usage)"};
}

/** To the engine "-" is standard input or output; a user who writes it here means something else.
 */
std::string StandardStreamError(const std::string& file)
{
    return file == "-" ? "\"-\" is no file; name one" : std::string();
}

/** An empty name would stand for the file that was loaded, and overwrite it. */
std::string NewFileError(const std::string& file)
{
    return file.empty() ? "\"\" is no file; name one" : StandardStreamError(file);
}

/** A command with the argument FILE, which @p run carries out. */
template <class Arguments>
CLI::App* AddCommand(CLI::App& app, const char* name, const char* description,
                     ExitStatus (*run)(const Arguments&, Report&), Arguments& arguments,
                     Request& request)
{
    CLI::App* const command = app.add_subcommand(name, description);
    command->add_option("FILE", arguments.file, "an XML file")
        ->required()
        ->check(CLI::Validator(StandardStreamError, ""));
    command->callback(
        [run, &arguments, &request]
        {
            request.file = arguments.file;
            request.command = [run, &arguments](Report& report) { return run(arguments, report); };
        });
    return command;
}

void AddKey(CLI::App& command, std::string& key)
{
    command.add_option("KEY", key, "a key path: root.element@attribute=value.element")->required();
}

void AddGet(CLI::App& app, Request& request)
{
    CLI::App* const get = AddCommand(app, "get", "print the value or values under a key path", Get,
                                     request.get, request);
    AddKey(*get, request.get.key);
}

void AddSet(CLI::App& app, Request& request)
{
    SetArguments& arguments = request.set;
    CLI::App* const set =
        AddCommand(app, "set", "replace the text under a key path, print what changed, and save",
                   Set, arguments, request);
    AddKey(*set, arguments.key);
    set->add_option("VALUE", arguments.value, "the new text, as XML: write & as &amp;")->required();
    set->add_flag("--dry-run", arguments.dryRun, "show what would change and save nothing");
    set->add_option("--output", arguments.output, "save to this file instead")
        ->type_name("FILE")
        ->check(CLI::Validator(NewFileError, ""));
}

void AddExplain(CLI::App& app, Request& request)
{
    CLI::App* const explain =
        AddCommand(app, "explain", "tell level by level why a key path gives what it gives",
                   Explain, request.explain, request);
    AddKey(*explain, request.explain.key);
    explain->add_flag("--set", request.explain.isUpdate,
                      "tell what an update would reach; changes nothing");
}

void AddCheck(CLI::App& app, Request& request)
{
    AddCommand(app, "check", "warn of what will surprise somebody who looks values up", Check,
               request.check, request)
        ->add_option("KEY", request.check.keys, "key paths to check instead of the file's own");
}

void AddKeys(CLI::App& app, Request& request)
{
    AddCommand(app, "keys", "print every key path under which the file holds a value", Keys,
               request.keys, request);
}

void AddFind(CLI::App& app, Request& request)
{
    AddCommand(app, "find", "print the nodes that an XPath expression selects, or its value", Find,
               request.find, request)
        ->add_option("XPATH", request.find.expression, "an XPath 1.0 expression")
        ->required();
}

void AddOptions(CLI::App& app, Request& request)
{
    app.set_version_flag("--version", "kxconfig " KX_VERSION);
    app.add_flag("--json", "answer with one JSON object");
    CLI::Option* const mask =
        app.add_option("--log-mask", request.logMask, std::string("log mask: ") + g_LogMaskHelp)
            ->type_name("MASK")
            ->check(CLI::Validator(LogMaskError, ""));
    app.add_flag("--trace", request.trace, "show all log records: --log-mask all")->excludes(mask);
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

CommandLine::CommandLine() : m_parser(std::make_unique<Parser>())
{
    CLI::App& app = m_parser->app;
    Request& request = m_parser->request;
    app.footer(HelpFooter());
    app.require_subcommand(0, 1); // so that an unknown one is named
    app.fallthrough();
    AddOptions(app, request);
    AddGet(app, request);
    AddSet(app, request);
    AddExplain(app, request);
    AddCheck(app, request);
    AddKeys(app, request);
    AddFind(app, request);
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
        throw BadUsage("a command is required: get, set, explain, check, keys or find");
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
