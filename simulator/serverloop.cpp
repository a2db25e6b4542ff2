#include "simulator/serverloop.h"

namespace obdsim {

ServerLoop::ServerLoop(std::shared_ptr<IPeer> peer, double speed) : m_player(m_context, std::move(peer), speed) {}

void ServerLoop::run()
{
    begin();
    m_context.run();
}

void ServerLoop::start()
{
    const std::lock_guard<std::mutex> lock(m_mutex);
    m_thread = std::thread([this] { run(); });
}

void ServerLoop::stop()
{
    m_context.stop();
    const std::lock_guard<std::mutex> lock(m_mutex);
    if (m_thread.joinable()) {
        m_thread.join();
    }
}

asio::io_context& ServerLoop::context()
{
    return m_context;
}

PeerPlayer& ServerLoop::player()
{
    return m_player;
}

} // namespace obdsim
