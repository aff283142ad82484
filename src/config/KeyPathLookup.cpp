#include "KeyPathLookup.h"

#include "SiblingScan.h"
#include "diag/Log.h"
#include "diag/Status.h"

namespace kx
{

namespace
{

/** The value that @p text holds; never null. */
const char* ContentOf(const xmlNode* text)
{
    return text->content != 0 ? reinterpret_cast<const char*>(text->content) : "";
}

/** One level of the lookup that runs the values of one parent together. */
class Collector
{
public:
    Collector(const KeySplit& key, std::string& result)
        : m_key(key), m_result(result), m_start(result.size())
    {
    }

    void Accept(const xmlNode* element)
    {
        const xmlNode* const text = OnlyTextChild(element);
        if (text != 0)
        {
            m_result += ContentOf(text);
        }
        if (m_key.hasRest)
        {
            CollectBranch(element);
        }
    }

private:
    Collector(const Collector&);
    Collector& operator=(const Collector&);

    void CollectBranch(const xmlNode* element)
    {
        const size_t end = m_result.size();
        const bool separate = end != m_start;
        if (separate)
        {
            m_result += '\n';
        }
        CollectValues(element, m_key.rest, m_result);
        if (separate && m_result.size() == end + 1)
        {
            m_result.resize(end);
        }
    }

    const KeySplit& m_key;
    std::string& m_result;
    const size_t m_start; ///< where this level's own result begins
};

/** One level of the lookup that separates every value. */
class Appender
{
public:
    Appender(const KeySplit& key, std::string& value, unsigned int& found)
        : m_key(key), m_value(value), m_found(found), m_status(StatusNotFound)
    {
    }

    void Accept(const xmlNode* element)
    {
        const xmlNode* const text = OnlyTextChild(element);
        if (text != 0)
        {
            AppendSeparated(ContentOf(text));
        }
        if (m_key.hasRest)
        {
            m_status = AppendValues(element, m_key.rest, m_value, m_found);
        }
    }

    int GetStatus() const { return m_status; }

private:
    Appender(const Appender&);
    Appender& operator=(const Appender&);

    void AppendSeparated(const char* text)
    {
        if (!m_value.empty())
        {
            m_value += '\n';
        }
        m_value += text;
        m_found = 1;
    }

    const KeySplit& m_key;
    std::string& m_value;
    unsigned int& m_found;
    int m_status; ///< of the last descent: it tells nothing about the values of this level
};

} // namespace

void CollectValues(const xmlNode* node, const TextView& key, std::string& result)
{
    if (node == 0 || key.IsEmpty())
    {
        return;
    }
    const KeySplit split(key);
    Collector collector(split, result);
    ScanSiblings(node, Segment(split.first), collector);
}

int AppendValues(const xmlNode* node, const TextView& key, std::string& value, unsigned int& found)
{
    const char* const tag = "XMLGetValue";
    KX_TRACE_AS(tag, "+");
    if (node == 0 || key.IsEmpty())
    {
        KX_TRACE_AS(tag, "-");
        return StatusMissing;
    }
    KX_VALUE_AS(tag, "Key :: %s", key.data);
    const KeySplit split(key);
    Appender appender(split, value, found);
    ScanSiblings(node, Segment(split.first), appender);
    KX_TRACE_AS(tag, "-");
    return appender.GetStatus();
}

} // namespace kx
