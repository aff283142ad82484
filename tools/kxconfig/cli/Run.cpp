#include "cli/Run.h"

#include "cli/CommandLine.h"
#include "cli/LogMaskChoice.h"
#include "file/Engine.h"
#include "output/Failure.h"
#include "output/Progress.h"
#include "output/Report.h"

#include <new>
#include <optional>

namespace
{

ExitStatus RunCommand(const std::vector<std::string>& arguments, std::istream& input,
                      Report& report)
{
    CommandLine commandLine(input);
    if (!commandLine.Parse(arguments, report))
    {
        return ExitStatus::Done;
    }
    const LogMaskChoice logMask(commandLine.LogMask());
    const EngineSettings engine;
    std::optional<Progress> progress;
    if (report.HasTerminalForErrors() && !logMask.IsAny())
    {
        progress.emplace();
    }
    return commandLine.RunCommand(report);
}

ExitStatus RunOrComplain(const std::vector<std::string>& arguments, std::istream& input,
                         Report& report)
{
    try
    {
        return RunCommand(arguments, input, report);
    }
    catch (const Failure& failure)
    {
        report.Complain(failure.Message());
        return failure.Status();
    }
}

} // namespace

int Run(const std::vector<std::string>& arguments, std::istream& input, std::ostream& output,
        std::ostream& errors)
{
    Report report(output, errors);
    try
    {
        return static_cast<int>(report.Finish(RunOrComplain(arguments, input, report)));
    }
    catch (const std::bad_alloc&)
    {
        return static_cast<int>(report.FinishOutOfMemory());
    }
}
