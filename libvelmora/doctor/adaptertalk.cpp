#include "libvelmora/doctor/adaptertalk.h"

#include "common/text/text.h"

#include <algorithm>
#include <utility>

namespace velmora {

namespace {

constexpr std::size_t longestTalk = 65536;
constexpr std::chrono::milliseconds checkPeriod{100};

} // namespace

AdapterTalk::AdapterTalk(std::unique_ptr<IPort> port, std::function<void()> check)
    : m_check(std::move(check)), m_port(std::move(port))
{
    m_port->start([this](std::string_view bytes) { onBytes(bytes); },
                  [this] {
                      std::lock_guard const lock(m_mutex);
                      m_lost = true;
                      m_changed.notify_all();
                  });
}

AdapterTalk::~AdapterTalk()
{
    m_port->close();
}

void AdapterTalk::onBytes(std::string_view bytes)
{
    std::lock_guard const lock(m_mutex);
    if (m_received.size() < longestTalk) {
        m_received += bytes;
    }
    m_changed.notify_all();
}

bool AdapterTalk::lost() const
{
    std::lock_guard const lock(m_mutex);
    return m_lost;
}

std::optional<std::string> AdapterTalk::ask(std::string const& command, std::chrono::milliseconds limit)
{
    {
        std::lock_guard const lock(m_mutex);
        m_received.clear();
    }
    m_echoed = false;
    m_port->write(command + "\r");
    auto const until = std::chrono::steady_clock::now() + limit;
    std::unique_lock lock(m_mutex);
    auto const told = [this] { return m_lost || m_received.find('>') != std::string::npos; };
    for (auto now = until - limit; now < until; now = std::chrono::steady_clock::now()) {
        if (m_changed.wait_until(lock, std::min(until, now + checkPeriod), told)) {
            break;
        }
        lock.unlock();
        if (m_check) {
            m_check();
        }
        lock.lock();
    }
    std::size_t const prompt = m_received.find('>');
    if (prompt == std::string::npos) {
        return std::nullopt;
    }
    return cleaned(m_received.substr(0, prompt), command);
}

std::string AdapterTalk::cleaned(std::string reply, std::string const& command)
{
    m_echoed = reply.starts_with(command + "\r");
    if (m_echoed) {
        reply.erase(0, command.size());
    }
    return printableLine(reply);
}

} // namespace velmora
