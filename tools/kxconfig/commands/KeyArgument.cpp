#include "commands/KeyArgument.h"

#include "file/Load.h"
#include "file/Nodes.h"
#include "output/Failure.h"
#include "output/Quoting.h"

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

void RequireKey(const std::string& key, const std::string& file, CXMLReader& reader)
{
    RequireWellFormedKey(key);
    const xmlNode* const root = RootOf(reader);
    const kx::TextView first = kx::KeySplit(kx::TextView(key)).First();
    if (!kx::SameText(root->name, first))
    {
        throw Failure(ExitStatus::NothingFound,
                      "nothing found: the key starts with " + Quoted(Text(first)) +
                          ", but the root element of " + file + " is " + Quoted(Text(root->name)));
    }
}
