#pragma once

#include "libvelmora/channel/wire.h"

#include <algorithm>

namespace velmora {

// What an adapter owes that was not waited for any more, and how long it takes for everything.
class LateAnswers
{
public:
    // Nothing comes later than that.
    static constexpr WireTime limit{5000};

    // It was asked who it is. The answer is owed until it has come, or for some time where the question was swallowed.
    void askedIdentity(WireTime now)
    {
        m_owed = owes(now) ? m_owed + 1 : 1;
        m_until = now + limit;
    }
    // An answer to that has come.
    void settledIdentity() { m_owed = std::max(m_owed - 1, 0); }
    bool owes(WireTime now) const { return m_owed > 0 && now <= m_until; }

    // A command of the adapter itself, which waits for nobody else, took so long beside its way.
    void tookForCommand(WireTime took) { m_lateness = took > lateFrom ? std::min(took, limit) : WireTime(0); }
    // What an adapter that was slow the last time may take beside all limits of time.
    WireTime lateness() const { return m_lateness; }

private:
    static constexpr WireTime lateFrom{300}; // slow adapters take 90 ms for a command

    int m_owed = 0;
    WireTime m_until{0};
    WireTime m_lateness{0};
};

} // namespace velmora
