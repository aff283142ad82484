#include "Commands.h"
#include "Document.h"

#include "KxLog.h"
#include "LogMask.h"

#include <CLI/CLI.hpp>

#include <cstdlib>
#include <functional>
#include <iostream>

namespace
{

const char* const kFooter =
    "Examples:\n"
    "  kxconfig get device.xml cfg.name               print a value\n"
    "  kxconfig get device.xml cfg.net.ip             print the values of every net, one on a "
    "line\n"
    "  kxconfig get device.xml 'cfg.net@id=2.ip'      of the net whose attribute id is 2\n"
    "  kxconfig get device.xml 'cfg.net@id=1|id=2.ip' of either\n"
    "  kxconfig set --dry-run device.xml cfg.name box show what would change\n"
    "  kxconfig set device.xml cfg.name box           change it and save the file\n"
    "  kxconfig set device.xml cfg.offset -- -5       a value that starts with a dash\n"
    "  kxconfig keys device.xml                       print all keys and values\n"
    "  kxconfig find device.xml '//net[@id]'          print the nodes that XPath selects\n"
    "\n"
    "Exit status:\n"
    "  0 done, 1 nothing found, 2 bad usage, malformed key or expression, 3 file unreadable or not "
    "well-formed,\n"
    "  4 saving failed: the file is as it was\n"
    "\n"
    "The library's log records go to standard error. kxconfig asks for none unless --log-mask or\n"
    "the environment variable KX_LOG_MASK says otherwise.";

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

ExitStatus ReportUsage(const CLI::App& app, const CLI::ParseError& error)
{
    if (error.get_exit_code() == 0)
    {
        app.exit(error); // --help, --version
        return ExitStatus::Done;
    }
    Complain(error.what() + std::string(kSeeHelp));
    return ExitStatus::BadUsage;
}

ExitStatus Run(int argc, char** argv)
{
    SetArguments arguments; // the others use the first, or the first two
    std::string expression;
    std::string logMask;
    std::function<ExitStatus()> command;

    CLI::App app("Reads and changes values of XML configuration files by key path.", "kxconfig");
    app.set_version_flag("--version", "kxconfig " KX_VERSION);
    app.footer(kFooter);
    app.require_subcommand(0, 1); // so that an unknown one is named
    app.fallthrough();
    app.add_option("--log-mask", logMask, std::string("log mask: ") + g_LogMaskHelp)
        ->type_name("MASK")
        ->check(CLI::Validator(CheckLogMask, ""));

    AddKeyCommand(app, "get", "print the value or values under a key path", arguments)
        ->callback([&] { command = [&] { return Get(arguments.file, arguments.key); }; });

    CLI::App* const set = AddKeyCommand(
        app, "set", "replace the text under a key path, print what changed, and save", arguments);
    set->add_option("VALUE", arguments.value, "the new text, as XML: write & as &amp;")->required();
    set->add_flag("--dry-run", arguments.dryRun, "show what would change and save nothing");
    set->add_option("--output", arguments.output, "save to this file instead")
        ->type_name("FILE")
        ->check(CLI::Validator(RefuseStandardStreams, ""));
    set->callback([&] { command = [&] { return Set(arguments); }; });

    AddFileCommand(app, "keys", "print every key path under which the file holds a value",
                   arguments.file)
        ->callback([&] { command = [&] { return Keys(arguments.file); }; });

    CLI::App* const find = AddFileCommand(
        app, "find", "print the nodes that an XPath expression selects, or its value",
        arguments.file);
    find->add_option("XPATH", expression, "an XPath 1.0 expression")->required();
    find->callback([&] { command = [&] { return Find(arguments.file, expression); }; });

    try
    {
        app.parse(argc, argv);
    }
    catch (const CLI::ParseError& error)
    {
        return ReportUsage(app, error);
    }
    if (!command)
    {
        Complain("a command is required: get, set, keys or find" + std::string(kSeeHelp));
        return ExitStatus::BadUsage;
    }
    SetLogMask(logMask);
    CollectEngineComplaints();
    return command();
}

} // namespace

int main(int argc, char** argv)
{
    const ExitStatus status = Run(argc, argv);
    if (!std::cout.flush())
    {
        Complain("cannot write to standard output");
        return static_cast<int>(ExitStatus::NotSaved);
    }
    return static_cast<int>(status);
}
