#include "simulator/serverloop.h"

#include <asio/post.hpp>

namespace obdsim {

ServerLoop::~ServerLoop()
{
    ServerLoop::stop();
}

void ServerLoop::add(std::unique_ptr<Endpoint> endpoint)
{
    m_endpoints.push_back(std::move(endpoint));
}

std::string ServerLoop::address() const
{
    return m_endpoints.front()->address();
}

std::vector<std::string> ServerLoop::addresses() const
{
    std::vector<std::string> all;
    for (auto const& endpoint : m_endpoints) {
        all.push_back(endpoint->address());
    }
    return all;
}

void ServerLoop::run()
{
    for (auto const& endpoint : m_endpoints) {
        endpoint->begin();
    }
    m_context.run();
}

void ServerLoop::start()
{
    std::lock_guard<std::mutex> const lock(m_mutex);
    m_thread = std::thread([this] { run(); });
}

void ServerLoop::stop()
{
    m_context.stop();
    std::lock_guard<std::mutex> const lock(m_mutex);
    if (m_thread.joinable()) {
        m_thread.join();
    }
}

void ServerLoop::perform(std::function<void()> action)
{
    asio::post(m_context, [this, action = std::move(action)] { atOnce(action); });
}

void ServerLoop::atOnce(std::function<void()> const& action)
{
    for (auto const& endpoint : m_endpoints) {
        endpoint->player().catchUp();
    }
    action();
    for (auto const& endpoint : m_endpoints) {
        endpoint->player().goOn();
    }
}

asio::io_context& ServerLoop::context()
{
    return m_context;
}

} // namespace obdsim
