#include "simulator/adapter/buswire.h"

#include "simulator/adapter/flowcontrol.h"
#include "simulator/adapter/framecounter.h"
#include "simulator/adapter/framewriter.h"

#include <algorithm>
#include <map>

namespace obdsim {

namespace {

std::size_t serialBytes(Frame const& frame)
{
    return frame.header.size() + frame.data.size() + (frame.checksum ? 1 : 0);
}

/// Frames of one message follow each other; on CAN those of several modules may
/// come in between, on the other buses each has the wire for itself.
std::vector<TimedFrame> schedule(Vehicle const& vehicle, std::vector<ModuleMessage> const& messages, bool everyone,
                                 Time at)
{
    Protocol const& protocol = vehicle.protocol();
    std::vector<TimedFrame> frames;
    std::map<std::uint32_t, Time> freeAt;
    for (auto const& message : messages) {
        std::uint32_t const lane = isCan(protocol) ? message.source : 0;
        Time const gap = message.frameGap.value_or(protocol.frameGap);
        Time time = std::max(at + message.delay, freeAt[lane]);
        for (auto& frame :
             frameReply(protocol, message.source, everyone, message.payload, vehicle.padding(), message.tester)) {
            // Behind a first frame the module awaits the adapter's flow control, and takes its time to heed it.
            Time const flowControl = canFrameTime(protocol, 8) + 2 * gap;
            bool const waits = isCan(protocol) && isFirstFrame(frame, message.tester.has_value());
            time += isCan(protocol) ? canFrameTime(protocol, frame.data.size())
                                    : receivingTime(protocol, serialBytes(frame));
            frames.push_back({time, std::move(frame)});
            time += gap + (waits ? flowControl : Time(0));
        }
        freeAt[lane] = time;
    }
    return frames;
}

/// The filters of the host. Without any an ELM327 takes the replies of OBD modules only: 7E8 to 7EF, 18DAF1xx. With an
/// extended address it drops frames whose first byte is not the tester's (ATTA).
bool passes(Protocol const& protocol, Settings const& settings, Frame const& frame)
{
    if (!isCan(protocol)) {
        return !settings.receiveAddress || *settings.receiveAddress == frame.source;
    }
    bool const ours = !settings.extendedAddress || (!frame.data.empty() && frame.data[0] == settings.testerAddress);
    if (!settings.canFilter && !settings.canMask) {
        bool const short11 = protocol.family == BusFamily::Can11;
        return ours && (short11 ? (frame.source & 0x7F8) == 0x7E8 : (frame.source & 0x1FFFFF00) == 0x18DAF100);
    }
    std::uint32_t const mask = settings.canMask.value_or(0x1FFFFFFF);
    return ours && (frame.source & mask) == (settings.canFilter.value_or(0) & mask);
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

bool isPending(Protocol const& protocol, Frame const& frame, bool extended)
{
    std::size_t const first = (isCan(protocol) ? 1U : 0U) + (extended ? 1U : 0U);
    return frame.data.size() > first + 2 && frame.data[first] == 0x7F && frame.data[first + 2] == 0x78;
}

Time requestTime(Protocol const& protocol, std::size_t dataBytes)
{
    constexpr std::size_t headerAndCheck = 4;
    return isCan(protocol) ? canFrameTime(protocol, 8) : sendingTime(protocol, headerAndCheck + dataBytes);
}

} // namespace

BusWire::BusWire(std::shared_ptr<Vehicle> vehicle, AdapterProfile const& profile)
    : m_vehicle(std::move(vehicle)), m_profile(profile), m_timer(profile.timing)
{}

void BusWire::forget()
{
    m_frames.clear();
    m_allowed.clear();
    m_timer.forget();
}

BusReply BusWire::exchange(BusRequest const& request, Settings const& settings, BusReply reply, Time now)
{
    Time const begin = free(now + reply.end);
    Time const sent = send(request, settings, begin);
    reply.end = sent - now;
    if (settings.responses) {
        listen(request, settings, reply, now, sent);
    }
    return reply;
}

/// When the adapter may begin to send: on a K line it leaves P3 behind the last byte.
Time BusWire::free(Time at) const
{
    bool const waits = isKLine(m_vehicle->protocol()) && m_busyUntil != Time(0);
    return waits ? std::max(at, m_busyUntil + requestGap) : at;
}

/// Puts the request on the bus, and among the frames under way those that it brings. Returns the end of the request.
Time BusWire::send(BusRequest const& request, Settings const& settings, Time at)
{
    Protocol const& bus = m_vehicle->protocol();
    Time const sent = at + requestTime(bus, request.data.size());
    m_busyUntil = sent;
    auto const past = [&](TimedFrame const& each) { return each.time <= sent; };
    m_frames.erase(std::remove_if(m_frames.begin(), m_frames.end(), past), m_frames.end());
    Bytes asked = request.data;
    if (m_profile.quirks.has(Quirk::RequestCut)) {
        asked.resize(std::min<std::size_t>(asked.size(), 2));
    }
    bool const wrapped = settings.formatting || m_profile.quirks.has(Quirk::FormattingStuck) || !isCan(bus);
    auto const data = wrapped ? std::optional<Bytes>(asked) : unwrapSingleFrame(asked);
    auto target = targetOf(bus, headerOf(bus, settings));
    if (target && isCan(bus)) {
        target->address = settings.extendedAddress;
    }
    if (data && target) {
        auto frames = schedule(*m_vehicle, m_vehicle->request(*target, *data, sent), target->everyone, sent);
        m_frames.insert(m_frames.end(), std::make_move_iterator(frames.begin()), std::make_move_iterator(frames.end()));
    }
    std::stable_sort(m_frames.begin(), m_frames.end(),
                     [](TimedFrame const& a, TimedFrame const& b) { return a.time < b.time; });
    return sent;
}

/// One timer for both: the first reply, and each further one behind the last (ELM327 data sheet v1.4b, page 25). The
/// first has the whole of ATST.
void BusWire::listen(BusRequest const& request, Settings const& settings, BusReply& reply, Time now, Time sent)
{
    Protocol const& bus = m_vehicle->protocol();
    FrameWriter const writer(bus, settings, m_profile.quirks);
    FrameCounter counter(bus, request.expected, m_profile.quirks);
    Time deadline = sent + settings.timeout();
    std::map<std::uint32_t, Time> promised; // modules that asked for patience, whatever the others say meanwhile
    std::map<std::uint32_t, Time> heard;
    std::map<std::uint32_t, std::size_t> missing; // frames of messages that have begun
    Time slowest{};
    bool anything = false;
    auto next = m_frames.begin();
    for (; next != m_frames.end() && next->time <= deadline && !counter.isEnough(); ++next) {
        m_busyUntil = next->time;
        Frame const& frame = next->frame;
        if (!passes(bus, settings, frame) || !isSent(frame, settings)) {
            continue;
        }
        reply.texts.push_back({next->time - now, writer.lines(next->frame)});
        Time& before = heard.try_emplace(next->frame.source, sent).first->second;
        bool const keptWaiting = promised.erase(next->frame.source) != 0;
        if (!keptWaiting && !isConsecutiveFrame(frame, settings.extendedAddress.has_value())) {
            slowest = std::max(slowest, next->time - before);
        }
        before = next->time;
        if (isPending(bus, frame, settings.extendedAddress.has_value())) {
            promised[next->frame.source] = next->time + pendingWait(settings);
        }
        bool const rest = isCan(bus) && awaitsRest(frame, settings, missing);
        deadline = next->time + (rest ? m_timer.waitForRest(settings) : m_timer.wait(settings));
        for (auto const& [module, until] : promised) {
            deadline = std::max(deadline, until);
        }
        counter.add(next->frame);
        anything = true;
    }
    m_frames.erase(m_frames.begin(), next);
    if (slowest != Time(0)) {
        m_timer.learn(slowest);
    }
    reply.end = anything && counter.isEnough() ? reply.texts.back().delay : deadline - now;
    if (!anything) {
        reply.texts.push_back({reply.end, "NO DATA\r"});
    }
}

/// Whether a module owes frames of its message behind this frame.
bool BusWire::awaitsRest(Frame const& frame, Settings const& settings, std::map<std::uint32_t, std::size_t>& missing)
{
    bool const extended = settings.extendedAddress.has_value();
    std::size_t& own = missing[frame.source];
    if (isFirstFrame(frame, extended)) {
        own = settings.flowControl ? promisedFrames(frame, extended) : 0;
    } else if (isConsecutiveFrame(frame, extended) && own != 0) {
        --own;
    }
    return std::any_of(missing.begin(), missing.end(), [](auto const& each) { return each.second != 0; });
}

/// A consecutive frame comes only upon flow control that its module heeds.
bool BusWire::isSent(Frame const& frame, Settings const& settings)
{
    Protocol const& bus = m_vehicle->protocol();
    Module const* module = isCan(bus) ? m_vehicle->findModule(frame.source) : nullptr;
    if (module == nullptr) {
        return true;
    }
    bool const extended = module->data().address.has_value();
    int& allowed = m_allowed[frame.source];
    if (isFirstFrame(frame, extended)) {
        allowed = allowedFrames(bus, settings, module->data());
    }
    return !isConsecutiveFrame(frame, extended) || allowed-- > 0;
}

/// The wait behind 7F xx 78: the chips of v2.1 and later know what it means and wait 5 s, but on ISO 9141-2 (data sheet
/// v2.1, page 45). Of older ones nothing is told: ours give it the whole of ATST.
Time BusWire::pendingWait(Settings const& settings) const
{
    constexpr int knowsPending = 210;
    constexpr Time whole = std::chrono::seconds(5);
    bool const heeds = isCan(m_vehicle->protocol()) || m_vehicle->protocol().family == BusFamily::Kwp;
    return m_profile.level >= knowsPending && heeds ? whole : settings.timeout();
}

} // namespace obdsim
