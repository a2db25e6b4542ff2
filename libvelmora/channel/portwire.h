#pragma once

#include "libvelmora/channel/wire.h"
#include "libvelmora/port/ipulledport.h"

#include <atomic>
#include <condition_variable>
#include <memory>
#include <mutex>

namespace velmora {

// An open port as a wire, with the system's clock. Starts the port, unless that can be read by who waits for its bytes,
// and closes it in the end.
class PortWire : public IWire
{
public:
    explicit PortWire(std::unique_ptr<IPort> port);
    ~PortWire() override;
    PortWire(PortWire const&) = delete;
    PortWire& operator=(PortWire const&) = delete;

    void write(std::string_view bytes) override;
    std::string read(WireTime until) override;
    WireTime now() const override;
    bool isUp() const override;
    void giveUp() override;
    bool resume() override;

    // Whether the link broke, rather than being given up here.
    bool lost() const;

private:
    void start();
    std::string pull(WireTime until);
    void lookAfterLink() const;
    void endLink(bool lost) const;

    std::unique_ptr<IPort> m_port;
    IPulledPort* const m_pulled; // the same, if it can be read so
    mutable std::atomic<WireTime::rep> m_seenUp{0};
    mutable std::mutex m_mutex;
    mutable std::condition_variable m_wake;
    std::string m_incoming; // of a port with a thread; protected by m_mutex, as what follows
    mutable bool m_open = true;
    bool m_givenUp = false;
    mutable bool m_lost = false;
};

} // namespace velmora
