#include "libvelmora/channel/waitcutter.h"

namespace velmora {

namespace {

constexpr WireTime noticeablyLate{100}; // beyond what a slow line and a slow adapter explain
constexpr WireTime promptSoon{150};     // slow adapters take 90 ms for a command
constexpr int enoughLate = 2;
constexpr int mostVainCuts = 2;

} // namespace

void WaitCutter::saw(WireTime waited, WireTime agreed)
{
    m_late = waited > agreed + noticeablyLate ? m_late + 1 : 0;
}

void WaitCutter::cut(WireTime took, bool whole)
{
    if (!whole) {
        m_failures = mostVainCuts; // it may do worse than lose a reply, such as start anew
    } else if (took > promptSoon) {
        ++m_failures;
    }
}

bool WaitCutter::pays() const
{
    return m_late >= enoughLate && m_failures < mostVainCuts;
}

} // namespace velmora
