#include "libvelmora/port/bluetooth/busloop.h"

#include <algorithm>
#include <chrono>
#include <limits>
#include <poll.h>
#include <utility>

namespace velmora {

namespace {

using Descriptor = asio::posix::stream_descriptor;

} // namespace

BusLoop::BusLoop(asio::io_context& context, SystemBus& bus, std::function<void()> onGone)
    : m_bus(bus.raw()), m_descriptor(context, checked(sd_bus_get_fd(m_bus))), m_timer(context),
      m_onGone(std::move(onGone))
{}

// The descriptor is the bus's own to close.
BusLoop::~BusLoop()
{
    m_descriptor.release();
}

void BusLoop::stop()
{
    m_stopped = true;
    m_timer.cancel();
    asio::error_code ignored;
    m_descriptor.cancel(ignored);
}

void BusLoop::pump()
{
    int result = 1;
    while (!m_stopped && result > 0) {
        result = sd_bus_process(m_bus, nullptr);
    }
    if (m_stopped) {
        return;
    }
    if (result < 0) {
        stop();
        m_onGone();
        return;
    }
    int const events = sd_bus_get_events(m_bus);
    if ((events & POLLIN) != 0) {
        wait(Descriptor::wait_read, m_reading);
    }
    if ((events & POLLOUT) != 0) {
        wait(Descriptor::wait_write, m_writing);
    }
    waitForTimeout();
}

void BusLoop::wait(Descriptor::wait_type kind, bool& waiting)
{
    if (std::exchange(waiting, true)) {
        return;
    }
    m_descriptor.async_wait(kind, [this, &waiting](asio::error_code const& error) {
        waiting = false;
        if (!error) {
            pump();
        }
    });
}

// The bus tells the time by the clock that steady_clock reads as well.
void BusLoop::waitForTimeout()
{
    std::uint64_t due = 0;
    if (sd_bus_get_timeout(m_bus, &due) < 0 || due == std::numeric_limits<std::uint64_t>::max()) {
        return;
    }
    auto const longest = std::chrono::duration_cast<std::chrono::microseconds>(std::chrono::hours(24));
    auto const sinceBoot = std::min<std::uint64_t>(
        due, static_cast<std::uint64_t>((std::chrono::duration_cast<std::chrono::microseconds>(
                                             std::chrono::steady_clock::now().time_since_epoch()) +
                                         longest)
                                            .count()));
    m_timer.expires_at(
        std::chrono::steady_clock::time_point(std::chrono::microseconds(static_cast<std::int64_t>(sinceBoot))));
    m_timer.async_wait([this](asio::error_code const& error) {
        if (!error) {
            pump();
        }
    });
}

} // namespace velmora
