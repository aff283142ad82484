#include "checks/Findings.h"

#include "file/Nodes.h"

void Findings::Add(const xmlNode* node, Kind kind, const std::string& text)
{
    Add(LineNumberOf(node), kind, text);
}

void Findings::Add(long line, Kind kind, const std::string& text)
{
    if (Want(kind) && m_texts.insert(text).second)
    {
        m_byLine.emplace(line, Finding{line, kind, text});
    }
}

std::string Findings::Place(const xmlNode* node)
{
    return LocationOf(node) + " (line " + LineOf(node) + ")";
}
