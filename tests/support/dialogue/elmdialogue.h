#pragma once

#include "tests/support/wire/scriptedchannel.h"

#include <string>

namespace support {

// The dialogues of a healthy "ELM327 v1.5", laid on a channel for tests of what stands above the driver.

// What ElmScantool::initialize says. The echo is on until it is turned off.
inline void expectInitialize(ScriptedChannel& channel)
{
    channel.expect("ATI").reply("ATI\rELM327 v1.5\r\r>");
    channel.expect("AT@1").reply("AT@1\rOBDII to RS232 Interpreter\r\r>");
    channel.expect("AT@2").reply("AT@2\r?\r\r>");
    channel.expect("ATE0").reply("ATE0\rOK\r\r>");
    for (char const* command : {"ATL0", "ATS0", "ATM0", "ATST64"}) {
        channel.expect(command).reply("OK\r\r>");
    }
}

// What ElmScantool::detectVehicle says at the first try. probeReply answers 0100, number answers ATDPN.
inline void expectDetectVehicle(ScriptedChannel& channel, int protocol = 0,
                                std::string const& probeReply = "SEARCHING...\r4100BE3FA813\r\r>",
                                std::string const& number = "A6",
                                std::string const& description = "AUTO, ISO 15765-4 (CAN 11/500)")
{
    channel.expect("ATTP" + std::to_string(protocol)).reply("OK\r\r>");
    channel.expect("0100").reply(probeReply);
    channel.expect("ATDPN").reply(number + "\r\r>");
    channel.expect("ATDP").reply(description + "\r\r>");
    channel.expect("ATH1").reply("OK\r\r>");
}

// What IObdProxy::initialize says to one CAN module, 0x7E8, that supports the engine speed alone.
inline void expectModuleDetection(ScriptedChannel& channel)
{
    channel.whenever("0100").reply("7E806410000100000\r\r>");
    channel.whenever("0600").reply("NO DATA\r\r>");
    channel.whenever("0800").reply("NO DATA\r\r>");
    channel.whenever("0900").reply("NO DATA\r\r>");
}

// A whole opening that succeeds.
inline void expectOpening(ScriptedChannel& channel)
{
    expectInitialize(channel);
    expectDetectVehicle(channel);
    expectModuleDetection(channel);
}

// What ElmScantool::close says.
inline void expectClose(ScriptedChannel& channel)
{
    channel.expect("ATLP").reply("OK\r\r>");
}

} // namespace support
