// That completion ends in time on any file. The timer of the system is replaced by one that runs
// out when a test says so.

#include "ToolTest.h"

#include <algorithm>
#include <vector>

#include <signal.h>
#include <sys/syscall.h>
#include <sys/time.h>
#include <unistd.h>

using namespace kxtest;

namespace
{

int g_alarms = -1; ///< sent as soon as the timer starts; negative: the timer is the system's
std::vector<itimerval> g_timers;

} // namespace

extern "C" int setitimer(__itimer_which_t which, const itimerval* timer, itimerval* former) noexcept
{
    if (g_alarms < 0)
    {
        return static_cast<int>(syscall(SYS_setitimer, which, timer, former));
    }
    g_timers.push_back(*timer);
    const int alarms = timer->it_value.tv_usec == 0 ? 0 : g_alarms;
    for (int i = 0; i != alarms; ++i)
    {
        raise(SIGALRM);
    }
    return 0;
}

class KxconfigCompletionLimit : public ToolTest
{
protected:
    /** @return what is offered for a key if @p alarms come at once. */
    std::string Offered(int alarms, const std::string& start = "c.")
    {
        g_alarms = alarms;
        g_timers.clear();
        const std::string out = Tool({"--complete", "get", m_file, start}).out;
        g_alarms = -1;
        return out;
    }

    const std::string m_file = m_folder.Write("keys.xml", "<c><a>1</a><b>2</b><d>3</d></c>");
};

TEST_F(KxconfigCompletionLimit, OffersAllKeysInTime)
{
    EXPECT_EQ("c.a\nc.b\nc.d\n", Offered(0));
}

TEST_F(KxconfigCompletionLimit, OffersTheKeysFoundWhenTheTimeIsOver)
{
    EXPECT_EQ("c.a\n", Offered(1));
}

TEST_F(KxconfigCompletionLimit, EndsTheProcessSilentlyIfItIsNotDoneSoonAfter)
{
    EXPECT_EXIT(Offered(2), testing::ExitedWithCode(0), "^$");
}

TEST_F(KxconfigCompletionLimit, LeavesTheShellAPartOfASecond)
{
    Offered(0);
    ASSERT_EQ(2U, g_timers.size());
    EXPECT_EQ(0, g_timers[0].it_value.tv_sec + g_timers[0].it_interval.tv_sec);
    EXPECT_LE(g_timers[0].it_value.tv_usec + g_timers[0].it_interval.tv_usec, 900000);
    EXPECT_EQ(0, g_timers[1].it_value.tv_usec); // stopped
}

TEST_F(KxconfigCompletionLimit, OffersNoMoreThanAShellQuotesInTime)
{
    const std::string name(20000, 'n');
    std::string xml = "<c>";
    for (char last = 'a'; last <= 'z'; ++last)
    {
        xml += "<" + name + last + ">x</" + name + last + ">";
    }
    kxtest::WriteFile(m_file, xml + "<m>x</m></c>");
    const std::string offered = Offered(0);
    EXPECT_EQ("c." + name + "a\nc.m\n", offered); // what they have in common is that of all keys
}
