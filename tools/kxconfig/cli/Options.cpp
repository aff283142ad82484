#include "cli/Options.h"

#include "cli/LogMaskChoice.h"
#include "file/Engine.h"
#include "output/Quoting.h"

#include "LogMask.h"

#include <CLI/CLI.hpp>

namespace
{

const int kLongestWait = 1000000; // seconds
const char* const kKeyHelp = "a key path: root.element@attribute=value.element";

// The validators return "" for a valid value, as the interface of CLI::Validator requires.

/** To the engine "-" is standard input or output; a user who writes it here means something else.
 */
std::string StandardStreamError(const std::string& file)
{
    return file == "-" ? "\"-\" is not a file name" : std::string();
}

std::string EmptyNameError(const std::string& file)
{
    return file.empty() ? "\"\" is not a file name" : "";
}

std::string ColorError(const std::string& when)
{
    const bool isKnown = when == "auto" || when == "always" || when == "never";
    return isKnown ? "" : Quoted(when) + " is not auto, always or never";
}

std::string SuffixError(const std::string& suffix)
{
    const bool isSuffix = !suffix.empty() && suffix.find('/') == std::string::npos;
    return isSuffix ? "" : "\"" + suffix + "\" is not a suffix of a file name";
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
    command.add_option("KEY", key, kKeyHelp)->required();
}

void AddGet(CLI::App& app, Request& request)
{
    GetArguments& arguments = request.get;
    CLI::App* const get =
        AddReader(app, "get", "print the value or values under key paths", Get, arguments, request);
    get->add_option("KEY", arguments.keys, kKeyHelp)->required();
    get->add_option("--default", arguments.defaultValue, "the value of a key that has none")
        ->type_name("TEXT");
    get->add_flag("-z,--null", arguments.endWithNul, "end each value with NUL, not a line end");
}

/** The options of all commands that change a file. */
void AddSaving(CLI::App& command, SaveArguments& arguments)
{
    command.add_flag("--dry-run", arguments.dryRun, "show what would change and save nothing");
    command
        .add_option(
            "--output", arguments.output,
            "save to this file instead; -: to standard output, and report to standard error")
        ->type_name("FILE")
        ->check(CLI::Validator(EmptyNameError, "")); // "" would overwrite the file that was loaded
    command
        .add_option("--wait", arguments.waitSeconds,
                    "wait this long while another process has the file locked; default: 10")
        ->type_name("SECONDS")
        ->check(CLI::Validator(CLI::Range(0, kLongestWait)).description(""));
    command.add_flag("--drop-attributes", arguments.dropAttributes,
                     "save even if the owner, the ACL or the like would be lost");
    command
        .add_option("--expect", arguments.expected,
                    "save only if exactly this many elements or attributes change")
        ->type_name("N")
        ->check(CLI::Validator(CLI::NonNegativeNumber).description(""));
    command.add_flag("--quiet", arguments.quiet, "print no changes");
    command.add_flag("--diff", arguments.diff, "print a unified diff of the file");
    command
        .add_option("--backup", arguments.backupSuffix,
                    "keep the file that is replaced under its name and SUFFIX; default: ~")
        ->type_name("SUFFIX")
        ->expected(0, 1)
        ->check(CLI::Validator(SuffixError, ""));
}

void AddSet(CLI::App& app, Request& request)
{
    SetArguments& arguments = request.set;
    arguments.input = request.input;
    CLI::App* const set = AddFileCommand(
        app, "set",
        "replace the text under key paths, print what changed, and save. All keys or "
        "none are updated. An update can reach more elements than get finds",
        Set, arguments, request);
    AddKey(*set, arguments.key);
    set->add_option("VALUE", arguments.values,
                    "the new text, as XML: write & as &amp;. More keys, each with its value, can "
                    "follow")
        ->expected(1, -1) // with a minimum of 0, "--" in front of it would end the command
        ->type_name("");
    set->add_option("--value-from", arguments.valueFile,
                    "read VALUE from this file, without the last line end; -: standard input")
        ->type_name("FILE")
        ->check(CLI::Validator(EmptyNameError, ""));
    CLI::Option* const create = set->add_flag(
        "--create", arguments.create, "create missing elements; KEY must have no condition");
    CLI::Option* const node = set->add_flag(
        "--node", arguments.byNode,
        "KEY is an XPath expression: replace the text of the one element or attribute it selects");
    node->excludes(create); // by its name it would be looked up without regard to a lack of memory
    set->add_flag("--all", arguments.all,
                  "with --node: change every node that the expression selects")
        ->needs(node);
    AddSaving(*set, arguments.saving);
}

void AddExpression(CLI::App& command, std::string& expression, bool& all)
{
    command.add_option("XPATH", expression, "an XPath 1.0 expression that selects one node")
        ->required();
    command.add_flag("--all", all, "change all nodes that XPATH selects, not exactly one");
}

void AddAdd(CLI::App& app, Request& request)
{
    AddArguments& arguments = request.add;
    CLI::App* const add = AddFileCommand(
        app, "add", "add a child to the element that XPATH selects, print it, and save", Add,
        arguments, request);
    AddExpression(*add, arguments.expression, arguments.all);
    add->add_option("NAME", arguments.name, "the name of what is added, without a prefix")
        ->required();
    add->add_option("CONTENT", arguments.content, "its text, as XML: write & as &amp;");
    add->add_flag("--after", arguments.after, "add a sibling, right after the selected element")
        ->excludes(add->add_flag("--attribute", arguments.attribute, "add an attribute"));
    AddSaving(*add, arguments.saving);
}

void AddRemove(CLI::App& app, Request& request)
{
    RemoveArguments& arguments = request.remove;
    CLI::App* const remove =
        AddFileCommand(app, "remove", "remove the node that XPATH selects, print it, and save",
                       Remove, arguments, request);
    AddExpression(*remove, arguments.expression, arguments.all);
    AddSaving(*remove, arguments.saving);
}

void AddExplain(CLI::App& app, Request& request)
{
    CLI::App* const explain =
        AddReader(app, "explain", "explain level by level what a lookup of a key path finds",
                  Explain, request.explain, request);
    AddKey(*explain, request.explain.key);
    CLI::Option* const update = explain->add_flag(
        "--set", request.explain.isUpdate, "explain what an update would reach; changes nothing");
    explain
        ->add_option("VALUE", request.explain.value,
                     "with --set: ignored; every value reaches the same elements")
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
    CLI::App* const check = AddReader(app, "check", "report pitfalls for lookups and updates",
                                      Check, request.check, request);
    check->add_option("KEY", request.check.keys, "key paths to check instead of the whole file");
    check->add_flag("--notes", selection.notes, "also print notes, which are not warnings");
    AddKinds(*check, "--only", selection.only, "print this kind only, be it a warning or a note");
    AddKinds(*check, "--ignore", selection.ignored, "do not print this kind");
    // CLI11 prints the text of a version flag and ends the run.
    check->set_version_flag("--kinds", KindList(), "list the kinds of warnings and notes");
}

void AddKeys(CLI::App& app, Request& request)
{
    KeysArguments& arguments = request.keys;
    CLI::App* const keys = AddReader(
        app, "keys", "print every key path that has a value in the file", Keys, arguments, request);
    keys->add_option("PREFIX", arguments.prefix,
                     "print only this key and those below it, such as root.element");
    keys->add_flag("--all", arguments.all, "print all values of a key, not only the first ten")
        ->excludes(keys->add_flag("--names", arguments.namesOnly, "print the keys only"));
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
    AddAdd(app, request);
    AddRemove(app, request);
    AddExplain(app, request);
    AddCheck(app, request);
    AddKeys(app, request);
    AddFind(app, request);
    AddDiff(app, request);
}
