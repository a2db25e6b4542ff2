#pragma once

#include "libvelmora/channel/ichannelcontrol.h"
#include "libvelmora/poll/answernotes.h"

#include <obd/iobdproxy.h>

#include <chrono>
#include <cstdint>
#include <memory>
#include <optional>

namespace velmora {

// The way of the poller's requests to the vehicle: keeps the gap between them, and notes who answered what and when.
class PollWire
{
public:
    using Time = AnswerNotes::Time;

    // channel sends requests to one module alone; null where there is none.
    PollWire(std::shared_ptr<obd::IObdProxy> proxy, std::chrono::milliseconds gap, IChannelControl* channel = nullptr);

    obd::IDevice::Status execute(std::vector<unsigned char> const& request, obd::ResponseMap& responses,
                                 unsigned int timeoutMs, std::optional<unsigned int> module = {});

    obd::IObdProxy& proxy() const { return *m_proxy; }
    AnswerNotes& notes() { return m_notes; }

    // The library's clock, unwrapped.
    Time now();

private:
    void keepGap();

    std::shared_ptr<obd::IObdProxy> m_proxy;
    std::chrono::milliseconds m_gap;
    IChannelControl* m_channel;
    AnswerNotes m_notes;
    Time m_next; // no request before
    Time m_now{std::chrono::hours(1)};
    std::uint32_t m_millis;
};

} // namespace velmora
