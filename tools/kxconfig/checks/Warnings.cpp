#include "checks/Warnings.h"

#include "file/Nodes.h"

void Warnings::Warn(const xmlNode* node, const char* kind, const std::string& text)
{
    Warn(LineNumberOf(node), kind, text);
}

void Warnings::Warn(long line, const char* kind, const std::string& text)
{
    if (m_texts.insert(text).second)
    {
        m_byLine.emplace(line, Warning{line, kind, text});
    }
}

std::string Warnings::Place(const xmlNode* node)
{
    return LocationOf(node) + " (line " + LineOf(node) + ")";
}
