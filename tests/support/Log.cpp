#include "support/Log.h"

#include "KxLog.h"

#include <cstdarg>
#include <cstdio>
#include <ostream>
#include <utility>

LumLogParams g_LumLogParams = {};

namespace
{

kxtest::Records g_records;
bool g_recording = false;
unsigned long g_calls = 0;
unsigned long g_throwAt = 0;
int g_lastLine = 0;
std::string g_lastFormat;
unsigned long g_callsUntilAct = 0;
std::function<void()> g_act;

} // namespace

// The objects above stand in for the platform's on purpose: no violation, under a sanitizer.
extern "C" const char* __asan_default_options()
{
    return "detect_odr_violation=0";
}

extern "C" int KxLog(int line, int level, const char* tag, const char* format, ...)
{
    ++g_calls;
    if (g_throwAt != 0 && --g_throwAt == 0)
    {
        throw kxtest::LogFailure();
    }
    if (g_recording)
    {
        va_list arguments;
        va_start(arguments, format);
        const int length = std::vsnprintf(nullptr, 0, format, arguments);
        va_end(arguments);
        std::string text(static_cast<size_t>(length) + 1, '\0');
        va_start(arguments, format);
        std::vsnprintf(text.data(), text.size(), format, arguments);
        va_end(arguments);
        text.pop_back();
        g_records.push_back({level, tag, text});
        g_lastLine = line;
        g_lastFormat = format;
    }
    if (g_act && --g_callsUntilAct == 0)
    {
        std::exchange(g_act, nullptr)();
    }
    return -1; // whatever: callers ignore it
}

namespace kxtest
{

bool operator==(const Record& left, const Record& right)
{
    return left.level == right.level && left.tag == right.tag && left.text == right.text;
}

std::ostream& operator<<(std::ostream& out, const Record& record)
{
    return out << "\n  " << record.level << ' ' << record.tag << " \"" << record.text << '"';
}

Records operator+(Records left, const Records& right)
{
    left.insert(left.end(), right.begin(), right.end());
    return left;
}

Records Traced(const std::string& tag, const Records& inner)
{
    return Records({Trace(tag, "+")}) + inner + Records({Trace(tag, "-")});
}

Records Under(unsigned mask, const Records& all)
{
    Records kept;
    for (const Record& record : all)
    {
        if ((mask >> record.level & 1u) != 0)
        {
            kept.push_back(record);
        }
    }
    return kept;
}

LogRecorder::LogRecorder(unsigned mask)
{
    g_records.clear();
    g_recording = true;
    SetMask(mask);
}

LogRecorder::~LogRecorder()
{
    SetMask(kMaskNone);
    g_recording = false;
    g_throwAt = 0;
    g_act = nullptr;
}

Records LogRecorder::Take()
{
    Records taken;
    taken.swap(g_records);
    return taken;
}

int LogRecorder::LastLine()
{
    return g_lastLine;
}
std::string LogRecorder::LastFormat()
{
    return g_lastFormat;
}
void LogRecorder::SetMask(unsigned mask)
{
    g_LumLogParams.xmlConfigParserMask = mask;
}
void LogRecorder::Note(const Record& record)
{
    if (g_recording)
    {
        g_records.push_back(record);
    }
}
unsigned long LogRecorder::Calls()
{
    return g_calls;
}
void LogRecorder::OnNextCall(std::function<void()> act)
{
    OnCall(1, std::move(act));
}
void LogRecorder::OnCall(unsigned long n, std::function<void()> act)
{
    g_callsUntilAct = n;
    g_act = std::move(act);
}
void LogRecorder::ThrowAt(unsigned long n)
{
    g_throwAt = n;
}

} // namespace kxtest
