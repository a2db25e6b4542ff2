#include "simulator/adapter/adapter.h"

#include <algorithm>
#include <utility>

namespace obdsim {

namespace {

constexpr char carriageReturn = '\r';

} // namespace

Adapter::Adapter(AdapterProfile profile, std::shared_ptr<Vehicle> vehicle, std::shared_ptr<IScript> script)
    : m_profile(std::move(profile)), m_script(std::move(script)), m_settings(factorySettings(m_profile)),
      m_bus(std::move(vehicle), m_profile)
{
    Adapter::connect();
}

void Adapter::receive(std::string_view bytes)
{
    if (m_profile.family == AdapterFamily::Silent) {
        return;
    }
    for (char const character : bytes) {
        receiveOne(character);
    }
}

std::optional<Time> Adapter::nextOutput() const
{
    return m_output.next();
}

std::string Adapter::advanceTo(Time time)
{
    m_now = std::max(m_now, time);
    return m_output.take(m_now);
}

Time Adapter::now() const
{
    return m_now;
}

void Adapter::connect()
{
    m_output.clear();
    m_line.clear();
    m_heldBack.clear();
    m_state = State::Ready;
    m_firstCommand = true;
    if (has(Quirk::Greeting)) {
        sayRaw(Ms(20), "+CONNECTING<<00:00:00:00:00:00\r\n");
    }
}

bool Adapter::linkIsUp() const
{
    return true;
}

AdapterProfile const& Adapter::profile() const
{
    return m_profile;
}

RequestLog const& Adapter::requests() const
{
    return m_requests;
}

void Adapter::receiveOne(char character)
{
    settle();
    switch (m_state) {
    case State::Busy:
    case State::Monitoring:
        stop();
        return;
    case State::Deaf:
        return;
    case State::Asleep:
        m_state = State::Ready;
        answerReset({{m_profile.banner}, After::Reset, Ms(100)});
        return;
    case State::AwaitingRate:
        if (character == carriageReturn) {
            confirmRate();
        }
        return;
    case State::Ready:
        break;
    }
    // NUL and line feed are no characters to the adapter.
    if (character == '\0' || character == '\n') {
        return;
    }
    if (m_settings.echo || has(Quirk::EchoStuck)) {
        say(Time(0), std::string(1, character));
    }
    if (character != carriageReturn) {
        // One character too many marks the line as too long; the others are forgotten.
        m_line += m_line.size() <= longestLine ? std::string(1, character) : "";
        return;
    }
    sayRaw(Time(0), std::exchange(m_heldBack, ""));
    execute(std::exchange(m_line, ""));
}

/// Ends states that last for a time only.
void Adapter::settle()
{
    bool const timed = m_state == State::Busy || m_state == State::Deaf || m_state == State::AwaitingRate;
    if (timed && m_now >= m_stateUntil) {
        m_state = State::Ready;
    }
}

/// The character that interrupts is lost, and so are those that come while the
/// adapter still talks.
void Adapter::stop()
{
    m_output.clear();
    say(m_profile.timing.command, "STOPPED\r");
    finish(m_profile.timing.command);
    m_state = State::Deaf;
    m_stateUntil = m_now + m_profile.timing.command;
}

bool Adapter::has(Quirk quirk) const
{
    return m_profile.quirks.has(quirk);
}

} // namespace obdsim
