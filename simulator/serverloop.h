#pragma once

#include "simulator/peerplayer.h"
#include "simulator/server.h"

#include <mutex>
#include <thread>

namespace obdsim {

/// What the servers share: the loop, its thread, and the end of both.
class ServerLoop : public IServer
{
public:
    void run() final;
    void start() final;
    void stop() final;

protected:
    ServerLoop(std::shared_ptr<IPeer> peer, double speed);

    asio::io_context& context();
    PeerPlayer& player();

    /// Puts the first asynchronous work into the loop.
    virtual void begin() = 0;

private:
    asio::io_context m_context;
    PeerPlayer m_player;
    std::mutex m_mutex; ///< guards m_thread
    std::thread m_thread;
};

} // namespace obdsim
