#pragma once

#include "libvelmora/channel/wire.h"

#include <algorithm>
#include <deque>
#include <map>
#include <string>
#include <utility>
#include <vector>

namespace support {

// An adapter that says what a test tells it to, in time that only reading moves on.
class ScriptedWire : public velmora::IWire
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
    // Said without a command.
    void say(std::string const& bytes, velmora::WireTime delay) { m_output.emplace(m_now + delay, bytes); }

    void write(std::string_view bytes) override
    {
        for (char const character : bytes) {
            if (character == '\r') {
                answer(std::exchange(m_line, {}));
            } else {
                m_line += character;
            }
        }
    }

    std::string read(velmora::WireTime until) override
    {
        auto const next = m_output.begin();
        if (next == m_output.end() || next->first > until) {
            m_now = std::max(m_now, until);
            return {};
        }
        m_now = std::max(m_now, next->first);
        std::string bytes = next->second;
        m_output.erase(next);
        return bytes;
    }

    velmora::WireTime now() const override { return m_now; }
    bool isUp() const override { return m_up; }
    void giveUp() override { m_up = false; }
    bool resume() override { return m_up = true; }

    // The commands that came, in their order; forgets them.
    std::vector<std::string> takeCommands() { return std::exchange(m_commands, {}); }

private:
    void answer(std::string const& command)
    {
        m_commands.push_back(command);
        Reply reply{{"OK\r\r>"}};
        if (auto const known = m_replies.find(command); known != m_replies.end()) {
            reply = known->second.front();
            if (known->second.size() > 1) {
                known->second.pop_front();
            }
        }
        velmora::WireTime at = m_now;
        for (Piece const& piece : reply) {
            at += piece.delay;
            m_output.emplace(at, piece.bytes);
        }
    }

    std::map<std::string, std::deque<Reply>> m_replies;
    std::multimap<velmora::WireTime, std::string> m_output;
    std::vector<std::string> m_commands;
    std::string m_line;
    velmora::WireTime m_now{1000};
    bool m_up = true;
};

} // namespace support
