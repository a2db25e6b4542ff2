#pragma once

#include "libvelmora/port/iport.h"
#include "libvelmora/port/portaddress.h"
#include "simulator/peer.h"

#include <chrono>
#include <condition_variable>
#include <memory>
#include <mutex>
#include <string>
#include <thread>

namespace velmora {

// A simulated adapter in this process. Its clock follows the real one, but an instant one is moved on to each output.
class PeerPort : public IPort
{
public:
    explicit PeerPort(std::shared_ptr<obdsim::IPeer> peer, bool instant = false);
    ~PeerPort() override;
    PeerPort(PeerPort const&) = delete;
    PeerPort& operator=(PeerPort const&) = delete;

    void start(Receiver onBytes, LossHandler onLost) override;
    void write(std::string_view bytes) override;
    void close() override;

private:
    obdsim::Time elapsed() const;
    void run();
    void waitForWork(std::unique_lock<std::mutex>& lock);

    std::shared_ptr<obdsim::IPeer> m_peer; // the port's thread alone
    bool const m_instant;
    Receiver m_onBytes;
    LossHandler m_onLost;
    std::chrono::steady_clock::time_point m_start; // moved back to move the peer's clock on

    std::mutex m_mutex;
    std::condition_variable m_wake;
    std::string m_toPeer; // protected by m_mutex
    bool m_stop = false;  // protected by m_mutex
    std::thread m_thread;
};

// A vehicle of the simulator, by name or by its file. Throws Error for one that can't be had.
std::unique_ptr<IPort> openSimulatorPort(SimulatorAddress const& address);

// A recorded dialogue, served as an adapter. Throws Error for a file that can't be read.
std::unique_ptr<IPort> openReplayPort(ReplayAddress const& address);

} // namespace velmora
