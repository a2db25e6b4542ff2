#pragma once

#include "tests/support/wire/timedwire.h"

#include <algorithm>
#include <deque>
#include <map>
#include <string>
#include <utility>
#include <vector>

namespace support {

// An adapter that says what a test tells it to; say is what comes without a command.
class ScriptedWire : public LineWire
{
public:
    struct Piece
    {
        std::string bytes;
        velmora::WireTime delay{5}; // behind the command or the piece before
    };
    using Reply = std::vector<Piece>;

    // What the next such command brings; the last one told stays. Commands without any get OK.
    ScriptedWire& on(std::string const& command, Reply reply)
    {
        m_replies[command].push_back(std::move(reply));
        return *this;
    }
    ScriptedWire& on(std::string const& command, std::string const& reply)
    {
        return on(command, Reply{{reply + "\r\r>"}});
    }
    // The same where nothing was told yet.
    ScriptedWire& onDefault(std::string const& command, std::string const& reply)
    {
        return m_replies.contains(command) ? *this : on(command, reply);
    }
    // While it is silent nothing is answered, whatever was told.
    void setSilent(bool silent) { m_silent = silent; }

    // What it says comes so much later than told, and never before some time: on a link that stands still.
    void setLag(velmora::WireTime lag) { m_lag = lag; }
    void holdUntil(velmora::WireTime time) { m_heldUntil = time; }

    // What a blank brings that interrupts; without it a blank is passed over.
    void onInterrupt(Reply reply) { m_onInterrupt = std::move(reply); }

    // The commands that came, and blanks that interrupted, in their order; forgets them.
    std::vector<std::string> takeCommands() { return std::exchange(m_commands, {}); }

private:
    void interrupt() override
    {
        m_commands.emplace_back(" ");
        if (!m_onInterrupt.empty()) {
            silence();
            sayAll(m_onInterrupt);
        }
    }
    void answer(std::string const& command) override
    {
        m_commands.push_back(command);
        if (m_silent) {
            return;
        }
        Reply reply{{"OK\r\r>"}};
        if (auto const known = m_replies.find(command); known != m_replies.end()) {
            reply = known->second.front();
            if (known->second.size() > 1) {
                known->second.pop_front();
            }
        }
        sayAll(reply);
    }
    void sayAll(Reply const& reply)
    {
        velmora::WireTime delay = m_lag;
        for (Piece const& piece : reply) {
            delay = std::max(delay + piece.delay, m_heldUntil - now());
            say(piece.bytes, delay);
        }
    }

    std::map<std::string, std::deque<Reply>> m_replies;
    std::vector<std::string> m_commands;
    Reply m_onInterrupt;
    velmora::WireTime m_lag{0};
    velmora::WireTime m_heldUntil{0};
    bool m_silent = false;
};

} // namespace support
