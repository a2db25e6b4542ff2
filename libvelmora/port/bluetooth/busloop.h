#pragma once

#include "libvelmora/port/bluetooth/systembus.h"

#include <asio/io_context.hpp>
#include <asio/posix/stream_descriptor.hpp>
#include <asio/steady_timer.hpp>

#include <functional>

namespace velmora {

// Has an io_context handle what comes on a bus. All of one thread: that which runs the context.
class BusLoop
{
public:
    // onGone is called once if the bus itself is lost.
    BusLoop(asio::io_context& context, SystemBus& bus, std::function<void()> onGone);
    ~BusLoop();
    BusLoop(BusLoop const&) = delete;
    BusLoop& operator=(BusLoop const&) = delete;

    // To be called after each message that was queued, since those are written lazily.
    void pump();
    // Waits for nothing any more, so that the context can end.
    void stop();

private:
    void wait(asio::posix::stream_descriptor::wait_type kind, bool& waiting);
    void waitForTimeout();

    sd_bus* m_bus;
    asio::posix::stream_descriptor m_descriptor;
    asio::steady_timer m_timer;
    std::function<void()> m_onGone;
    bool m_reading = false;
    bool m_writing = false;
    bool m_stopped = false;
};

} // namespace velmora
