#include "cli/Usage.h"

#include "output/ExitStatus.h"

#include <CLI/CLI.hpp>

#include <algorithm>
#include <iomanip>
#include <sstream>

namespace
{

struct Example
{
    const char* command;
    const char* meaning;
};

const Example kExamples[] = {
    {"get device.xml cfg.name", "print a value"},
    {"get device.xml cfg.net.ip", "print the values of every net, one on a line"},
    {"get device.xml 'cfg.net@id=2.ip'", "print that of the net whose attribute id is 2"},
    {"get device.xml 'cfg.net@id=1|id=2.ip'", "print those of both"},
    {"explain device.xml 'cfg.net@id=2.ip'", "explain what a key finds, and why"},
    {"explain --set device.xml cfg.name", "explain what an update would reach, and why"},
    {"check device.xml", "report pitfalls for lookups"},
    {"set --dry-run device.xml cfg.name box", "show what would change"},
    {"set device.xml cfg.name box", "change it and save the file"},
    {"set device.xml cfg.offset -- -5", "a value that starts with a dash"},
    {"keys device.xml", "print all keys and values"},
    {"diff old.xml new.xml", "print the keys whose values differ"},
    {"find device.xml '//net[@id]'", "print the nodes that XPath selects"},
    {"--json get device.xml cfg.name", "print JSON, for scripts"},
};

const char* const kRecords =
    "The library's log records go to standard error. None are written unless --trace, --log-mask\n"
    "or the environment variable KX_LOG_MASK selects them.\n"
    "Output to a terminal is colored unless NO_COLOR is set.";

const char* const kKeyPaths =
    "A key path names the root element and then one element for each level, joined by dots. A "
    "condition after @ selects elements by their attributes: terms name=value are joined by | (or) "
    "and & (and) and combined from left to right. An element of another name on a level suspends "
    "the condition for the next element that matches by name. An element has a value only if text "
    "is its only child.";

/** @return @p text as the language of man has to have it to print it as it is. */
std::string Escaped(const std::string& text)
{
    std::string escaped;
    for (const char c : text)
    {
        switch (c)
        {
        case '\\':
            escaped += "\\e";
            break;
        case '-':
            escaped += "\\-";
            break;
        case '\'':
            escaped += "\\(aq";
            break;
        case '\n':
            escaped += ' ';
            break;
        default:
            escaped += c;
        }
    }
    const bool startsARequest = !escaped.empty() && escaped[0] == '.';
    return startsARequest ? "\\&" + escaped : escaped;
}

std::string Tagged(const std::string& tag, const std::string& text)
{
    return ".TP\n\\fB" + Escaped(tag) + "\\fR\n" + Escaped(text) + "\n";
}

bool IsHidden(const CLI::Option& option)
{
    return option.get_group().empty();
}

/** @return the arguments of @p command as one types them. */
std::string Arguments(const CLI::App& command)
{
    std::string arguments;
    for (const CLI::Option* const option : command.get_options())
    {
        if (option->get_positional())
        {
            const std::string name = option->get_name(true);
            const bool several = option->get_items_expected_max() > 1;
            arguments += option->get_required() ? " " + name : " [" + name + "...]";
            arguments += option->get_required() && several ? "..." : "";
        }
    }
    return arguments;
}

/** @return what --help tells of the arguments of @p command. */
std::string Positionals(const CLI::App& command)
{
    std::string page;
    for (const CLI::Option* const option : command.get_options())
    {
        if (option->get_positional())
        {
            page += Tagged(option->get_name(true), option->get_description());
        }
    }
    return page;
}

std::string Options(const CLI::App& command)
{
    std::string page;
    for (const CLI::Option* const option : command.get_options())
    {
        if (!option->get_positional() && !IsHidden(*option))
        {
            const std::string type = option->get_type_name();
            const bool takesOne = option->get_items_expected_max() > 0;
            std::string name = option->get_name(false, true);
            std::replace(name.begin(), name.end(), ',', ' ');
            page += Tagged(name + (takesOne && !type.empty() ? " " + type : ""),
                           option->get_description());
        }
    }
    return page;
}

std::string Commands(const CLI::App& app)
{
    std::string page;
    for (const CLI::App* const command : app.get_subcommands(nullptr))
    {
        page += ".SS " + Escaped(command->get_name() + Arguments(*command)) + "\n" +
                Escaped(command->get_description()) + "\n" + Positionals(*command) +
                Options(*command);
    }
    return page;
}

} // namespace

std::string HelpFooter()
{
    std::ostringstream footer;
    footer << "Examples:\n" << std::left;
    for (const Example& example : kExamples)
    {
        footer << "  kxconfig " << std::setw(38) << example.command << " " << example.meaning
               << "\n";
    }
    footer << "\nExit status:\n";
    for (const ExitStatusMeaning& exit : kExitStatuses)
    {
        footer << "  " << static_cast<int>(exit.status) << "  " << exit.meaning << "\n";
    }
    footer << "\n" << kRecords;
    return footer.str();
}

std::string ManPage(const CLI::App& app)
{
    std::ostringstream page;
    page << ".TH KXCONFIG 1 \"\" \"kxconfig " KX_VERSION "\" \"User Commands\"\n"
         << ".SH NAME\nkxconfig \\- read and change values of XML configuration files\n"
         << ".SH SYNOPSIS\n.B kxconfig\n[options] command arguments\n"
         << ".SH DESCRIPTION\n"
         << Escaped(app.get_description()) << "\n.PP\n"
         << Escaped(kKeyPaths) << "\n.SH COMMANDS\n"
         << Commands(app) << ".SH OPTIONS\n"
         << Options(app) << ".SH EXIT STATUS\n";
    for (const ExitStatusMeaning& exit : kExitStatuses)
    {
        page << Tagged(std::to_string(static_cast<int>(exit.status)), exit.meaning);
    }
    page << ".SH NOTES\n" << Escaped(kRecords) << "\n.SH EXAMPLES\n";
    for (const Example& example : kExamples)
    {
        page << Tagged(std::string("kxconfig ") + example.command, example.meaning);
    }
    return page.str();
}
