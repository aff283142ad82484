#include "checks/CheckSaving.h"

#include "file/SaveDifferences.h"

void CheckSaving(CXMLReader& reader, const std::string& file, Findings& findings)
{
    for (const Difference& difference : DifferencesAfterSaving(reader, file))
    {
        findings.Add(difference.line, Kind::ChangedBySaving, "saving changes " + difference.what);
    }
}
