#include "commands/Check.h"

#include "checks/CheckElements.h"
#include "checks/CheckKeys.h"
#include "checks/CheckSaving.h"
#include "commands/KeyArgument.h"
#include "file/Load.h"
#include "output/Quoting.h"
#include "output/Report.h"

#include <nlohmann/json.hpp>

namespace
{

struct WarningOfFile
{
    const std::string& file;
    const Warning& warning;

    std::string Line() const
    {
        return OnOneLine(file + ":" + std::to_string(warning.line) + ": " + warning.text);
    }

    Json InJson() const
    {
        return {{"line", warning.line}, {"kind", warning.kind}, {"text", warning.text}};
    }
};

/** @return what is found in the document of @p reader. */
Warnings Examine(CXMLReader& reader, const CheckArguments& arguments)
{
    const xmlNode* const root = RootOf(reader);
    Levels levels(root->doc);
    Warnings warnings;
    for (const std::string& key : arguments.keys)
    {
        CheckLookup(root->doc, key, warnings);
    }
    if (arguments.keys.empty())
    {
        CheckListedKeys(root, levels, warnings);
    }
    CheckElements(root, levels, warnings);
    CheckSaving(reader, arguments.file, warnings);
    return warnings;
}

} // namespace

ExitStatus Check(const CheckArguments& arguments, Report& report)
{
    const std::unique_ptr<CXMLReader> reader = LoadFile(arguments.file);
    for (const std::string& key : arguments.keys)
    {
        RequireWellFormedKey(key);
    }
    const Warnings warnings = Examine(*reader, arguments);
    for (const auto& [line, warning] : warnings.ByLine())
    {
        report.Add(WarningOfFile{arguments.file, warning});
    }
    return warnings.ByLine().empty() ? ExitStatus::Done : ExitStatus::NothingFound;
}
