#include "file/Backup.h"

#include "file/Debris.h"
#include "file/Signals.h"

#include <cstdio>

#include <unistd.h>

void KeepBackup(const Place& place, const std::string& suffix)
{
    const SignalDelay delay;
    const std::string link = NameOfReplacement(); // a link cannot replace a file, but a rename can
    const std::string backup = place.Name() + suffix; // needs memory, so it comes before the link
    if (linkat(place.Folder(), place.Name(), place.Folder(), link.c_str(), 0) != 0)
    {
        ThrowSystemError();
    }
    const bool isKept = renameat(place.Folder(), link.c_str(), place.Folder(), backup.c_str()) == 0;
    const int reason = errno;
    unlinkat(place.Folder(), link.c_str(), 0); // also if the backup was a name of the file already
    if (!isKept)
    {
        throw std::system_error(reason, std::generic_category());
    }
}
