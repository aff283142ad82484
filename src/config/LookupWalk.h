#ifndef KX_CONFIG_LOOKUPWALK_H
#define KX_CONFIG_LOOKUPWALK_H

#include "KeyPathLookup.h"
#include "SiblingScan.h"
#include "diag/Log.h"
#include "diag/Status.h"

namespace kx
{

/** One level of the lookup that separates every value. */
template <class Observer>
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
        Observer::Value(text);
        if (text != 0)
        {
            AppendSeparated(ContentOf(text));
        }
        if (m_key.hasRest)
        {
            m_status = AppendValues<Observer>(element, m_key.rest, m_value, m_found);
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

template <class Observer>
int AppendValues(const xmlNode* node, TextView key, std::string& value, unsigned int& found)
{
    const char* const tag = "XMLGetValue";
    if (node == 0 || key.IsEmpty())
    {
        KX_TRACE_AS(tag, "+");
        Observer::EmptyKey(node);
        KX_TRACE_AS(tag, "-");
        return StatusMissing;
    }
    KX_LOG_EITHER(LogLevelTrace, LogLevelValue)
    {
        KX_TRACE_AS(tag, "+");
        KX_VALUE_AS(tag, "Key :: %s", key.data);
    }
    const KeySplit split(key);
    Appender<Observer> appender(split, value, found);
    Observer::EnterLevel(node);
    ScanSiblings<Observer>(node, Segment(split.first), appender);
    Observer::LeaveLevel();
    KX_TRACE_AS(tag, "-");
    return appender.GetStatus();
}

} // namespace kx

#endif
