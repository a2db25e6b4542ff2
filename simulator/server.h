#pragma once

#include "simulator/error.h"
#include "simulator/peer.h"

#include <cstdint>
#include <functional>
#include <memory>
#include <string>
#include <vector>

namespace obdsim {

/// A server that cannot be set up: address in use, no pseudo-terminal left.
class ServerError : public SimulatorError
{
public:
    using SimulatorError::SimulatorError;
};

/// Plays a peer in real time to one client after another.
///
/// stop() may be called from any thread, more than once, and returns when the
/// server has ended, within milliseconds. The destructor stops.
class IServer
{
public:
    virtual ~IServer() = default;

    /// What clients connect to: "127.0.0.1:35000", or the path of a device. Of a fleet the first.
    virtual std::string address() const = 0;

    /// One for each peer.
    virtual std::vector<std::string> addresses() const = 0;

    /// Serves on the calling thread until stop().
    virtual void run() = 0;

    /// Serves on a thread of the server's own.
    virtual void start() = 0;

    virtual void stop() = 0;

    /// Does `action` on the server's thread as soon as it can, with the clock of every peer moved to now. What changes
    /// a peer from outside goes this way. Before the server runs it waits for it.
    virtual void perform(std::function<void()> action) = 0;
};

using Peers = std::vector<std::shared_ptr<IPeer>>;

/// Listens on one TCP port for each peer, from `port` on; port 0 takes free ones. Throws ServerError.
std::unique_ptr<IServer> serveTcp(Peers const& peers, std::string const& host, std::uint16_t port, double speed = 1);

/// One pseudo-terminal for each peer. Throws ServerError.
std::unique_ptr<IServer> servePseudoTerminals(Peers const& peers, double speed = 1);

/// Listens on a TCP port; port 0 takes a free one. `speed` makes the simulated
/// time run faster. Throws ServerError.
std::unique_ptr<IServer> serveTcp(std::shared_ptr<IPeer> peer, std::string const& host, std::uint16_t port,
                                  double speed = 1);

/// Opens a pseudo-terminal, whose device any program for serial adapters can use.
/// When the simulated link breaks the device goes away. Throws ServerError.
std::unique_ptr<IServer> servePseudoTerminal(std::shared_ptr<IPeer> peer, double speed = 1);

} // namespace obdsim
