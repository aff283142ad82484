#ifndef KX_TOOLS_EDIT_H
#define KX_TOOLS_EDIT_H

#include "file/Destination.h"
#include "output/Change.h"

#include <libxml/tree.h>

#include <optional>
#include <string>
#include <vector>

/** What all commands that change a file are asked for. */
struct SaveArguments
{
    std::string output;             ///< where to save; empty: over the file; "-": standard output
    bool dryRun = false;            ///< show what would change, and save nothing
    bool dropAttributes = false;    ///< save even if the file cannot keep all of its attributes
    int waitSeconds = 10;           ///< for the file's lock
    std::optional<size_t> expected; ///< the number of changes; save only if there are so many
    bool quiet = false;             ///< print no changes
    bool diff = false;              ///< print the lines of the file that change
    std::string backupSuffix;       ///< of the name that the old file gets; empty: it gets none
};

/**
 * The change of a file by one command, from the lock to the report.
 *
 * The document is changed in memory, and saved once: a failure on the way leaves the file as it is.
 */
class Edit
{
public:
    /**
     * Locks the file, to be loaded after that.
     *
     * @param arguments  and @p report outlive this object.
     * @throws Failure if another process keeps the file locked.
     */
    Edit(const std::string& file, const SaveArguments& arguments, Report& report);

    void Warn(const std::string& warning);

    /**
     * Requires that @p document loads again, after @p value became one of its texts: references in
     * it can make an entity contain itself, or multiply.
     */
    void RequireLoadable(xmlDoc* document, const std::string& value) const;

    /** Saves @p document, if there are @p changes or it is saved to another file, and prints them.
     */
    ExitStatus Finish(xmlDoc* document, const std::vector<Change>& changes);

private:
    bool SavesElsewhere() const { return !m_arguments.output.empty(); }
    void RequireExpected(size_t changes) const;
    ExitStatus Save(const std::string& bytes);
    std::string Diff(const std::string& bytes) const;
    void PrintDiff(const std::string& diff);
    void Print(const std::vector<Change>& changes);

    const std::string m_file;
    const SaveArguments& m_arguments;
    Report& m_report;
    Destination m_destination;
};

#endif
