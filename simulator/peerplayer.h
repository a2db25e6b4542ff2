#pragma once

#include "simulator/peer.h"

#include <asio/io_context.hpp>
#include <asio/steady_timer.hpp>

#include <functional>
#include <memory>

namespace obdsim {

/// Moves the clock of a peer along with the real one, and hands out what it says
/// when it says it. To be used on the thread of the io_context only.
class PeerPlayer
{
public:
    using Output = std::function<void(std::string)>;
    using LinkLost = std::function<void()>;

    PeerPlayer(asio::io_context& context, std::shared_ptr<IPeer> peer, double speed);

    /// A client is there; `output` gets bytes for it, `linkLost` is called once
    /// when the simulated link breaks. Neither is called from within a call to
    /// this object.
    void connect(Output output, LinkLost linkLost);

    void receive(std::string_view bytes);

    /// Moves the peer's clock to now and hands out what it has said.
    void catchUp();

    /// The peer was changed from outside: what it does next may come sooner.
    void goOn();

    /// The client has gone.
    void disconnect();

private:
    Time virtualNow() const;
    void arm();
    void play();

    std::shared_ptr<IPeer> m_peer;
    double m_speed;
    std::chrono::steady_clock::time_point m_start;
    Time m_offset;
    asio::steady_timer m_timer;
    Output m_output;
    LinkLost m_linkLost;
};

} // namespace obdsim
