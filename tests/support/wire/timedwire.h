#pragma once

#include "libvelmora/channel/wire.h"

#include <algorithm>
#include <map>
#include <string>
#include <utility>

namespace support {

// A wire in time that only reading moves on. What stands behind it says its bytes for some time ahead.
class TimedWire : public velmora::IWire
{
public:
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

    // Said so long from now.
    void say(std::string const& bytes, velmora::WireTime delay) { m_output.emplace(m_now + delay, bytes); }

    // Takes back what was to come.
    void silence() { m_output.clear(); }
    bool isTalking() const { return !m_output.empty(); }

private:
    std::multimap<velmora::WireTime, std::string> m_output;
    velmora::WireTime m_now{1000};
    bool m_up = true;
};

// The same with an adapter that answers line by line. Blanks mean nothing in a line; while it talks they interrupt it.
class LineWire : public TimedWire
{
public:
    void write(std::string_view bytes) override
    {
        for (char const character : bytes) {
            if (character == '\r') {
                answer(std::exchange(m_line, {}));
            } else if (character != ' ') {
                m_line += character;
            } else if (isTalking()) {
                interrupt();
            }
        }
    }

private:
    virtual void interrupt() {}
    // A command without its line end.
    virtual void answer(std::string const& command) = 0;

    std::string m_line;
};

} // namespace support
