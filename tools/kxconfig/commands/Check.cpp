#include "commands/Check.h"

#include "checks/CheckElements.h"
#include "checks/CheckKeys.h"
#include "checks/CheckSaving.h"
#include "commands/KeyArgument.h"
#include "file/KeyTree.h"
#include "file/Load.h"
#include "output/Quoting.h"
#include "output/Report.h"

#include <nlohmann/json.hpp>

namespace
{

struct FindingInFile
{
    const std::string& file;
    const Finding& finding;

    std::string Line() const
    {
        return OnOneLine(file + ":" + std::to_string(finding.line) + ": " + SeverityName() + ": " +
                         finding.text + " [" + WordOf(finding.kind) + "]");
    }

    Json InJson() const
    {
        return {{"line", finding.line},
                {"kind", MeaningOf(finding.kind).name},
                {"severity", SeverityName()},
                {"text", finding.text}};
    }

private:
    const char* SeverityName() const { return NameOf(MeaningOf(finding.kind).severity); }
};

struct ReachInFile
{
    const std::string& file;
    const Reach& reach;

    std::string Line() const
    {
        return OnOneLine(file + ": " + Quoted(reach.key) + ": lookup " +
                         std::to_string(reach.lookup) + ", update " + std::to_string(reach.update));
    }

    Json InJson() const
    {
        return {{"key", reach.key}, {"lookup", reach.lookup}, {"update", reach.update}};
    }
};

void CheckKeys(CXMLReader& reader, const CheckArguments& arguments, Findings& findings,
               Report& report)
{
    for (const Reach& reach : CheckGivenKeys(DocumentOf(reader), arguments.keys, findings))
    {
        report.Add(ReachInFile{arguments.file, reach});
    }
}

void CheckElementsAndKeys(const KeyTree& tree, Findings& findings)
{
    Levels levels;
    CheckListedKeys(tree.Root(), levels, findings);
    CheckElements(tree.Root(), findings);
}

void CheckFile(CXMLReader& reader, const CheckArguments& arguments, Findings& findings)
{
    CheckElementsAndKeys(KeyTree(DocumentOf(reader)), findings);
    const bool isStream = arguments.file == "-"; // its bytes are gone
    if (findings.Want(Kind::ChangedBySaving) && !isStream)
    {
        CheckSaving(reader, arguments.file, findings);
    }
}

/** @return whether one of @p findings is a warning. */
bool AddFindings(const Findings& findings, const std::string& file, Report& report)
{
    bool hasWarning = false;
    for (const auto& [line, finding] : findings.ByLine())
    {
        report.Add(FindingInFile{file, finding});
        hasWarning = hasWarning || MeaningOf(finding.kind).severity == Severity::Warning;
    }
    return hasWarning;
}

} // namespace

ExitStatus Check(const CheckArguments& arguments, Report& report)
{
    const LoadedReader reader = LoadFile(arguments.file, arguments.input);
    for (const std::string& key : arguments.keys)
    {
        RequireWellFormedKey(key);
    }
    Findings findings(arguments.selection);
    if (arguments.keys.empty())
    {
        CheckFile(*reader, arguments, findings);
    }
    else
    {
        CheckKeys(*reader, arguments, findings, report);
    }
    return AddFindings(findings, arguments.file, report) ? ExitStatus::NothingFound
                                                         : ExitStatus::Done;
}
