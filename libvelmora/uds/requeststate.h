#pragma once

#include "libvelmora/uds/moduleasker.h"

#include <chrono>
#include <string>

namespace velmora {

// When a request is asked again, after what its module has said to it in this connection.
class RequestState
{
public:
    using Time = std::chrono::steady_clock::time_point;

    bool isDue(Time now) const { return !m_ended && now >= m_notBefore; }
    // Never again in this connection.
    bool ended() const { return m_ended; }
    // Why it is not asked, or was not answered of late; empty if all is well.
    std::string const& reason() const { return m_reason; }
    // The module wants to be asked for less at once.
    bool wantsSplit() const { return m_split; }

    void take(ModuleAnswer const& answer, Time now);

private:
    void takeRefusal(unsigned char code, Time now);
    void countSilence(Time now);
    void countBusy(Time now);
    void countFailure();
    void end() { m_ended = true; }

    Time m_notBefore{};
    int m_failures = 0; // in a row, that end it
    int m_silent = 0;   // in a row
    int m_busy = 0;     // in a row
    bool m_ended = false;
    bool m_split = false;
    std::string m_reason;
};

} // namespace velmora
