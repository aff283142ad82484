#include "KeyPathLookup.h"

#include "LookupWalk.h"

namespace kx
{

namespace
{

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

} // namespace

void CollectValues(const xmlNode* node, TextView key, std::string& result)
{
    if (node == 0 || key.IsEmpty())
    {
        return;
    }
    const KeySplit split(key);
    Collector collector(split, result);
    ScanSiblings<Silent>(node, Segment(split.first), collector);
}

template int AppendValues<Silent>(const xmlNode* node, TextView key, std::string& value,
                                  unsigned int& found);

} // namespace kx
