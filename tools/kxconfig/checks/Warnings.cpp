#include "checks/Warnings.h"

#include "file/Nodes.h"
#include "output/Output.h"

void Warnings::Warn(const xmlNode* node, const char* kind, const std::string& text)
{
    Warn(LineNumberOf(node), kind, text);
}

void Warnings::Warn(long line, const char* kind, const std::string& text)
{
    if (m_texts.insert(text).second)
    {
        m_byLine.emplace(line, Warning{kind, text});
    }
}

std::string Warnings::Place(const xmlNode* node)
{
    return LocationOf(node) + " (line " + LineOf(node) + ")";
}

bool Warnings::PrintFor(const std::string& file) const
{
    for (const auto& [line, warning] : m_byLine)
    {
        const std::string place = file + ":" + std::to_string(line) + ": ";
        Print(OnOneLine(place + warning.text),
              {{"line", line}, {"kind", warning.kind}, {"text", warning.text}});
    }
    return !m_byLine.empty();
}
