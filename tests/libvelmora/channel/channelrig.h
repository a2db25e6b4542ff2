#pragma once

#include "libvelmora/channel/fastchannel.h"
#include "tests/support/wire/scriptedwire.h"

#include <algorithm>
#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace velmora::test {

// Speaks with a channel as the core's driver does: drains, sends, reads in slices. Nothing if no reply came in time.
inline std::optional<std::string> speak(obd::IDataConnection& channel, std::string const& text, int timeoutMs)
{
    constexpr int slice = 250;
    std::vector<unsigned char> bytes;
    while (channel.receive(bytes, 0)) {
    }
    std::string const line = text + "\r";
    channel.send({line.begin(), line.end()});
    for (int left = timeoutMs; left > 0 && channel.isValid(); left -= slice) {
        if (channel.receive(bytes, std::min(left, slice))) {
            std::string reply(bytes.begin(), bytes.end());
            std::erase(reply, '\r');
            return reply;
        }
    }
    return std::nullopt;
}

struct ChannelRig
{
    explicit ChannelRig(std::shared_ptr<LearntStore> store = nullptr, ChannelOptions options = {})
        : channel(wire, std::move(options), std::move(store))
    {
        wire->on("ATDPN", "A6");
    }

    std::optional<std::string> ask(std::string const& text, int timeoutMs = 1500)
    {
        return speak(channel, text, timeoutMs);
    }
    // As far as the core goes before the first request with headers.
    void bringUp()
    {
        wire->onDefault("ATI", "ELM327 v1.5");
        wire->onDefault("0100", "7E8064100BE3EA813");
        for (char const* command : {"ATI", "ATE0", "ATL0", "ATS0", "ATST64", "ATTP0"}) {
            ask(command);
        }
        ask("0100", 10000);
        ask("ATDPN");
        ask("ATH1");
    }
    void connect()
    {
        bringUp();
        channel.onConnected();
        wire->takeCommands();
    }
    unsigned int met(Habit habit) { return channel.statistics().habits[static_cast<std::size_t>(habit)]; }

    std::shared_ptr<support::ScriptedWire> wire = std::make_shared<support::ScriptedWire>();
    FastChannel channel;
};

} // namespace velmora::test
