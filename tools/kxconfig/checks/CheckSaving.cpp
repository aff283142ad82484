#include "checks/CheckSaving.h"

#include "file/SavingChanges.h"

void CheckSaving(CXMLReader& reader, const std::string& file, Findings& findings)
{
    for (const Difference& difference : WhatSavingChanges(reader, file))
    {
        findings.Add(difference.line, Kind::ChangedBySaving, "saving changes " + difference.what);
    }
}
