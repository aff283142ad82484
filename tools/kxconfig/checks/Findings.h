#ifndef KX_TOOLS_FINDINGS_H
#define KX_TOOLS_FINDINGS_H

#include "checks/Kinds.h"
#include "file/Locations.h"

#include <map>
#include <set>
#include <string>
#include <tuple>

/** A warning or note, and where it is. */
struct Finding
{
    long line;
    Kind kind;
    std::string text;
};

/** The warnings and notes about a file, each once. */
class Findings
{
public:
    explicit Findings(const Selection& selection) : m_selection(selection) {}

    /** @return whether findings of @p kind are reported: others need not be searched for. */
    bool Want(Kind kind) const { return m_selection.Includes(kind); }

    /** Adds a finding, if its kind is wanted. */
    void Add(const xmlNode* node, Kind kind, const std::string& text);
    void Add(long line, Kind kind, const std::string& text);

    /** @return whether it was not marked before: many keys share a finding. */
    bool MarkReported(Kind kind, const xmlNode* level, const std::string& name)
    {
        return m_reported.emplace(kind, level, name).second;
    }

    std::string LocationOf(const xmlNode* node) { return m_locations.Of(node); }

    /** @return the location and the line. */
    std::string Place(const xmlNode* node);

    /** @return them all, sorted by line. */
    const std::multimap<long, Finding>& ByLine() const { return m_byLine; }

private:
    const Selection m_selection;
    Locations m_locations;
    std::multimap<long, Finding> m_byLine;
    std::set<std::string> m_texts;
    std::set<std::tuple<Kind, const xmlNode*, std::string>> m_reported;
};

#endif
