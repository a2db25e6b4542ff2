#include "simulator/adapter/buslink.h"

#include "simulator/adapter/framewriter.h"

#include <algorithm>
#include <iterator>

namespace obdsim {

namespace {

constexpr int searchOrder[] = {6, 7, 8, 9, 1, 2, 3, 5, 4};
constexpr Time flowControlTime{4};
constexpr double unpoweredVolts = 12.2;

bool isFirstFrame(Frame const& frame)
{
    return !frame.data.empty() && frame.data[0] >> 4 == 0x1;
}

bool isConsecutiveFrame(Frame const& frame)
{
    return !frame.data.empty() && frame.data[0] >> 4 == 0x2;
}

/// Frames of one message follow each other; on CAN those of several modules may
/// come in between, on the other buses each has the wire for itself.
std::vector<TimedFrame> schedule(Vehicle const& vehicle, std::vector<ModuleMessage> const& messages, bool everyone)
{
    Protocol const& protocol = vehicle.protocol();
    std::vector<TimedFrame> frames;
    std::map<std::uint32_t, Time> freeAt;
    for (auto const& message : messages) {
        const std::uint32_t lane = isCan(protocol) ? message.source : 0;
        Time time = std::max(message.delay, freeAt[lane]);
        for (auto& frame : frameReply(protocol, message.source, everyone, message.payload, vehicle.padding())) {
            bool const waits = isCan(protocol) && isFirstFrame(frame);
            frames.push_back({time, std::move(frame)});
            time += protocol.frameGap + (waits ? flowControlTime : Time(0));
        }
        freeAt[lane] = time;
    }
    std::stable_sort(frames.begin(), frames.end(),
                     [](TimedFrame const& a, TimedFrame const& b) { return a.time < b.time; });
    return frames;
}

/// The filters of the host. Without flow control a module sends no frame behind
/// the first one of a message.
bool passes(Protocol const& protocol, Settings const& settings, Frame const& frame)
{
    if (!isCan(protocol)) {
        return !settings.receiveAddress || *settings.receiveAddress == frame.source;
    }
    const std::uint32_t mask = settings.canMask.value_or(settings.canFilter ? 0x1FFFFFFF : 0);
    bool const wanted = (frame.source & mask) == (settings.canFilter.value_or(0) & mask);
    return wanted && (settings.flowControl || !isConsecutiveFrame(frame));
}

/// The bytes of the header in the length that the bus has.
Bytes headerOf(Protocol const& protocol, Settings const& settings)
{
    if (!settings.header) {
        return functionalHeader(protocol);
    }
    Bytes header = *settings.header;
    if (protocol.family == BusFamily::Can11 && header.size() == 3) {
        header.erase(header.begin());
    }
    if (protocol.family == BusFamily::Can29 && header.size() == 3) {
        header.insert(header.begin(), settings.priority);
    }
    return header;
}

bool isPending(Protocol const& protocol, Frame const& frame)
{
    const std::size_t first = isCan(protocol) ? 1 : 0;
    return frame.data.size() > first + 2 && frame.data[first] == 0x7F && frame.data[first + 2] == 0x78;
}

/// How long an adapter listens for one more frame behind the last. Adaptive timing
/// has learnt that modules answer much faster than the time-out allows.
Time patience(Settings const& settings)
{
    switch (settings.adaptiveTiming) {
    case 0:
        return settings.timeout();
    case 1:
        return std::max(Time(50), settings.timeout() / 5);
    default:
        return std::max(Time(30), settings.timeout() / 8);
    }
}

} // namespace

BusLink::BusLink(std::shared_ptr<Vehicle> vehicle, Quirks const& quirks)
    : m_vehicle(std::move(vehicle)), m_quirks(quirks)
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
    const std::string name = chosen != nullptr ? chosen->name : others[(m_number - 10) % 3];
    const std::string comma = m_quirks.has(Quirk::TightDescription) ? "," : ", ";
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
    return exchange(request, settings, std::move(reply), now);
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
    reply.texts.push_back({reply.end, m_open ? "OK\r" : "ERROR\r"});
    return reply;
}

bool BusLink::reaches(Protocol const& candidate) const
{
    return m_vehicle && &m_vehicle->protocol() == &candidate;
}

/// What comes of a request on a bus that the car does not have: a CAN controller
/// of the wrong rate, or without a second node, sees errors only; with the right
/// rate nobody listens to identifiers of the wrong length; J1850 stays quiet.
void BusLink::fail(BusReply& reply) const
{
    Protocol const* chosen = protocol();
    bool const canOrOther = chosen == nullptr || isCan(*chosen);
    bool const sameRate = chosen != nullptr && m_vehicle && isCan(m_vehicle->protocol()) &&
                          m_vehicle->protocol().kilobaud == chosen->kilobaud;
    reply.end += chosen == nullptr ? Time(100) : chosen->probe;
    reply.texts.push_back({reply.end, canOrOther && !sameRate ? "CAN ERROR\r" : "NO DATA\r"});
}

BusReply BusLink::exchange(BusRequest const& request, Settings const& settings, BusReply reply, Time now)
{
    Protocol const& bus = m_vehicle->protocol();
    const FrameWriter writer(bus, settings, m_quirks);
    const Time sent = reply.end;
    Time deadline = sent + settings.timeout();
    Time promised{}; // a module asked for patience until then, whatever the others say meanwhile
    int count = 0;
    for (auto const& [time, frame] : send(request, settings, now + sent)) {
        bool const enough = request.expected && count == *request.expected;
        if (enough || sent + time > deadline) {
            break;
        }
        if (passes(bus, settings, frame)) {
            reply.texts.push_back({sent + time, writer.lines(frame)});
            promised = isPending(bus, frame) ? sent + time + settings.timeout() : promised;
            deadline = std::max(promised, sent + time + patience(settings));
            ++count;
        }
    }
    bool const complete = count > 0 && request.expected && count == *request.expected;
    reply.end = complete ? reply.texts.back().delay : deadline;
    if (!settings.responses) {
        reply.end = sent;
    } else if (count == 0) {
        reply.texts.push_back({reply.end, "NO DATA\r"});
    }
    return reply;
}

/// Puts the request on the bus; the frames that come back, in the order of time.
std::vector<TimedFrame> BusLink::send(BusRequest const& request, Settings const& settings, Time at)
{
    Protocol const& bus = m_vehicle->protocol();
    bool const wrapped = settings.formatting || m_quirks.has(Quirk::FormattingStuck) || !isCan(bus);
    auto const data = wrapped ? std::optional<Bytes>(request.data) : unwrapSingleFrame(request.data);
    auto const target = targetOf(bus, headerOf(bus, settings));
    if (!data || !target) {
        return {};
    }
    auto frames = schedule(*m_vehicle, m_vehicle->request(*target, *data, at), target->everyone);
    return settings.responses ? frames : std::vector<TimedFrame>{};
}

} // namespace obdsim
