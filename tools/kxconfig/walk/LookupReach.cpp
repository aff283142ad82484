#include "walk/LookupReach.h"

#include "walk/Muted.h"
#include "walk/Trail.h"

#include "config/SiblingScan.h"

namespace
{

void Collect(const xmlNode* node, kx::TextView key, std::vector<const xmlNode*>& elements)
{
    const kx::KeySplit split(key);
    const kx::Segment segment(split.First());
    kx::SiblingScan scan(node, segment);
    while (scan.Next())
    {
        const bool isSelected = scan.IsSelected();
        if (isSelected && kx::OnlyTextChild(scan.Element()) != nullptr)
        {
            elements.push_back(scan.Element());
        }
        if (isSelected && !split.Rest().IsEmpty())
        {
            Collect(scan.Element(), split.Rest(), elements);
        }
    }
}

} // namespace

std::vector<const xmlNode*> ElementsOfLookup(const xmlDoc* document, const std::string& key)
{
    const Muted muted;
    std::vector<const xmlNode*> elements;
    const kx::TextView rest = kx::KeySplit(kx::TextView(key)).Rest();
    if (StartsAtRoot(document, key) && !rest.IsEmpty())
    {
        Collect(RootOf(document), rest, elements);
    }
    return elements;
}
