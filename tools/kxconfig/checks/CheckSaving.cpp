#include "checks/CheckSaving.h"

#include "file/RoundTrip.h"

void CheckSaving(CXMLReader& reader, const std::string& file, Warnings& warnings)
{
    for (const Difference& difference : WhatSavingChanges(reader, file))
    {
        warnings.Warn(difference.line, "changed by saving", "saving changes " + difference.what);
    }
}
