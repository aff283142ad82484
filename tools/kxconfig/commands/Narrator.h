#ifndef KX_TOOLS_NARRATOR_H
#define KX_TOOLS_NARRATOR_H

#include "commands/TrailEvents.h"

/** Prints what a walk did, level by level; a long run of steps that are alike is cut short. */
class Narrator
{
public:
    Narrator(Walk walk, Report& report) : m_report(report), m_narration{walk, report, {}} {}

    void AddLevel(const TrailLevel& level, int depth);

private:
    void AddBelow(const TrailStep& step, int depth);

    Report& m_report;
    Narration m_narration;
};

#endif
