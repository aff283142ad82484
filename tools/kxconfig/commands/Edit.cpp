#include "commands/Edit.h"

#include "file/LoadsAgain.h"
#include "file/SavedBytes.h"
#include "output/UnifiedDiff.h"

#include <nlohmann/json.hpp>

#include <chrono>

namespace
{

Destination DestinationOf(const std::string& file, const SaveArguments& arguments)
{
    const bool elsewhere = !arguments.output.empty();
    return Destination(elsewhere ? arguments.output : file,
                       elsewhere ? Destination::Role::OtherFile : Destination::Role::LoadedFile,
                       std::chrono::seconds(arguments.waitSeconds));
}

/** The size at the end of a compressed file has a NUL, too, unless it is of 16 MiB and more. */
bool IsText(const std::string& bytes)
{
    return bytes.find('\0') == std::string::npos;
}

std::string NodeCount(size_t count)
{
    return std::to_string(count) + (count == 1 ? " node" : " nodes");
}

} // namespace

Edit::Edit(const std::string& file, const SaveArguments& arguments, Report& report)
    : m_file(file),
      m_arguments(arguments),
      m_report(report),
      m_destination(DestinationOf(file, arguments))
{
    if (m_destination.IsStandardOutput())
    {
        m_destination.SetStream(report.GiveOutput());
    }
    Warn(m_destination.LockWarning());
}

void Edit::Warn(const std::string& warning)
{
    if (!warning.empty())
    {
        m_report.Complain(warning);
    }
}

void Edit::RequireLoadable(xmlDoc* document, const std::string& value) const
{
    if (value.find('&') != std::string::npos)
    {
        RequireLoadsAgain(SavedBytes(document), m_destination.Path());
    }
}

ExitStatus Edit::Finish(xmlDoc* document, const std::vector<Change>& changes)
{
    RequireExpected(changes.size());
    const bool mustSave = !changes.empty() || SavesElsewhere();
    const std::string bytes = mustSave ? SavedBytes(document) : "";
    const std::string diff = mustSave && m_arguments.diff ? Diff(bytes) : "";
    const ExitStatus status = mustSave ? Save(bytes) : ExitStatus::Done;
    if (!m_arguments.quiet)
    {
        Print(changes);
    }
    PrintDiff(diff);
    return status;
}

void Edit::RequireExpected(size_t changes) const
{
    if (m_arguments.expected && *m_arguments.expected != changes)
    {
        throw Failure(ExitStatus::NotSaved, "not saved: " + NodeCount(changes) +
                                                " would change, --expect requires " +
                                                std::to_string(*m_arguments.expected));
    }
}

/** @return the difference between the file, which is as it was loaded, and @p bytes. */
std::string Edit::Diff(const std::string& bytes) const
{
    const std::optional<std::string> before = BytesOf(m_file);
    if (!before)
    {
        throw Failure(ExitStatus::NotSaved,
                      "not saved: --diff needs a regular file, which " + m_file + " is not");
    }
    if (!IsText(*before))
    {
        throw Failure(ExitStatus::NotSaved, "not saved: --diff compares lines of text, and " +
                                                m_file + " is compressed or in UTF-16");
    }
    return UnifiedDiff({m_file, *before}, {SavesElsewhere() ? m_arguments.output : m_file, bytes});
}

ExitStatus Edit::Save(const std::string& bytes)
{
    RequireLoadsAgain(bytes, m_destination.Path());
    m_destination.Save(bytes,
                       {m_arguments.dropAttributes, m_arguments.dryRun, m_arguments.backupSuffix});
    if (!m_arguments.dryRun)
    {
        m_report.NoteSaved();
    }
    Warn(m_destination.SyncWarning());
    return m_destination.SyncWarning().empty() ? ExitStatus::Done : ExitStatus::NotReported;
}

void Edit::Print(const std::vector<Change>& changes)
{
    for (const Change& change : changes)
    {
        m_report.Add(change);
    }
    if (changes.empty())
    {
        m_report.AddLine("nothing changed: the text is already the same");
    }
}

void Edit::PrintDiff(const std::string& diff)
{
    if (m_report.IsJson() && m_arguments.diff)
    {
        m_report.AddJson({{"diff", diff}});
    }
    else
    {
        m_report.AddFileLines(diff);
    }
}
