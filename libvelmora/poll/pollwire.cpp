#include "libvelmora/poll/pollwire.h"

#include <common/clock.h>
#include <obd/nack.h>

#include <utility>

namespace velmora {

namespace {

constexpr unsigned char liveService = 0x01;

} // namespace

PollWire::PollWire(std::shared_ptr<obd::IObdProxy> proxy, std::chrono::milliseconds gap, IChannelControl* channel)
    : m_proxy(std::move(proxy)), m_gap(gap), m_channel(channel), m_millis(tervex::currentMillis())
{}

PollWire::Time PollWire::now()
{
    std::uint32_t const millis = tervex::currentMillis();
    m_now += std::chrono::milliseconds(static_cast<std::uint32_t>(millis - m_millis));
    m_millis = millis;
    return m_now;
}

void PollWire::keepGap()
{
    Time const start = now();
    if (start < m_next) {
        auto const wait = std::chrono::duration_cast<std::chrono::milliseconds>(m_next - start);
        tervex::sleepMillis(static_cast<unsigned int>(wait.count()));
    }
    m_next = now() + m_gap;
}

obd::IDevice::Status PollWire::execute(std::vector<unsigned char> const& request, obd::ResponseMap& responses,
                                       unsigned int timeoutMs, std::optional<unsigned int> module)
{
    keepGap();
    std::optional<AddressedModule> address;
    if (module && m_channel != nullptr) {
        address.emplace(*m_channel, *module);
    }
    obd::IDevice::Status const status = m_proxy->execute(request, responses, timeoutMs);
    if (status != obd::IDevice::Status::Ok || request.size() != 2 || request[0] != liveService) {
        return status;
    }
    for (auto const& [sender, payload] : responses) {
        if (payload.size() > 2 && payload[0] == obd::positiveReply(liveService) && payload[1] == request[1]) {
            m_notes.note(sender, request[1], now());
        }
    }
    return status;
}

} // namespace velmora
