#ifndef KX_TOOLS_COMMANDLINE_H
#define KX_TOOLS_COMMANDLINE_H

#include "output/ExitStatus.h"

#include <iosfwd>
#include <memory>
#include <string>
#include <vector>

class Report;

/** The arguments of kxconfig, parsed. */
class CommandLine
{
public:
    /** @param input  standard input, for the command; outlives this object. */
    explicit CommandLine(std::istream& input);
    ~CommandLine();
    CommandLine(const CommandLine&) = delete;
    CommandLine& operator=(const CommandLine&) = delete;

    /**
     * Parses @p arguments and gives @p report the form and the subject of the answer.
     *
     * @return whether there is a command to run; false after --help and the like, which are
     *         answered at once.
     * @throws Failure if the usage is bad.
     */
    bool Parse(const std::vector<std::string>& arguments, Report& report);

    /** @return the log mask that was asked for; empty if none was. */
    std::string LogMask() const;

    /** Runs the command that was named. */
    ExitStatus RunCommand(Report& report) const;

private:
    struct Parser;

    std::unique_ptr<Parser> m_parser;
};

#endif
