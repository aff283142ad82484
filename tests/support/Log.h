#ifndef KX_TESTS_SUPPORT_LOG_H
#define KX_TESTS_SUPPORT_LOG_H

// The test program's own KxLog and g_LumLogParams: they take precedence over the platform's and
// keep every record for comparison.

#include <functional>
#include <iosfwd>
#include <string>
#include <vector>

namespace kxtest
{

constexpr unsigned kMaskNone = 0;
constexpr unsigned kMaskWarning = 1u << 8;
constexpr unsigned kMaskError = 1u << 9;
constexpr unsigned kMaskTrace = 1u << 11;
constexpr unsigned kMaskValue = 1u << 29;
constexpr unsigned kMaskXPath = 1u << 31;
constexpr unsigned kMaskAll = 0xFFFFFFFFu;

struct Record
{
    int level;
    std::string tag;
    std::string text; // as formatted
};

bool operator==(const Record& left, const Record& right);
std::ostream& operator<<(std::ostream& out, const Record& record);

using Records = std::vector<Record>;

inline Record Warning(std::string tag, std::string text)
{
    return {8, tag, text};
}
inline Record Error(std::string tag, std::string text)
{
    return {9, tag, text};
}
inline Record Trace(std::string tag, std::string text)
{
    return {11, tag, text};
}
inline Record Value(std::string tag, std::string text)
{
    return {29, tag, text};
}
inline Record XPath(std::string tag, std::string text)
{
    return {31, tag, text};
}

/** Stands in a sequence of records for a call of the engine: see EngineCalls::ShowAmongRecords().
 */
inline Record Engine(std::string call)
{
    return {0, "engine", call};
}

/** @return "+" and "-" of @p tag with the records of what it calls between them. */
Records Traced(const std::string& tag, const Records& inner = {});

/** @return @p left, then @p right. */
Records operator+(Records left, const Records& right);

/** The records of @p all that a mask lets through: what an operation must log under that mask. */
Records Under(unsigned mask, const Records& all);

/** Sets the mask and records from construction to destruction; outside of it the mask is zero. */
class LogRecorder
{
public:
    explicit LogRecorder(unsigned mask = kMaskAll);
    ~LogRecorder();
    LogRecorder(const LogRecorder&) = delete;
    LogRecorder& operator=(const LogRecorder&) = delete;

    /** @return what was recorded since the last call. */
    Records Take();

    /** The line and the format of the record taken last, which Record leaves out. */
    static int LastLine();
    static std::string LastFormat();

    static void SetMask(unsigned mask);

    /** Puts a record of the test's own into the sequence, whatever the mask. */
    static void Note(const Record& record);

    /** Number of KxLog calls in the life of the process, recorded or not. */
    static unsigned long Calls();

    /** Makes the next KxLog call run @p act, once. */
    static void OnNextCall(std::function<void()> act);

    /** Makes the n-th KxLog call from now on run @p act, once. */
    static void OnCall(unsigned long n, std::function<void()> act);

    /** Makes the n-th KxLog call from now on throw @p n > 0, or none with 0. */
    static void ThrowAt(unsigned long n);
};

/** What KxLog throws after LogRecorder::ThrowAt(). */
struct LogFailure
{
};

} // namespace kxtest

#endif
