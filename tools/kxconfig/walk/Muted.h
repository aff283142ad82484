#ifndef KX_TOOLS_MUTED_H
#define KX_TOOLS_MUTED_H

#include "KxLog.h"

/** Keeps the client's own walks from logging: the library's run of the same walk does. */
class Muted
{
public:
    Muted() { g_LumLogParams.xmlConfigParserMask = 0; }
    ~Muted() { g_LumLogParams.xmlConfigParserMask = m_mask; }
    Muted(const Muted&) = delete;
    Muted& operator=(const Muted&) = delete;

private:
    const unsigned int m_mask = g_LumLogParams.xmlConfigParserMask;
};

#endif
