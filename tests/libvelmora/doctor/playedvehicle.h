#pragma once

#include "libvelmora/port/iport.h"

#include <algorithm>
#include <chrono>
#include <functional>
#include <optional>
#include <string>
#include <thread>
#include <utility>
#include <vector>

namespace velmora::test {

// What the played adapter says, and after how long; "gone" breaks the link.
struct VehicleSaid
{
    std::string lines;
    int millis = 0;
};
using Player = std::function<std::optional<VehicleSaid>(std::string const& command, int times)>;

class PlayedVehicle : public IPort
{
public:
    PlayedVehicle(Player player, std::vector<std::string>& asked) : m_player(std::move(player)), m_asked(asked) {}

    void start(Receiver onBytes, LossHandler onLost) override
    {
        m_onBytes = std::move(onBytes);
        m_onLost = std::move(onLost);
    }
    void write(std::string_view bytes) override
    {
        std::string const command(bytes.substr(0, bytes.find('\r')));
        m_asked.push_back(command);
        int const times = static_cast<int>(std::count(m_asked.begin(), m_asked.end(), command));
        VehicleSaid const said = m_player(command, times).value_or(usual(command));
        std::this_thread::sleep_for(std::chrono::milliseconds(said.millis));
        if (said.lines == "gone") {
            m_onLost();
        } else {
            m_onBytes(said.lines + "\r\r>");
        }
    }
    void close() override {}

private:
    static VehicleSaid usual(std::string const& command)
    {
        bool const request = command.find_first_not_of("0123456789ABCDEF") == std::string::npos;
        return {command == "ATI"     ? "ELM327 v1.5"
                : command == "ATDPN" ? "A6"
                : command == "ATDP"  ? "ISO 15765-4 (CAN 11/500)"
                : request            ? "NO DATA"
                                     : "OK"};
    }

    Player m_player;
    std::vector<std::string>& m_asked;
    Receiver m_onBytes;
    LossHandler m_onLost;
};

} // namespace velmora::test
