#pragma once

#include "libvelmora/channel/ichannelcontrol.h"
#include "tests/support/fakeclock.h"
#include "tests/support/fakeproxy.h"

#include <deque>
#include <functional>
#include <map>
#include <string>
#include <utility>
#include <vector>

namespace support {

// Modules beyond OBD as a test wants them, behind proxy and channel at once: lines of an adapter by header and request.
// What nothing was said of gets NO DATA. An exchange takes 20 ms of the clock, if there is one.
class ModuleBench : public FakeProxy, public velmora::IChannelControl
{
public:
    explicit ModuleBench(FakeClock* clock = nullptr) : m_clock(clock) {}

    // The last one told stays.
    ModuleBench& module(std::string const& header, std::string const& request, std::vector<std::string> lines)
    {
        m_replies[{header, request}].push_back(std::move(lines));
        return *this;
    }
    ModuleBench& refuseAddress(std::string const& command)
    {
        m_refused = command;
        return *this;
    }

    // The adapter says nothing any more, not even that nobody answered.
    void fallMute() { m_mute = true; }

    // "7E1 221E1C" of each request so far; forgets them.
    std::vector<std::string> takeAsked() { return std::exchange(m_asked, {}); }
    std::vector<velmora::RequestAddress> const& addresses() const { return m_addresses; }

    Status execute(std::string const& command, std::string& response, unsigned int timeoutMs) override
    {
        if (m_clock != nullptr) {
            m_clock->advance(20);
        }
        if (!m_address) {
            return FakeProxy::execute(command, response, timeoutMs);
        }
        if (command == "ATI") {
            m_reply.lines = std::exchange(m_shown, {}); // what it showed of the bus until then
            return Status::Ok;
        }
        m_asked.push_back(m_address->header + " " + command);
        m_addresses.push_back(*m_address);
        m_reply = {};
        if (!m_refused.empty()) {
            return Status::NoResponse;
        }
        m_reply.answered = !m_mute;
        auto const found = m_replies.find({m_address->header, command});
        if (found == m_replies.end()) {
            m_reply.error = "NODATA";
            return Status::NoResponse;
        }
        m_reply.lines = found->second.front();
        if (command == "ATMA") {
            m_shown = std::exchange(m_reply.lines, {});
            return Status::NoResponse;
        }
        if (found->second.size() > 1) {
            found->second.pop_front();
        }
        if (m_reply.lines.size() == 1 && m_reply.lines.front().find(' ') != std::string::npos) {
            m_reply.error = "CANERROR";
        }
        return Status::Ok;
    }
    using FakeProxy::execute;

    void addressModule(std::optional<unsigned int> /*module*/) override { m_address.reset(); }
    void address(std::optional<velmora::RequestAddress> const& address) override { m_address = address; }
    std::string refusedAddress() const override { return m_refused; }
    velmora::AddressedReply takeReply() override { return std::exchange(m_reply, {}); }
    void onConnected() override {}
    velmora::ChannelStatistics statistics() const override { return {}; }

private:
    FakeClock* const m_clock;
    std::map<std::pair<std::string, std::string>, std::deque<std::vector<std::string>>> m_replies;
    std::optional<velmora::RequestAddress> m_address;
    std::string m_refused;
    bool m_mute = false;
    std::vector<std::string> m_shown;
    velmora::AddressedReply m_reply;
    std::vector<std::string> m_asked;
    std::vector<velmora::RequestAddress> m_addresses;
};

} // namespace support
