// This library's handles on nodes.

#include "Documents.h"
#include "Operations.h"
#include "library/Loaded.h"

namespace bench
{

namespace
{

CXmlNode RootHandle(const std::string& path)
{
    return CXmlNode(LoadedRoot(path));
}

std::size_t CountedByIteration(CXmlNode& parent)
{
    std::size_t count = 0;
    for (CXmlNode child = parent.FirstChild(); !child.IsNull(); child = child.NextSibling())
    {
        ++count;
    }
    return count;
}

void AddChildren()
{
    Add(kIterate, kLibrary, kIteratedChildren,
        []
        {
            return [parent = RootHandle(Texts(kIteratedChildren))]() mutable
            { return CountedByIteration(parent); };
        });
    Add(kListChildren, kLibrary, kIteratedChildren,
        []
        {
            return [parent = RootHandle(Texts(kIteratedChildren))]() mutable
            { return parent.Children().size(); };
        });
    for (const std::size_t count : kFindChildCounts)
    {
        Add(Sized(kFindChild, count), kLibrary, true,
            [count]
            {
                return
                    [parent = RootHandle(Siblings(count)), name = std::string("service")]() mutable
                { return !parent.FindChildNode(name).IsNull(); };
            });
    }
}

void AddAttributes()
{
    Add(kListAttributes, kLibrary, kFourAttributes,
        []
        {
            return [element = RootHandle(FourAttributes()).FirstChild()]() mutable
            { return element.GetAttributeItems().size(); };
        });
}

void AddQueries()
{
    for (const Query& query : kQueries)
    {
        Add(query.workload, kLibrary, kQueryHits,
            [query]
            {
                return [parser = LoadedParser(Channels(query.channels)),
                        expression = std::string(query.expression)]
                { return parser->FindAllNodes(expression, CXmlNode()).size(); };
            });
    }
}

const Registration registration(
    []
    {
        AddChildren();
        AddAttributes();
        AddQueries();
    });

} // namespace

} // namespace bench
