#pragma once

#include "tests/libvelmora/channel/channelrig.h"
#include "tests/support/wire/scriptedwire.h"

#include <string>

// Replies with the time that adapters take for them.
namespace velmora::test {

using Pieces = support::ScriptedWire::Reply;

inline std::string const speedLine = "7E804410C1AF8";
inline std::string const speedOfTwo = "7E804410C1AF8\r7E904410C1AF9";

// What an adapter that waits says plainly, and with a count.
inline Pieces saidPlainly(std::string const& lines)
{
    return {{lines + "\r"}, {"\r>", WireTime(80)}};
}
inline Pieces saidCounted(std::string const& lines)
{
    return {{lines + "\r\r>"}};
}

// An adapter that ignores its adaptive timing: 400 ms behind each reply, or what ATST tells.
inline Pieces saidSlowly(std::string const& lines, int waitMs)
{
    return {{lines + "\r", WireTime(20)}, {"\r>", WireTime(waitMs)}};
}

// Asks for the speed until it is known how many replies it has.
inline void learnSpeed(ChannelRig& rig)
{
    rig.wire->on("010C", saidPlainly(speedLine)).on("010C1", saidCounted(speedLine));
    rig.ask("010C");
    rig.ask("010C");
    rig.wire->takeCommands();
}

} // namespace velmora::test
