#pragma once

#include "tests/support/bytes.h"
#include "tests/support/fakeclock.h"

#include <obd/databridge.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <atomic>
#include <deque>
#include <limits>
#include <map>
#include <mutex>
#include <optional>
#include <ostream>
#include <string>
#include <string_view>
#include <vector>

namespace support {

// What the far end of a channel says, piece by piece:
//   script.after(300).reply("SEARCHING...\r").after(2000).reply("7E8 06 41 00 BE 3F A8 13\r\r>");
class Script
{
public:
    // Bytes that arrive right after what went before.
    Script& reply(std::string_view characters)
    {
        m_pieces.push_back({m_delay, std::string(characters), false});
        m_delay = 0;
        return *this;
    }
    // Lets time pass before the next piece.
    Script& after(unsigned int ms)
    {
        m_delay += ms;
        return *this;
    }
    // The channel is dead from here on.
    Script& loseLink()
    {
        m_pieces.push_back({m_delay, {}, true});
        m_delay = 0;
        return *this;
    }

private:
    friend class ScriptedChannel;
    struct Piece
    {
        unsigned int delay;
        std::string characters;
        bool losesLink;
    };
    std::vector<Piece> m_pieces;
    unsigned int m_delay = 0;
};

// One thing that happened on a channel, ms counted from the channel's birth.
struct ChannelEvent
{
    enum class Kind : int
    {
        Sent,    // text: all bytes, terminator included
        Read,    // text: the message, delimiter removed
        TimedOut // a read with a time-out above 0 ended empty
    };
    unsigned int atMs;
    Kind kind;
    std::string text;

    bool operator==(ChannelEvent const&) const = default;
};

inline ChannelEvent sent(unsigned int atMs, std::string text)
{
    return {atMs, ChannelEvent::Kind::Sent, std::move(text)};
}
inline ChannelEvent read(unsigned int atMs, std::string text)
{
    return {atMs, ChannelEvent::Kind::Read, std::move(text)};
}
inline ChannelEvent timedOut(unsigned int atMs)
{
    return {atMs, ChannelEvent::Kind::TimedOut, {}};
}
inline std::ostream& operator<<(std::ostream& out, ChannelEvent const& event)
{
    static constexpr char const* words[] = {" sent ", " read ", " timed out"};
    return out << event.atMs << words[static_cast<int>(event.kind)] << testing::PrintToString(event.text);
}

// One command and the time that its sender then spent in reads, until the next command.
struct Dialogue
{
    std::string command; // without its CR; empty for what was read before the first command
    unsigned int waitedMs;

    bool operator==(Dialogue const&) const = default;
};

inline std::ostream& operator<<(std::ostream& out, Dialogue const& dialogue)
{
    return out << "{" << testing::PrintToString(dialogue.command) << ", " << dialogue.waitedMs << "}";
}

// A byte channel whose far end follows a script on the fake clock: a read moves the clock to the arrival of its message
// or to its time-out, and nothing really waits. A command that the script doesn't foresee fails the test, and so does
// an expected one that never came. Messages are cut by the library's own bridge, so that delimiters behave as in life.
//   channel.expect("ATI").reply("ELM327 v1.5\r\r>");
// Lay the script before the traffic starts; the channel itself may then be used from any thread.
class ScriptedChannel : public obd::IDataConnection
{
public:
    explicit ScriptedChannel(FakeClock& clock) : m_clock(clock), m_birth(clock.millis()) {}
    ~ScriptedChannel() override
    {
        for (Expected const& left : m_expected) {
            ADD_FAILURE() << "never sent: " << testing::PrintToString(left.bytes);
        }
    }
    ScriptedChannel(ScriptedChannel const&) = delete;
    ScriptedChannel& operator=(ScriptedChannel const&) = delete;

    // The next command, once, in the order of these calls; a CR must follow it. Without a reply the far end is silent.
    Script& expect(std::string const& command) { return expectBytes(command + "\r"); }
    // The same for exact bytes.
    Script& expectBytes(std::string bytes)
    {
        return m_expected.emplace_back(Expected{std::move(bytes), newScript()}).script;
    }
    // A command that may come at any time and any number of times, whenever no expected one is due.
    Script& whenever(std::string const& command)
    {
        Script& script = newScript();
        m_standing[command + "\r"] = &script;
        return script;
    }
    // What the far end says unasked, counted from now.
    Script& unasked()
    {
        std::lock_guard const lock(m_mutex);
        Script& script = newScript();
        m_running.push_back({&script, 0, now()});
        return script;
    }
    // Kills the channel that long from now; a read under way isn't woken by it.
    void invalidateAfter(unsigned int ms) { unasked().after(ms).loseLink(); }

    std::vector<ChannelEvent> log() const
    {
        std::lock_guard const lock(m_mutex);
        return m_log;
    }
    // The time-outs of all reads that were given time.
    std::vector<int> readTimeouts() const
    {
        std::lock_guard const lock(m_mutex);
        return m_readTimeouts;
    }
    std::vector<Dialogue> dialogues() const
    {
        std::lock_guard const lock(m_mutex);
        return m_dialogues;
    }
    // All bytes that were sent, command by command.
    std::vector<std::string> sentBytes() const
    {
        std::vector<std::string> all;
        for (ChannelEvent const& event : log()) {
            if (event.kind == ChannelEvent::Kind::Sent) {
                all.push_back(event.text);
            }
        }
        return all;
    }
    // Time since the channel's birth.
    unsigned int now() const { return m_clock.millis() - m_birth; }
    char delimiter() const { return m_delimiter; }

    void setDelimiter(char delimiter) override
    {
        std::lock_guard const lock(m_mutex);
        deliver();
        m_delimiter = delimiter;
        m_bridge.setDelimiter(delimiter);
    }
    bool isValid() const override
    {
        std::lock_guard const lock(m_mutex);
        deliver();
        return m_bridge.isValid();
    }
    bool receive(std::vector<unsigned char>& out, int timeoutMs) override
    {
        std::lock_guard const lock(m_mutex);
        unsigned int const start = now();
        unsigned int const wait = timeoutMs > 0 ? static_cast<unsigned int>(timeoutMs) : 0;
        bool const got = receiveUntil(start + wait, out);
        if (got) {
            m_log.push_back(read(now(), text(out)));
        } else if (wait > 0) {
            m_log.push_back(timedOut(now()));
        }
        if (wait > 0) {
            m_readTimeouts.push_back(timeoutMs);
        }
        addWait(now() - start);
        return got;
    }
    void send(std::vector<unsigned char> const& bytes) override
    {
        std::lock_guard const lock(m_mutex);
        std::string const line = text(bytes);
        m_log.push_back(sent(now(), line));
        m_dialogues.push_back({line.ends_with('\r') ? line.substr(0, line.size() - 1) : line, 0});
        m_bridge.send(bytes);
        std::vector<unsigned char> taken;
        m_bridge.get(taken);
        std::erase_if(m_running, [](Run const& run) { return run.done(); });
        if (Script const* script = scriptFor(line)) {
            m_running.push_back({script, 0, now()});
        }
    }
    void addLogger(obd::IConnectionLogger* logger) override { m_bridge.addLogger(logger); }
    void removeLogger(obd::IConnectionLogger* logger) override { m_bridge.removeLogger(logger); }

private:
    struct Expected
    {
        std::string bytes;
        Script& script;
    };
    // A script that is being played: the piece that comes next, and when the one before it came.
    struct Run
    {
        Script const* script;
        std::size_t next;
        unsigned int sinceMs;

        bool done() const { return next == script->m_pieces.size(); }
        unsigned int due() const { return sinceMs + script->m_pieces[next].delay; }
    };
    static constexpr unsigned int never = std::numeric_limits<unsigned int>::max();

    Script& newScript() { return m_scripts.emplace_back(); }

    Script const* scriptFor(std::string const& line)
    {
        if (!m_expected.empty() && m_expected.front().bytes == line) {
            Script const* script = &m_expected.front().script;
            m_expected.pop_front();
            return script;
        }
        if (auto const standing = m_standing.find(line); standing != m_standing.end()) {
            return standing->second;
        }
        ADD_FAILURE() << "sent " << testing::PrintToString(line) << " at " << now() << " ms, expected "
                      << (m_expected.empty() ? "nothing more" : testing::PrintToString(m_expected.front().bytes));
        return nullptr;
    }

    Run* nextRun() const
    {
        Run* first = nullptr;
        for (Run& run : m_running) {
            if (!run.done() && (first == nullptr || run.due() < first->due())) {
                first = &run;
            }
        }
        return first;
    }

    // Hands over every piece whose time has come; const, since time passes for those who only ask as well.
    void deliver() const
    {
        for (Run* run = nextRun(); run != nullptr && run->due() <= now(); run = nextRun()) {
            Script::Piece const& piece = run->script->m_pieces[run->next];
            run->sinceMs = run->due();
            ++run->next;
            if (piece.losesLink) {
                m_bridge.invalidate();
            } else {
                m_bridge.set(bytes(piece.characters));
            }
        }
    }

    bool receiveUntil(unsigned int deadline, std::vector<unsigned char>& out)
    {
        for (;;) {
            deliver();
            if (m_bridge.receive(out, 0)) {
                return true;
            }
            if (now() >= deadline) {
                return false;
            }
            Run const* run = nextRun();
            unsigned int const due = run != nullptr ? run->due() : never;
            m_clock.advance(std::min(due, deadline) - now());
        }
    }

    void addWait(unsigned int ms)
    {
        if (ms == 0) {
            return;
        }
        if (m_dialogues.empty()) {
            m_dialogues.push_back({"", 0});
        }
        m_dialogues.back().waitedMs += ms;
    }

    FakeClock& m_clock;
    unsigned int const m_birth;
    std::atomic<char> m_delimiter{0};
    std::deque<Script> m_scripts;
    std::deque<Expected> m_expected;
    std::map<std::string, Script*> m_standing;
    mutable std::mutex m_mutex;
    mutable obd::DataBridge m_bridge;
    mutable std::vector<Run> m_running;
    std::vector<ChannelEvent> m_log;
    std::vector<int> m_readTimeouts;
    std::vector<Dialogue> m_dialogues;
};

} // namespace support
