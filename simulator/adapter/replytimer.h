#pragma once

#include "simulator/adapter/profile.h"
#include "simulator/adapter/settings.h"

namespace obdsim {

/// How long an adapter listens for one more reply behind the last: by ATST, and with adaptive timing by what it has
/// learnt of the modules.
class ReplyTimer
{
public:
    /// The timing must outlive this.
    explicit ReplyTimer(AdapterTiming const& timing);

    Time wait(Settings const& settings) const;

    /// The same behind a frame that promises more of its message. An adapter that makes up flow control by itself knows
    /// of them, and what it has learnt of single frames says nothing of their gaps.
    Time waitForRest(Settings const& settings) const;

    /// A reply came that long after the end of the request.
    void learn(Time reply);

    /// A new protocol.
    void forget();

private:
    AdapterTiming const& m_timing;
    std::optional<Time> m_slowest;
};

} // namespace obdsim
