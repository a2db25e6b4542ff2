#pragma once

#include "libvelmora/channel/wire.h"
#include "libvelmora/port/iport.h"

#include <condition_variable>
#include <memory>
#include <mutex>

namespace velmora {

// An open port as a wire, with the system's clock. Starts the port, and closes it in the end.
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
    std::unique_ptr<IPort> m_port;
    mutable std::mutex m_mutex;
    std::condition_variable m_wake;
    std::string m_incoming; // protected by m_mutex, as what follows
    bool m_open = true;
    bool m_givenUp = false;
    bool m_lost = false;
};

} // namespace velmora
