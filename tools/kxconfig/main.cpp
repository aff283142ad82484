#include "cli/Usage.h"
#include "commands/Commands.h"
#include "file/Document.h"
#include "output/Output.h"

#include "KxLog.h"
#include "LogMask.h"

#include <CLI/CLI.hpp>

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <functional>
#include <new>
#include <sstream>

namespace
{

const char* const kSeeHelp = " (kxconfig --help shows the usage)";

std::string CheckLogMask(const std::string& text)
{
    unsigned int mask = 0;
    return ParseLogMask(text.c_str(), mask)
               ? std::string()
               : "\"" + text + "\" is not a log mask; it is " + g_LogMaskHelp;
}

/** The library reports to kxconfig, and kxconfig to the user: records are for those who ask. */
void SetLogMask(const std::string& mask)
{
    const char* const environment = std::getenv("KX_LOG_MASK");
    if (!mask.empty())
    {
        ParseLogMask(mask.c_str(), g_LumLogParams.xmlConfigParserMask);
    }
    else if (environment == nullptr || !CheckLogMask(environment).empty())
    {
        g_LumLogParams.xmlConfigParserMask = 0;
    }
}

/** To the engine "-" is standard input or output; whoever writes it here means something else. */
std::string RefuseStandardStreams(const std::string& file)
{
    return file == "-" ? "\"-\" is no file; name one" : std::string();
}

/** An empty name would stand for the file that was loaded, and overwrite it. */
std::string RefuseNoFile(const std::string& file)
{
    return file.empty() ? "\"\" is no file; name one" : RefuseStandardStreams(file);
}

/** A subcommand whose first argument is a file. */
CLI::App* AddFileCommand(CLI::App& app, const char* name, const char* description,
                         std::string& file)
{
    CLI::App* const command = app.add_subcommand(name, description);
    command->add_option("FILE", file, "an XML file")
        ->required()
        ->check(CLI::Validator(RefuseStandardStreams, ""));
    return command;
}

/** A subcommand whose first two arguments are a file and a key. */
CLI::App* AddKeyCommand(CLI::App& app, const char* name, const char* description,
                        SetArguments& arguments)
{
    CLI::App* const command = AddFileCommand(app, name, description, arguments.file);
    command->add_option("KEY", arguments.key, "a key path: root.element@attribute=value.element")
        ->required();
    return command;
}

/** @return the word that stands where a command is expected; empty if a command was named. */
std::string UnknownCommand(const CLI::App& app)
{
    const std::vector<std::string> rest = app.remaining();
    const bool named = !app.get_subcommands().empty() || rest.empty() || rest.front()[0] == '-';
    return named ? "" : rest.front();
}

ExitStatus ReportUsage(const CLI::App& app, const CLI::ParseError& error)
{
    if (error.get_exit_code() == 0)
    {
        std::ostringstream text; // --help, --version
        app.exit(error, text, text);
        const std::string lines = text.str().substr(0, text.str().size() - 1);
        Print(lines, {{"text", lines}});
        return ExitStatus::Done;
    }
    const std::string unknown = UnknownCommand(app);
    Complain((unknown.empty() ? error.what() : "unknown command " + Quoted(unknown)) + kSeeHelp);
    return ExitStatus::BadUsage;
}

/** What the user asked for. */
struct Request
{
    SetArguments arguments; // the other commands use the first, or the first two
    std::vector<std::string> keys;
    std::string expression;
    std::string logMask;
    bool update = false;
    bool trace = false;
    std::function<ExitStatus()> command; ///< empty if no command was named
};

void AddGetAndSet(CLI::App& app, Request& request)
{
    SetArguments& arguments = request.arguments;
    AddKeyCommand(app, "get", "print the value or values under a key path", arguments)
        ->callback([&] { request.command = [&] { return Get(arguments.file, arguments.key); }; });

    CLI::App* const set = AddKeyCommand(
        app, "set", "replace the text under a key path, print what changed, and save", arguments);
    set->add_option("VALUE", arguments.value, "the new text, as XML: write & as &amp;")->required();
    set->add_flag("--dry-run", arguments.dryRun, "show what would change and save nothing");
    set->add_option("--output", arguments.output, "save to this file instead")
        ->type_name("FILE")
        ->check(CLI::Validator(RefuseNoFile, ""));
    set->callback([&] { request.command = [&] { return Set(arguments); }; });
}

void AddExplainAndCheck(CLI::App& app, Request& request)
{
    SetArguments& arguments = request.arguments;
    CLI::App* const explain = AddKeyCommand(
        app, "explain", "tell level by level why a key path gives what it gives", arguments);
    explain->add_flag("--set", request.update, "tell what an update would reach; changes nothing");
    explain->callback(
        [&] {
            request.command = [&]
            { return Explain(arguments.file, arguments.key, request.update); };
        });

    CLI::App* const check = AddFileCommand(
        app, "check", "warn of what will surprise somebody who looks values up", arguments.file);
    check->add_option("KEY", request.keys, "key paths to check instead of the file's own");
    check->callback([&] { request.command = [&] { return Check(arguments.file, request.keys); }; });
}

void AddKeysAndFind(CLI::App& app, Request& request)
{
    const std::string& file = request.arguments.file;
    AddFileCommand(app, "keys", "print every key path under which the file holds a value",
                   request.arguments.file)
        ->callback([&] { request.command = [&] { return Keys(file); }; });

    CLI::App* const find = AddFileCommand(
        app, "find", "print the nodes that an XPath expression selects, or its value",
        request.arguments.file);
    find->add_option("XPATH", request.expression, "an XPath 1.0 expression")->required();
    find->callback([&] { request.command = [&] { return Find(file, request.expression); }; });
}

void AddOptions(CLI::App& app, Request& request)
{
    app.set_version_flag("--version", "kxconfig " KX_VERSION);
    app.add_flag("--json", "answer with one JSON object");
    CLI::Option* const mask =
        app.add_option("--log-mask", request.logMask, std::string("log mask: ") + g_LogMaskHelp)
            ->type_name("MASK")
            ->check(CLI::Validator(CheckLogMask, ""));
    app.add_flag("--trace", request.trace, "show all log records: --log-mask all")->excludes(mask);
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

/** CLI11 would run "--dry-run=no" in earnest, and find no fault with "--help=no". */
void RefuseFlagsWithValues(const CLI::App& app, int argc, char** argv)
{
    for (int i = 1; i < argc && std::strcmp(argv[i], "--") != 0; ++i)
    {
        const std::string word = argv[i];
        const std::string name = word.substr(0, word.find('='));
        if (name != word && IsFlagOfAny(app, name))
        {
            throw CLI::ArgumentMismatch(name + " takes no value");
        }
    }
}

/** Found ahead of all else, since what is wrong with the usage is told in JSON too. */
bool AsksForJson(int argc, char** argv)
{
    for (int i = 1; i < argc && std::strcmp(argv[i], "--") != 0; ++i)
    {
        if (std::strcmp(argv[i], "--json") == 0)
        {
            return true;
        }
    }
    return false;
}

ExitStatus RunCommand(const CLI::App& app, const Request& request)
{
    if (!request.command)
    {
        Complain("a command is required: get, set, explain, check, keys or find" +
                 std::string(kSeeHelp));
        return ExitStatus::BadUsage;
    }
    AnswerFor(app.get_subcommands().front()->get_name(), request.arguments.file);
    SetLogMask(request.trace ? "all" : request.logMask);
    PrepareEngine();
    return request.command();
}

ExitStatus Run(int argc, char** argv)
{
    Request request;
    CLI::App app("Reads and changes values of XML configuration files by key path.", "kxconfig");
    app.footer(HelpFooter());
    app.require_subcommand(0, 1); // so that an unknown one is named
    app.fallthrough();
    AddOptions(app, request);
    AddGetAndSet(app, request);
    AddExplainAndCheck(app, request);
    AddKeysAndFind(app, request);
    if (argc == 2 && std::strcmp(argv[1], "--man") == 0)
    {
        PrintLine(ManPage(app));
        return ExitStatus::Done;
    }
    if (AsksForJson(argc, argv))
    {
        AnswerInJson();
    }
    try
    {
        RefuseFlagsWithValues(app, argc, argv);
        app.parse(argc, argv);
    }
    catch (const CLI::ParseError& error)
    {
        return ReportUsage(app, error);
    }
    return RunCommand(app, request);
}

} // namespace

int main(int argc, char** argv)
{
    try
    {
        return static_cast<int>(Finish(Run(argc, argv)));
    }
    catch (const std::bad_alloc&)
    {
        return static_cast<int>(FinishOutOfMemory());
    }
}
