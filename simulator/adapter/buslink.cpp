#include "simulator/adapter/buslink.h"

namespace obdsim {

namespace {

constexpr int searchOrder[] = {6, 7, 8, 9, 1, 2, 3, 5, 4};
constexpr double unpoweredVolts = 12.2;

} // namespace

BusLink::BusLink(std::shared_ptr<Vehicle> vehicle, AdapterProfile const& profile)
    : m_vehicle(std::move(vehicle)), m_quirks(profile.quirks), m_wire(m_vehicle, profile)
{}

void BusLink::select(int number, bool automatic)
{
    m_number = number;
    m_automatic = automatic;
    close();
}

void BusLink::store()
{
    m_storedNumber = m_number;
    m_storedAutomatic = m_automatic;
}

void BusLink::restore()
{
    select(m_storedNumber, m_storedAutomatic);
}

void BusLink::close()
{
    m_open = false;
    m_asked = false;
    m_wire.forget();
}

int BusLink::number() const
{
    return m_number;
}

bool BusLink::automatic() const
{
    return m_automatic;
}

std::string BusLink::numberText() const
{
    return (m_automatic ? "A" : "") + hexNumber(static_cast<std::uint32_t>(m_number), 1);
}

std::string BusLink::description() const
{
    // Beyond the nine OBD protocols an ELM327 has a J1939 and two user-defined ones.
    constexpr char const* others[] = {"SAE J1939 (CAN 29/250)", "USER1 (CAN 11/125)", "USER2 (CAN 11/50)"};
    if (m_number == 0) {
        return "AUTO";
    }
    Protocol const* chosen = findProtocol(m_number);
    std::string const name = chosen != nullptr ? chosen->name : others[(m_number - 10) % 3];
    std::string const comma = m_quirks.has(Quirk::TightDescription) ? "," : ", ";
    return m_automatic ? "AUTO" + comma + name : name;
}

Protocol const* BusLink::protocol() const
{
    return findProtocol(m_number);
}

void BusLink::assume(int number)
{
    m_number = number;
}

bool BusLink::isOpen() const
{
    return m_open;
}

bool BusLink::ignition() const
{
    return !m_vehicle || m_vehicle->ignition();
}

double BusLink::volts(Time now) const
{
    return m_vehicle ? m_vehicle->volts(now) : unpoweredVolts;
}

BusReply BusLink::request(BusRequest const& request, Settings const& settings, Time now)
{
    BusReply reply;
    if (!m_open && !establish(reply)) {
        return reply;
    }
    if (isCan(*protocol()) && !m_vehicle->isAwake()) {
        // The car has gone to sleep: nobody acknowledges a frame.
        reply.end += protocol()->probe;
        reply.texts.push_back({reply.end, "CAN ERROR\r"});
        return reply;
    }
    bool const first = !m_asked;
    m_asked = true;
    if (first && m_quirks.has(Quirk::FirstNoData)) {
        reply.end += settings.timeout();
        reply.texts.push_back({reply.end, "NO DATA\r"});
        return reply;
    }
    bool const woken = !reply.texts.empty() && !m_automatic;
    if (woken && m_quirks.has(Quirk::BusInitSplit)) {
        return reply;
    }
    reply = m_wire.exchange(request, settings, std::move(reply), now);
    m_lastTraffic = now + reply.end;
    return reply;
}

bool BusLink::establish(BusReply& reply)
{
    return m_automatic ? search(reply) : start(reply);
}

bool BusLink::search(BusReply& reply)
{
    reply.texts.push_back({Time(0), "SEARCHING..."});
    for (int const number : searchOrder) {
        Protocol const& candidate = *findProtocol(number);
        reply.end += candidate.probe;
        if (reaches(candidate)) {
            m_number = number;
            m_open = true;
            reply.texts.push_back({reply.end, m_quirks.has(Quirk::SearchOk) ? "\rOK\r" : "\r"});
            return true;
        }
    }
    reply.texts.push_back({reply.end, "\rUNABLE TO CONNECT\r"});
    return false;
}

/// Opens the bus of a protocol that the host has chosen.
bool BusLink::start(BusReply& reply)
{
    Protocol const* chosen = protocol();
    if (chosen == nullptr || chosen->init == BusInit::None) {
        if (chosen == nullptr || !reaches(*chosen)) {
            fail(reply);
            return false;
        }
        m_open = true;
        return true;
    }
    BusReply woken = wake(chosen->init);
    reply.texts = std::move(woken.texts);
    reply.end = woken.end;
    return m_open;
}

BusReply BusLink::wake(BusInit init)
{
    Protocol const* chosen = protocol();
    BusReply reply;
    if (chosen == nullptr || isCan(*chosen) || chosen->init == BusInit::None) {
        reply.texts.push_back({Time(0), "?\r"});
        return reply;
    }
    m_open = chosen->init == init && reaches(*chosen);
    reply.texts.push_back({Time(0), "BUS INIT: "});
    bool const dots = init == BusInit::FiveBaud && !m_quirks.has(Quirk::InitWithoutDots);
    for (int i = 1; dots && i <= 3; ++i) {
        reply.texts.push_back({chosen->probe * i / 4, "."});
    }
    reply.end = chosen->probe;
    if (m_open && init == BusInit::FiveBaud) {
        reply.end += m_vehicle->addressPause() - shortestAddressPause; // which the probe has in it
    }
    reply.texts.push_back({reply.end, m_open ? "OK\r" : "ERROR\r"});
    return reply;
}

bool BusLink::reaches(Protocol const& candidate) const
{
    return m_vehicle && m_vehicle->isAwake() && &m_vehicle->protocol() == &candidate;
}

/// What comes of a request on a bus that the car does not have: a CAN controller
/// of the wrong rate, or without a second node, sees errors only; with the right
/// rate nobody listens to identifiers of the wrong length; J1850 stays quiet.
void BusLink::fail(BusReply& reply) const
{
    Protocol const* chosen = protocol();
    bool const canOrOther = chosen == nullptr || isCan(*chosen);
    bool const sameRate = chosen != nullptr && m_vehicle && m_vehicle->isAwake() && isCan(m_vehicle->protocol()) &&
                          m_vehicle->protocol().kilobaud == chosen->kilobaud;
    reply.end += chosen == nullptr ? Ms(100) : chosen->probe;
    reply.texts.push_back({reply.end, canOrOther && !sameRate ? "CAN ERROR\r" : "NO DATA\r"});
}

} // namespace obdsim
