#include "commands/KeyArgument.h"

#include "file/Load.h"
#include "file/Nodes.h"
#include "output/Failure.h"
#include "output/Quoting.h"
#include "walk/Trail.h"

#include "config/KeyPath.h"

void RequireWellFormedKey(const std::string& key)
{
    if (!kx::KeySplit(kx::TextView(key)).HasRest())
    {
        throw Failure(ExitStatus::BadUsage,
                      "malformed key " + Quoted(key) +
                          ": a key names the root element and at least one more, as in root.name");
    }
}

std::string OtherRootMessage(const std::string& key, const std::string& file, CXMLReader& reader)
{
    const kx::TextView first = kx::KeySplit(kx::TextView(key)).First();
    return "the key starts with " + Quoted(Text(first)) + ", but the root element of " + file +
           " is " + Quoted(Text(RootOf(reader)->name));
}

void RequireKey(const std::string& key, const std::string& file, CXMLReader& reader)
{
    RequireWellFormedKey(key);
    if (!StartsAtRoot(DocumentOf(reader), key))
    {
        throw Failure(ExitStatus::NothingFound,
                      "nothing found: " + OtherRootMessage(key, file, reader));
    }
}
