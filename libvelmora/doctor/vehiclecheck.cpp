#include "libvelmora/doctor/vehiclecheck.h"

#include "common/text/text.h"
#include "libvelmora/channel/busline.h"
#include "libvelmora/read/multireply.h"

#include <obd/iecu.h>
#include <obd/parameterfactory.h>
#include <obd/protocolfamily.h>
#include <obd/sensorpids.h>

#include <fmt/format.h>

#include <algorithm>
#include <chrono>

namespace velmora {

namespace {

using Clock = std::chrono::steady_clock;
using Status = obd::IDevice::Status;
using Verdict = DoctorCheck::Verdict;

constexpr int measuredRequests = 20;
constexpr unsigned int replyLimitMs = 1500;
constexpr double noticeableGain = 0.8; // of the plain time
constexpr std::size_t mostCounted = 9;

double millisecondsSince(Clock::time_point start)
{
    return std::chrono::duration<double, std::milli>(Clock::now() - start).count();
}

// What modules answer, and what became of the request. Throws Error where the link has broken or somebody has
// interrupted.
Status askVehicle(Session& session, std::vector<unsigned char> const& request, obd::ResponseMap& responses)
{
    Status const status = session.proxy()->execute(request, responses, replyLimitMs);
    session.check();
    return status;
}

// The same of a text, such as a request with a count behind it; the reply as it came.
Status askVehicle(Session& session, std::string const& request, std::string& reply)
{
    Status const status = session.proxy()->execute(request, reply, replyLimitMs);
    session.check();
    return status;
}

std::optional<std::size_t> lengthOf(unsigned char pid)
{
    return obd::ParameterFactory::dataLength(obd::ParameterIdentifier(pid).id());
}

// PIDs that a module offers and whose length is known, the shortest first, so that two of them fit in a frame.
std::vector<unsigned char> usablePids(obd::IEcu const& ecu)
{
    std::vector<unsigned char> pids;
    for (unsigned char const pid : ecu.supportedIds(obd::ObdMode::CurrentData, 0)) {
        if (!obd::isSupportMask(pid) && lengthOf(pid)) {
            pids.push_back(pid);
        }
    }
    std::stable_sort(pids.begin(), pids.end(),
                     [](unsigned char a, unsigned char b) { return lengthOf(a) < lengthOf(b); });
    return pids;
}

void measureLatency(Session& session, unsigned char pid, DoctorFigures& figures)
{
    std::vector<double> times;
    for (int i = 0; i < measuredRequests; ++i) {
        obd::ResponseMap responses;
        Clock::time_point const start = Clock::now();
        if (askVehicle(session, {0x01, pid}, responses) == Status::Ok) {
            times.push_back(millisecondsSince(start));
        }
    }
    figures.requests = times.size();
    if (times.empty()) {
        return;
    }
    std::sort(times.begin(), times.end());
    figures.minimum = times.front();
    figures.median = times[times.size() / 2];
    figures.high = times[(times.size() - 1) * 95 / 100];
    figures.maximum = times.back();
}

std::size_t longestWholeReply(Session& session)
{
    std::size_t longest = 0;
    constexpr unsigned char items[] = {0x02, 0x04, 0x06, 0x0A};
    for (unsigned char const id : items) {
        obd::ResponseMap responses;
        askVehicle(session, {0x09, id}, responses);
        for (auto const& [module, payload] : responses) {
            longest = std::max(longest, payload.size());
        }
    }
    return longest;
}

// Whether the digit that tells how many lines to wait for makes the same reply come sooner. Never on J1850, where a
// prompt that comes too early makes modules send again.
std::optional<bool> tryCount(Session& session, unsigned char pid, DoctorFigures const& figures)
{
    obd::ResponseMap responses;
    askVehicle(session, {0x01, pid}, responses);
    bool const usable = !responses.empty() && responses.size() <= mostCounted;
    if (!usable || session.proxy()->protocol() == obd::ObdProtocolJ1850) {
        return std::nullopt;
    }
    std::string const request = fmt::format("01{:02X}", pid);
    std::string plain;
    std::string counted;
    askVehicle(session, request, plain);
    Clock::time_point const start = Clock::now();
    Status const status = askVehicle(session, request + std::to_string(responses.size()), counted);
    double const time = millisecondsSince(start);
    return status == Status::Ok && counted.size() == plain.size() && time < noticeableGain * figures.median;
}

std::size_t tryMulti(Session& session, obd::IEcu const& ecu, std::vector<unsigned char> const& pids)
{
    std::size_t works = 1;
    for (std::size_t const count : {2U, 3U, 6U}) {
        if (pids.size() < count) {
            break;
        }
        std::vector<unsigned char> const asked(pids.begin(), pids.begin() + static_cast<std::ptrdiff_t>(count));
        std::vector<unsigned char> request{0x01};
        request.insert(request.end(), asked.begin(), asked.end());
        obd::ResponseMap responses;
        askVehicle(session, request, responses);
        auto const parts = splitMultiReply(responses[ecu.id()], asked, lengthOf);
        if (!parts || parts->size() != count) {
            break;
        }
        works = count;
    }
    return works;
}

// Frames of ISO 15765-2; elsewhere each payload of a live value is one.
std::size_t frameCountOf(obd::ResponseMap const& responses)
{
    constexpr std::size_t single = 7;
    std::size_t frames = 0;
    for (auto const& [module, payload] : responses) {
        frames += payload.size() <= single ? 1 : 1 + (payload.size() - (single - 1) + single - 1) / single;
    }
    return frames;
}

// As `live --fast` asks: with the count of frames, where that makes replies come sooner.
double measureRate(Session& session, std::vector<unsigned char> const& pids, DoctorFigures const& figures)
{
    std::vector<unsigned char> request(figures.pidsPerRequest + 1, 0x01);
    std::copy_n(pids.begin(), figures.pidsPerRequest, request.begin() + 1);
    obd::ResponseMap responses;
    askVehicle(session, request, responses);
    std::size_t const frames = frameCountOf(responses);
    std::string text = frameDigits(request);
    if (figures.countWorks.value_or(false) && frames >= 1 && frames <= mostCounted) {
        text += std::to_string(frames);
    }
    Clock::time_point const start = Clock::now();
    std::size_t values = 0;
    for (int i = 0; i < measuredRequests; ++i) {
        std::string reply;
        bool const answered = askVehicle(session, text, reply) == Status::Ok;
        values += answered && !responses.empty() ? figures.pidsPerRequest : 0;
    }
    return static_cast<double>(values) * 1000.0 / millisecondsSince(start);
}

} // namespace

void checkVehicle(Session& session, DoctorReport& report)
{
    report.checks.push_back({"bus", Verdict::Good, readable(session.adapter()->getProtocolDescription()), ""});
    for (std::shared_ptr<obd::IEcu> const& ecu : session.obd().getEcuManager()->getEcus()) {
        report.checks.push_back(
            {"modules", Verdict::Good,
             fmt::format("{:X} {} ({})", ecu->id(), readable(ecu->name()), readable(ecu->description())), ""});
    }
    obd::IEcu const& ecu = *session.obd().getEcuManager()->getCurrentEcu();
    std::vector<unsigned char> const pids = usablePids(ecu);
    if (pids.empty()) {
        report.checks.push_back({"modules", Verdict::Note, "the first module offers no value to measure by", ""});
        return;
    }
    DoctorFigures figures;
    measureLatency(session, pids.front(), figures);
    figures.longestReply = longestWholeReply(session);
    figures.countWorks = tryCount(session, pids.front(), figures);
    figures.pidsPerRequest = obd::isCan(ecu.protocol()) ? tryMulti(session, ecu, pids) : 1;
    figures.valuesPerSecond = measureRate(session, pids, figures);
    if (figures.requests < measuredRequests) {
        report.checks.push_back(
            {"modules", Verdict::Note,
             fmt::format("{} of {} requests got no reply", measuredRequests - figures.requests, measuredRequests),
             "is the adapter firmly in the socket?"});
    }
    report.figures = figures;
}

void noteHabits(Session const& session, DoctorReport& report)
{
    HabitCounts const& counts = session.channel().statistics().habits;
    for (std::size_t i = 0; i < habitCount; ++i) {
        if (counts[i] != 0) {
            report.habits.emplace_back(habitName(static_cast<Habit>(i)), counts[i]);
        }
    }
}

} // namespace velmora
