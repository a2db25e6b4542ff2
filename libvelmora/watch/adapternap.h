#pragma once

#include "libvelmora/port/iport.h"
#include "libvelmora/watch/portinbox.h"

#include <chrono>
#include <functional>
#include <memory>

namespace velmora {

// An adapter that sleeps until its own triggers wake it: on a wire it says something then, and a wireless one can be
// reached again. Nothing is sent to it meanwhile, for any byte would wake it.
class AdapterNap
{
public:
    using Open = std::function<std::unique_ptr<IPort>()>;

    // Sends it to sleep. Throws Error if the port can't be opened or breaks.
    AdapterNap(Open open, std::chrono::milliseconds limit);
    ~AdapterNap();
    AdapterNap(AdapterNap const&) = delete;
    AdapterNap& operator=(AdapterNap const&) = delete;

    // Whether the adapter knows the command.
    bool sleeps() const { return m_sleeps; }
    // Whether it has woken up.
    bool isOver();

private:
    bool command(std::string const& text);
    void reopen();

    Open const m_open;
    std::chrono::milliseconds const m_limit;
    std::shared_ptr<PortInbox> m_inbox;
    std::unique_ptr<IPort> m_port;
    bool m_sleeps = false;
};

} // namespace velmora
