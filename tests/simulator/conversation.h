#pragma once

#include "simulator/adapter/adapter.h"
#include "simulator/adapter/profile.h"
#include "simulator/car/vehicle.h"
#include "simulator/car/vehiclelibrary.h"
#include "simulator/simulation.h"

#include <initializer_list>
#include <memory>
#include <string>

/// A host that types at a simulated adapter and jumps through its time.
class Conversation
{
public:
    explicit Conversation(std::shared_ptr<obdsim::IPeer> peer) : m_peer(std::move(peer)) {}

    /// Sends `line` and a CR; all that comes back until nothing more is under way.
    std::string ask(std::string const& line)
    {
        m_peer->receive(line + "\r");
        return listen();
    }

    /// The reply to the last of `lines`.
    std::string ask(std::initializer_list<char const*> lines)
    {
        std::string reply;
        for (char const* line : lines) {
            reply = ask(std::string(line));
        }
        return reply;
    }

    std::string listen()
    {
        obdsim::Time const start = m_peer->now();
        std::string text;
        while (auto const next = m_peer->nextOutput()) {
            text += m_peer->advanceTo(*next);
            m_lastWait = *next - start;
        }
        m_peer->advanceTo(m_peer->now() + obdsim::Ms(1));
        return text;
    }

    void pass(obdsim::Time time) { m_peer->advanceTo(m_peer->now() + time); }

    /// From the last question to the end of its reply.
    obdsim::Time lastWait() const { return m_lastWait; }

    obdsim::IPeer& peer() { return *m_peer; }

private:
    std::shared_ptr<obdsim::IPeer> m_peer;
    obdsim::Time m_lastWait{};
};

inline Conversation simulated(std::string const& vehicle, std::string const& adapter = "elm327-v1.5",
                              std::vector<std::string> const& faults = {})
{
    return Conversation(obdsim::simulate({vehicle, adapter, faults}));
}

/// An adapter with the car of a vehicle file's text.
inline Conversation withVehicle(std::string const& toml, std::string const& adapter = "elm327-v1.5",
                                obdsim::Quirks quirks = {})
{
    obdsim::AdapterProfile profile = *obdsim::findProfile(adapter);
    profile.quirks.add(quirks);
    auto vehicle = std::make_shared<obdsim::Vehicle>(obdsim::parseVehicle(toml, "test.toml"));
    return Conversation(std::make_shared<obdsim::Adapter>(std::move(profile), std::move(vehicle)));
}

/// An adapter with nothing plugged in.
inline Conversation unplugged(std::string const& adapter = "elm327-v1.5", obdsim::Quirks quirks = {})
{
    obdsim::AdapterProfile profile = *obdsim::findProfile(adapter);
    profile.quirks.add(quirks);
    return Conversation(std::make_shared<obdsim::Adapter>(std::move(profile), nullptr));
}
