#include "KeyPathLookup.h"

#include "SiblingScan.h"
#include "diag/Log.h"
#include "diag/Status.h"

namespace kx
{

namespace
{

void AppendLine(std::string& lines, const char* text)
{
    if (!lines.empty())
    {
        lines += '\n';
    }
    lines += text;
}

/** Puts "\n" in front of @p text if @p separate, but not of one that is empty. */
void AppendText(std::string& result, bool separate, const char* text)
{
    if (separate && *text != 0)
    {
        result += '\n';
    }
    result += text;
}

} // namespace

void CollectValues(const xmlNode* node, TextView key, std::string& result, bool separate)
{
    if (node == 0 || key.IsEmpty())
    {
        return;
    }
    const size_t start = result.size(); // what is before it was found on other levels
    const KeySplit split(key);
    const Segment segment(split.First());
    SiblingScan scan(node, segment);
    while (scan.Next())
    {
        if (!scan.IsSelected())
        {
            continue;
        }
        if (const xmlNode* const text = OnlyTextChild(scan.Element()))
        {
            AppendText(result, separate && result.size() == start, ContentOf(text));
        }
        if (split.HasRest())
        {
            CollectValues(scan.Element(), split.Rest(), result, separate || result.size() != start);
        }
    }
}

int AppendValues(const xmlNode* node, TextView key, std::string& value, unsigned int& found)
{
    const char* const tag = "XMLGetValue";
    if (node == 0 || key.IsEmpty())
    {
        KX_TRACE(LogEntryAndReturn, tag);
        return StatusMissing;
    }
    KX_LOG_EITHER(LogLevelTrace, LogLevelValue)
    {
        KX_TRACE(LogEntry, tag);
        KX_LOG_OF(LogLevelValue, tag, "Key :: %s", key.data);
    }
    int status = StatusNotFound;
    const KeySplit split(key);
    const Segment segment(split.First());
    SiblingScan scan(node, segment);
    while (scan.Next())
    {
        if (!scan.IsSelected())
        {
            continue;
        }
        if (const xmlNode* const text = OnlyTextChild(scan.Element()))
        {
            AppendLine(value, ContentOf(text));
            found = 1;
        }
        if (split.HasRest())
        {
            status = AppendValues(scan.Element(), split.Rest(), value, found);
        }
    }
    KX_TRACE(LogReturn, tag);
    return status;
}

} // namespace kx
