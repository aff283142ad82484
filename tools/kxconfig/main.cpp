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

struct Arguments
{
    std::string file;
    std::string key;
    std::string logMask;
};

const char* const kFooter =
    "Examples:\n"
    "  kxconfig get device.xml cfg.name               print a value\n"
    "  kxconfig get device.xml cfg.net.ip             print the values of every net, one on a "
    "line\n"
    "  kxconfig get device.xml 'cfg.net@id=2.ip'      of the net whose attribute id is 2\n"
    "  kxconfig get device.xml 'cfg.net@id=1|id=2.ip' of either\n"
    "\n"
    "Exit status:\n"
    "  0 found, 1 nothing found, 2 bad usage or malformed key, 3 file unreadable or not "
    "well-formed\n"
    "\n"
    "The library's log records go to standard error. kxconfig asks for none unless --log-mask or\n"
    "the environment variable KX_LOG_MASK says otherwise.";

/** The library reports to kxconfig, and kxconfig to the user: records are for those who ask. */
void SetLogMask(const std::string& mask)
{
    const char* const environment = std::getenv("KX_LOG_MASK");
    if (!mask.empty())
    {
        ParseLogMask(mask.c_str(), g_LumLogParams.xmlConfigParserMask);
    }
    else if (environment == nullptr || *environment == '\0')
    {
        g_LumLogParams.xmlConfigParserMask = 0;
    }
}

std::string CheckLogMask(const std::string& text)
{
    unsigned int mask = 0;
    return ParseLogMask(text.c_str(), mask)
               ? std::string()
               : "\"" + text + "\" is not a log mask; it is " + g_LogMaskHelp;
}

std::string RefuseStandardInput(const std::string& file)
{
    return file == "-" ? "\"-\" would read standard input; name a file" : std::string();
}

CLI::App* AddFileCommand(CLI::App& app, const char* name, const char* description,
                         Arguments& arguments)
{
    CLI::App* const command = app.add_subcommand(name, description);
    command->add_option("FILE", arguments.file, "an XML file")
        ->required()
        ->check(CLI::Validator(RefuseStandardInput, ""));
    return command;
}

ExitStatus ReportUsage(const CLI::App& app, const CLI::ParseError& error)
{
    if (error.get_exit_code() == 0)
    {
        app.exit(error); // --help, --version
        return ExitStatus::Done;
    }
    Complain(std::string(error.what()) + " (kxconfig --help shows the usage)");
    return ExitStatus::BadUsage;
}

ExitStatus Run(int argc, char** argv)
{
    Arguments arguments;
    std::function<ExitStatus()> command;

    CLI::App app("Reads values of XML configuration files by key path.", "kxconfig");
    app.set_version_flag("--version", "kxconfig " KX_VERSION);
    app.footer(kFooter);
    app.require_subcommand(1);
    app.fallthrough();
    app.add_option("--log-mask", arguments.logMask, std::string("log mask: ") + g_LogMaskHelp)
        ->type_name("MASK")
        ->check(CLI::Validator(CheckLogMask, ""));

    CLI::App* const get =
        AddFileCommand(app, "get", "print the value or values under a key path", arguments);
    get->add_option("KEY", arguments.key, "a key path: root.element@attribute=value.element")
        ->required();
    get->callback([&] { command = [&] { return Get(arguments.file, arguments.key); }; });

    try
    {
        app.parse(argc, argv);
    }
    catch (const CLI::ParseError& error)
    {
        return ReportUsage(app, error);
    }
    SetLogMask(arguments.logMask);
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
        return static_cast<int>(ExitStatus::BadFile);
    }
    return static_cast<int>(status);
}
