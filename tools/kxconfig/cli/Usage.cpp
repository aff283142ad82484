#include "cli/Usage.h"

#include "output/ExitStatus.h"

#include <CLI/CLI.hpp>

#include <iterator>
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
    {"get device.xml 'cfg.net@id=2.ip'", "print the ip of the net with id 2"},
    {"get device.xml 'cfg.net@id=1|id=2.ip'", "print the ip of both nets"},
    {"explain device.xml 'cfg.net@id=2.ip'", "explain what a key finds, and why"},
    {"explain --set device.xml cfg.name", "explain what an update would reach, and why"},
    {"check device.xml", "report pitfalls for lookups"},
    {"set --dry-run device.xml cfg.name box", "show what would change"},
    {"set device.xml cfg.name box", "change it and save the file"},
    {"set device.xml cfg.option -- -v", "a value that starts with a dash"},
    {"set device.xml cfg.name box cfg.mode on", "change both or neither"},
    {"set --node device.xml '//net[2]/@id' 3", "change exactly one node, by XPath"},
    {"add device.xml /cfg mode on", "add an element"},
    {"remove device.xml '//net[@id=3]'", "remove one"},
    {"keys device.xml", "print all keys and values"},
    {"keys --names device.xml cfg.net", "print the keys below the element, without values"},
    {"diff old.xml new.xml", "print the keys whose values differ"},
    {"find device.xml '//net[@id]'", "print the nodes that XPath selects"},
    {"--json get device.xml cfg.name", "print JSON, for scripts"},
};

const char* const kRecords =
    "The library's log records go to standard error. None are written unless --trace, --log-mask "
    "or KX_LOG_MASK selects them.";

/** What the man page describes by name. */
struct Entry
{
    const char* name;
    const char* description;
};

const Entry kEnvironment[] = {
    {"KX_LOG_MASK", "The log mask if neither --log-mask nor --trace is given."},
    {"NO_COLOR", "If it is not empty, output to a terminal is not colored, unless --color=always."},
    {"TERM", "Output to a terminal is not colored if this is dumb or not set."},
    {"COLUMNS", "The width at which help is wrapped, instead of that of the terminal."},
};

const Entry kFiles[] = {
    {".kxconfig-*.tmp",
     "The new content of a file in the same directory, until it replaces the file. "
     "The next command that changes a file in the directory removes files left by a killed "
     "process."},
};

const char* const kKeyPaths =
    "A key path names the root element and then one element for each level, joined by dots. A "
    "condition after @ selects elements by their attributes: terms name=value are joined by | (or) "
    "and & (and) and combined from left to right. An element of another name suspends the "
    "condition for the next element of the right name. An element has a value only if text "
    "is its only child.";

/** @return @p text escaped for man. */
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

/** @return the man-page entries for the arguments of @p command. */
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

/** @return "-h, --help" and the like, with the type of a value. */
std::string NameOf(const CLI::Option& option)
{
    std::string name;
    for (const std::string& part : option.get_snames())
    {
        name += "-" + part + ", ";
    }
    name += "--" + option.get_lnames().front();
    const bool takesOne = option.get_items_expected_max() > 0;
    const bool isOptional = takesOne && option.get_items_expected_min() == 0;
    const std::string& type = option.get_type_name();
    return name + (isOptional ? "[=" + type + "]" : takesOne ? " " + type : "");
}

std::string Options(const CLI::App& command)
{
    std::string page;
    for (const CLI::Option* const option : command.get_options())
    {
        if (!option->get_positional() && !IsHidden(*option))
        {
            page += Tagged(NameOf(*option), option->get_description());
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

/** @return @p text in lines of at most @p width, but for longer words; all but the first line are
 * indented. */
std::string Wrapped(const std::string& text, size_t indent, size_t width, size_t column = 0)
{
    std::istringstream words(text);
    std::string wrapped;
    bool isFirst = true;
    for (std::string word; words >> word; isFirst = false)
    {
        const bool fits = column + 1 + word.size() <= width;
        const std::string separator = isFirst ? "" : fits ? " " : "\n" + std::string(indent, ' ');
        wrapped += separator + word;
        column = (fits || isFirst ? column + separator.size() : indent) + word.size();
    }
    return wrapped + "\n";
}

/** @return a row of a table whose second column starts at @p column. */
std::string Row(const std::string& name, const std::string& description, size_t column,
                size_t width)
{
    std::string row = "  " + name;
    if (row.size() + 2 > column)
    {
        row += "\n";
        return row + std::string(column, ' ') + Wrapped(description, column, width, column);
    }
    row.resize(column, ' ');
    return row + Wrapped(description, column, width, column);
}

const size_t kOptionColumn = 24;

std::string CommandTable(const CLI::App& app, size_t width)
{
    std::string table;
    for (const CLI::App* const command : app.get_subcommands(nullptr))
    {
        table += Row(command->get_name(), command->get_description(), 12, width);
    }
    return table.empty() ? "" : "\nCommands:\n" + table;
}

std::string OptionTable(const std::string& title, const CLI::App& app, bool positional,
                        size_t width)
{
    std::string table;
    for (const CLI::Option* const option : app.get_options())
    {
        if (option->get_positional() == positional && !IsHidden(*option))
        {
            const std::string name = positional ? option->get_name(true) : NameOf(*option);
            table += Row(name, option->get_description(), positional ? 12 : kOptionColumn, width);
        }
    }
    return table.empty() ? "" : "\n" + title + ":\n" + table;
}

/** @return whether the example is one of the command; without a command all are shown. */
bool IsAbout(const Example& example, const CLI::App* command)
{
    std::istringstream words(example.command);
    std::string word;
    while (words >> word && word[0] == '-')
    {
    }
    return command == nullptr || word == command->get_name();
}

std::string ExampleTable(const CLI::App* command, size_t width)
{
    const size_t column = width < 100 ? 6 : 50; // a line below, where there is no place beside
    std::string table;
    for (const Example& example : kExamples)
    {
        if (IsAbout(example, command))
        {
            table +=
                Row(std::string("kxconfig ") + example.command, example.meaning, column, width);
        }
    }
    return table;
}

std::string StatusTable(size_t width)
{
    std::string table = "\nExit status:\n";
    for (const ExitStatusMeaning& exit : kExitStatuses)
    {
        table += Row(std::to_string(static_cast<int>(exit.status)), exit.meaning, 5, width);
    }
    return table;
}

std::string Entries(const std::string& title, const Entry* begin, const Entry* end)
{
    std::string section = ".SH " + title + "\n";
    for (const Entry* entry = begin; entry != end; ++entry)
    {
        section += Tagged(entry->name, entry->description);
    }
    return section;
}

} // namespace

std::string Arguments(const CLI::App& command)
{
    std::string arguments;
    for (const CLI::Option* const option : command.get_options())
    {
        if (option->get_positional())
        {
            const std::string name = option->get_name(true);
            const bool several = option->get_items_expected_max() > 1;
            const std::string all = several ? name + "..." : name;
            arguments += option->get_required() ? " " + all : " [" + all + "]";
        }
    }
    return arguments;
}

std::string Help(const CLI::App& app, const CLI::App* command, size_t width)
{
    const CLI::App& shown = command == nullptr ? app : *command;
    const std::string arguments = command == nullptr ? " COMMAND ..." : Arguments(*command);
    const std::string name = command == nullptr ? "" : " " + command->get_name();
    std::string help = Wrapped("usage: kxconfig" + name + " [options]" + arguments, 4, width) +
                       Wrapped(shown.get_description(), 0, width) + CommandTable(shown, width) +
                       OptionTable("Arguments", shown, true, width) +
                       OptionTable("Options", shown, false, width) + "\nExamples:\n" +
                       ExampleTable(command, width);
    if (command == nullptr)
    {
        help += StatusTable(width) + "\n" + Wrapped(kRecords, 0, width);
    }
    return help;
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
    page << Entries("ENVIRONMENT", std::begin(kEnvironment), std::end(kEnvironment))
         << Entries("FILES", std::begin(kFiles), std::end(kFiles)) << ".SH NOTES\n"
         << Escaped(kRecords) << "\n.SH EXAMPLES\n";
    for (const Example& example : kExamples)
    {
        page << Tagged(std::string("kxconfig ") + example.command, example.meaning);
    }
    page << ".SH SEE ALSO\n.BR flock (1),\n.BR xmllint (1),\n.BR xmlstarlet (1)\n";
    return page.str();
}
