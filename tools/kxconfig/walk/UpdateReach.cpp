#include "walk/UpdateReach.h"

#include "walk/Muted.h"
#include "walk/Trail.h"

#include "config/UpdateWalk.h"

std::vector<const xmlNode*> ElementsOfUpdate(const xmlDoc* document, const std::string& key)
{
    const Muted muted;
    std::vector<const xmlNode*> elements;
    const kx::TextView rest = kx::KeySplit(kx::TextView(key)).Rest();
    if (!StartsAtRoot(document, key) || rest.IsEmpty())
    {
        return elements;
    }
    kx::UpdateWalk walk(RootOf(document), rest);
    while (walk.Next())
    {
        if (walk.ReplacesText())
        {
            elements.push_back(walk.Element());
        }
    }
    return elements;
}
