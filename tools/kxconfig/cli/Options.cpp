#include "cli/Options.h"

#include "cli/LogMaskChoice.h"
#include "file/Engine.h"
#include "output/Quoting.h"

#include "LogMask.h"

#include <CLI/CLI.hpp>

namespace
{

const int g_longestWait = 1000000; // seconds

/** To the engine "-" is standard input or output; a user who writes it here means something else.
 */
std::string StandardStreamError(const std::string& file)
{
    return file == "-" ? "\"-\" is not a file name" : std::string();
}

/** An empty name would stand for the file that was loaded, and overwrite it. */
std::string NewFileError(const std::string& file)
{
    return file.empty() ? "\"\" is not a file name" : "";
}

std::string ColorError(const std::string& when)
{
    const bool isKnown = when == "auto" || when == "always" || when == "never";
    return isKnown ? "" : Quoted(when) + " is not auto, always or never";
}

/** A command with the argument FILE, which @p run carries out. */
template <class Arguments>
CLI::App* AddCommand(CLI::App& app, const char* name, const char* description,
                     ExitStatus (*run)(const Arguments&, Report&), Arguments& arguments,
                     Request& request)
{
    CLI::App* const command = app.add_subcommand(name, description);
    command->add_option("FILE", arguments.file, "an XML file")->required();
    command->callback(
        [run, &arguments, &request]
        {
            request.file = arguments.file;
            request.command = [run, &arguments](Report& report) { return run(arguments, report); };
        });
    return command;
}

/** The same of a command that changes the file, or needs its name. */
template <class Arguments>
CLI::App* AddFileCommand(CLI::App& app, const char* name, const char* description,
                         ExitStatus (*run)(const Arguments&, Report&), Arguments& arguments,
                         Request& request)
{
    CLI::App* const command = AddCommand(app, name, description, run, arguments, request);
    command->get_option("FILE")->check(CLI::Validator(StandardStreamError, ""));
    return command;
}

/** The same of a command that only reads: the file "-" is standard input. */
template <class Arguments>
CLI::App* AddReader(CLI::App& app, const char* name, const char* description,
                    ExitStatus (*run)(const Arguments&, Report&), Arguments& arguments,
                    Request& request)
{
    arguments.input = request.input;
    CLI::App* const command = AddCommand(app, name, description, run, arguments, request);
    command->get_option("FILE")->description("an XML file; - is standard input");
    return command;
}

void AddKey(CLI::App& command, std::string& key)
{
    command.add_option("KEY", key, "a key path: root.element@attribute=value.element")->required();
}

void AddGet(CLI::App& app, Request& request)
{
    GetArguments& arguments = request.get;
    CLI::App* const get =
        AddReader(app, "get", "print the value or values under key paths", Get, arguments, request);
    get->add_option("KEY", arguments.keys, "a key path: root.element@attribute=value.element")
        ->required();
    get->add_option("--default", arguments.defaultValue, "the value of a key that has none")
        ->type_name("TEXT");
    get->add_flag("-z,--null", arguments.endWithNul, "end each value with NUL, not a line end");
}

void AddSet(CLI::App& app, Request& request)
{
    SetArguments& arguments = request.set;
    CLI::App* const set = AddFileCommand(
        app, "set", "replace the text under a key path, print what changed, and save", Set,
        arguments, request);
    AddKey(*set, arguments.key);
    set->add_option("VALUE", arguments.value, "the new text, as XML: write & as &amp;")->required();
    set->add_flag("--dry-run", arguments.dryRun, "show what would change and save nothing");
    set->add_option(
           "--output", arguments.output,
           "save to this file instead; -: to standard output, and report to standard error")
        ->type_name("FILE")
        ->check(CLI::Validator(NewFileError, ""));
    set->add_option("--wait", arguments.waitSeconds,
                    "wait this long while another process has the file locked; default: 10")
        ->type_name("SECONDS")
        ->check(CLI::Validator(CLI::Range(0, g_longestWait)).description(""));
    set->add_flag("--drop-attributes", arguments.dropAttributes,
                  "save even if the owner, the ACL or the like would be lost");
}

void AddExplain(CLI::App& app, Request& request)
{
    CLI::App* const explain =
        AddReader(app, "explain", "explain level by level what a lookup of a key path finds",
                  Explain, request.explain, request);
    AddKey(*explain, request.explain.key);
    CLI::Option* const update = explain->add_flag(
        "--set", request.explain.isUpdate, "explain what an update would reach; changes nothing");
    explain->add_option("VALUE", request.ignoredValue, "with --set: ignored, as in a call of set")
        ->needs(update);
}

std::string KindError(const std::string& name)
{
    return KindNamed(name) ? std::string()
                           : "\"" + name + "\" is not a kind; kxconfig check --kinds lists them";
}

/** An option that takes one kind and can be repeated. */
void AddKinds(CLI::App& command, const char* name, std::set<Kind>& kinds, const char* description)
{
    command
        .add_option_function<std::vector<std::string>>(
            name,
            [&kinds](const std::vector<std::string>& names)
            {
                for (const std::string& kind : names)
                {
                    kinds.insert(*KindNamed(kind));
                }
            },
            description)
        ->expected(1)
        ->take_all()
        ->allow_extra_args(false)
        ->type_name("KIND")
        ->check(CLI::Validator(KindError, ""));
}

void AddCheck(CLI::App& app, Request& request)
{
    Selection& selection = request.check.selection;
    CLI::App* const check = AddFileCommand(app, "check", "report pitfalls for lookups and updates",
                                           Check, request.check, request);
    check->add_option("KEY", request.check.keys, "key paths to check instead of the whole file");
    check->add_flag("--notes", selection.notes, "also print notes, which are not warnings");
    AddKinds(*check, "--only", selection.only, "print this kind only, be it a warning or a note");
    AddKinds(*check, "--ignore", selection.ignored, "do not print this kind");
    check->set_version_flag("--kinds", KindList(), "list the kinds of warnings and notes");
}

void AddKeys(CLI::App& app, Request& request)
{
    AddReader(app, "keys", "print every key path that has a value in the file", Keys, request.keys,
              request)
        ->add_flag("--all", request.keys.all, "print all values of a key, not only the first ten");
}

void AddFind(CLI::App& app, Request& request)
{
    AddReader(app, "find", "print the nodes that an XPath expression selects, or its value", Find,
              request.find, request)
        ->add_option("XPATH", request.find.expression, "an XPath 1.0 expression")
        ->required();
}

void AddDiff(CLI::App& app, Request& request)
{
    DiffArguments& arguments = request.diff;
    const auto onlyOneInput = [&arguments](const std::string& other)
    {
        return other == "-" && arguments.file == "-" ? "only one of two files can be standard input"
                                                     : std::string();
    };
    AddReader(app, "diff", "compare two files key by key", Diff, arguments, request)
        ->add_option("OTHER", arguments.other, "the file to compare with")
        ->required()
        ->check(CLI::Validator(onlyOneInput, ""));
}

void AddGeneralOptions(CLI::App& app, Request& request)
{
    app.set_version_flag(
        "--version", [] { return "kxconfig " KX_VERSION "\nlibxml2 " + EngineVersion(); },
        "print the versions of kxconfig and of the running libxml2");
    app.add_flag("--json", "print one JSON object");
    app.add_option(
           "--color", request.color,
           "color the output: auto (on a terminal, unless NO_COLOR is set), always or never")
        ->type_name("WHEN")
        ->check(CLI::Validator(ColorError, ""));
    CLI::Option* const mask =
        app.add_option("--log-mask", request.logMask, std::string("log mask: ") + g_LogMaskHelp)
            ->type_name("MASK")
            ->check(CLI::Validator(LogMaskError, ""));
    app.add_flag("--trace", request.trace, "show all log records: --log-mask all")->excludes(mask);
}

} // namespace

void AddOptions(CLI::App& app, Request& request)
{
    AddGeneralOptions(app, request);
    AddGet(app, request);
    AddSet(app, request);
    AddExplain(app, request);
    AddCheck(app, request);
    AddKeys(app, request);
    AddFind(app, request);
    AddDiff(app, request);
}
