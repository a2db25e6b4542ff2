#pragma once

#include "simulator/peerplayer.h"
#include "simulator/server.h"

#include <mutex>
#include <thread>

namespace obdsim {

/// Where the clients of one peer come in.
class Endpoint
{
public:
    virtual ~Endpoint() = default;

    virtual std::string address() const = 0;

    /// Puts the first asynchronous work into the loop.
    virtual void begin() = 0;

    PeerPlayer& player() { return m_player; }

protected:
    Endpoint(asio::io_context& context, std::shared_ptr<IPeer> peer, double speed)
        : m_player(context, std::move(peer), speed)
    {}

private:
    PeerPlayer m_player;
};

/// The loop of one or many endpoints, its thread, and the end of both.
class ServerLoop : public IServer
{
public:
    ~ServerLoop() override;

    void add(std::unique_ptr<Endpoint> endpoint);

    std::string address() const override;
    std::vector<std::string> addresses() const override;
    void run() override;
    void start() override;
    void stop() override;
    void perform(std::function<void()> action) override;

    /// perform() for who is on the server's thread already.
    void atOnce(std::function<void()> const& action);

    asio::io_context& context();

private:
    asio::io_context m_context;
    std::vector<std::unique_ptr<Endpoint>> m_endpoints;
    std::mutex m_mutex; ///< guards m_thread
    std::thread m_thread;
};

} // namespace obdsim
