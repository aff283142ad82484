#ifndef KX_TOOLS_WARNINGS_H
#define KX_TOOLS_WARNINGS_H

#include "file/Locations.h"

#include <map>
#include <set>
#include <string>
#include <tuple>

/** A pitfall for lookups, and where it is. */
struct Warning
{
    long line;
    const char* kind;
    std::string text;
};

/** What there is to warn of in a file, each once. */
class Warnings
{
public:
    /** @param kind  one of those that the documentation lists for scripts. */
    void Warn(const xmlNode* node, const char* kind, const std::string& text);
    void Warn(long line, const char* kind, const std::string& text);

    /** @return true once for each @p kind, @p level and @p name: what many keys share is told once.
     */
    bool IsNew(const std::string& kind, const xmlNode* level, const std::string& name)
    {
        return m_told.emplace(kind, level, name).second;
    }

    std::string LocationOf(const xmlNode* node) { return m_locations.Of(node); }

    /** @return the location and the line. */
    std::string Place(const xmlNode* node);

    /** @return them all, sorted by line. */
    const std::multimap<long, Warning>& ByLine() const { return m_byLine; }

private:
    Locations m_locations;
    std::multimap<long, Warning> m_byLine;
    std::set<std::string> m_texts;
    std::set<std::tuple<std::string, const xmlNode*, std::string>> m_told;
};

#endif
