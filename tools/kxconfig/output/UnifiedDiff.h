#ifndef KX_TOOLS_UNIFIEDDIFF_H
#define KX_TOOLS_UNIFIEDDIFF_H

#include <string>

/** A text and the name of the file that has it. */
struct NamedText
{
    const std::string& name;
    const std::string& text;
};

/**
 * @return what patch(1) needs to turn @p before into @p after; empty if they are equal.
 *
 * The result is minimal where little has changed. The time is linear in the size of the texts, up
 * to a constant factor: where much has changed, only lines that occur once are matched.
 */
std::string UnifiedDiff(const NamedText& before, const NamedText& after);

#endif
