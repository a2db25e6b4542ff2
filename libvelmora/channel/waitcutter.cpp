#include "libvelmora/channel/waitcutter.h"

namespace velmora {

namespace {

constexpr WireTime noticeablyLate{100}; // beyond what a slow line and a slow adapter explain
constexpr WireTime promptSoon{150};     // slow adapters take 90 ms for a command
constexpr int enoughLate = 2;
constexpr int mostVainCuts = 2;
constexpr WireTime doubtful{30};

} // namespace

void WaitCutter::saw(WireTime waited, WireTime agreed)
{
    m_recalled = false;
    m_late = waited > agreed + noticeablyLate ? m_late + 1 : 0;
}

void WaitCutter::cut(WireTime took, bool whole)
{
    m_recalled = false;
    if (!whole) {
        m_failures = mostVainCuts; // it may do worse than lose a reply, such as start anew
    } else if (took > promptSoon) {
        ++m_failures;
    }
}

void WaitCutter::recall()
{
    m_late = enoughLate;
    m_recalled = true;
}

WireTime WaitCutter::doubt() const
{
    return m_recalled ? doubtful : WireTime(0);
}

bool WaitCutter::pays() const
{
    return m_late >= enoughLate && m_failures < mostVainCuts;
}

} // namespace velmora
