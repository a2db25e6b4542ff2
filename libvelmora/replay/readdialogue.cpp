#include "libvelmora/replay/readdialogue.h"

#include "libvelmora/poll/polledparameter.h"
#include "libvelmora/poll/vehiclepoll.h"
#include "libvelmora/read/multireply.h"
#include "libvelmora/record/dialoguerecorder.h"
#include "simulator/bytes.h"
#include "simulator/dialogue.h"

#include <obd/ivelmorasettings.h>
#include <obd/parameterfactory.h>
#include <velmora/error.h>

#include <algorithm>
#include <chrono>
#include <map>
#include <utility>
#include <vector>

namespace velmora {

namespace {

constexpr unsigned char liveData = 0x01;
constexpr unsigned char maskDistance = 0x20; // between the PIDs that tell which others there are
constexpr unsigned int replayLimitMs = 1500;

// A request for live values.
struct LiveRequest
{
    std::int64_t time = 0; // of its reply, ms
    std::string key;       // without the digit that tells how many replies to wait for
    std::vector<unsigned char> pids;
};

std::string keyOfRequest(std::string const& sent)
{
    std::string key = obdsim::normaliseCommand(sent);
    if (obdsim::isHexText(key) && key.size() % 2 != 0) {
        key.pop_back();
    }
    return key;
}

// None for what is no request for values of service 01.
std::vector<unsigned char> livePids(std::string const& key)
{
    std::optional<obdsim::Bytes> bytes = obdsim::parseHex(key);
    bool const live =
        bytes && !bytes->empty() && bytes->front() == liveData &&
        std::none_of(bytes->begin() + 1, bytes->end(), [](unsigned char pid) { return pid % maskDistance == 0; });
    return live ? std::vector<unsigned char>(bytes->begin() + 1, bytes->end()) : std::vector<unsigned char>();
}

std::vector<LiveRequest> liveRequests(obdsim::Dialogue const& dialogue)
{
    std::vector<LiveRequest> requests;
    obdsim::Time time{};
    for (obdsim::Exchange const& exchange : dialogue.exchanges) {
        for (obdsim::DialogueChunk const& chunk : exchange.chunks) {
            time += chunk.pause;
        }
        std::string const key = keyOfRequest(exchange.sent);
        if (std::vector<unsigned char> pids = livePids(key); !pids.empty()) {
            requests.push_back(
                {std::chrono::duration_cast<std::chrono::milliseconds>(time).count(), key, std::move(pids)});
        }
    }
    return requests;
}

obdsim::Dialogue loaded(std::filesystem::path const& file)
{
    try {
        return obdsim::loadDialogue(file.string());
    } catch (obdsim::SimulatorError const& error) {
        throw Error(ErrorKind::WrongUse, std::string("Could not play the recorded dialogue: ") + error.what(),
                    {"a dialogue that `velmora record FILE` has written is wanted"});
    }
}

// Asks again, in its order, for what a dialogue holds, and decodes the replies.
class DialogueDecoder
{
public:
    DialogueDecoder(Session& session, DialogueRecorder const& recorder)
        : m_session(session), m_recorder(recorder), m_wire(session.proxy(), std::chrono::milliseconds(0))
    {
        for (ModuleOffer const& offer : moduleOffers(session.obd(), {})) {
            for (OfferedSensor const& each : offer.sensors) {
                addParameter(offer.ecu, each.id);
            }
        }
    }

    // Of two requests with the same words, a recording serves the replies in their order. What went out in between by
    // itself, since a reply was broken, has had its turn.
    void take(LiveRequest const& request)
    {
        std::vector<std::string> const sent = m_recorder.sentFrom(m_seen);
        m_seen += sent.size();
        for (std::string const& each : sent) {
            ++m_asked[keyOfRequest(each)];
        }
        if (m_asked[request.key] < ++m_passed[request.key]) {
            decode(request);
        }
    }

    Recording finish() { return m_maker.finish(); }

private:
    void addParameter(std::shared_ptr<obd::IEcu> const& ecu, obd::ParameterIdentifier::Id id)
    {
        auto parameter = obd::ParameterFactory().createParameter(*ecu, *m_session.obd().getSettings(), id);
        if (parameter == nullptr) {
            return;
        }
        auto const pid = static_cast<unsigned char>(parameter->pid());
        auto polled = std::make_unique<PolledParameter>(m_wire, ecu, std::move(parameter), Units::Metric);
        if (!polled->isDerived()) {
            m_parameters[{ecu->id(), pid}] = std::move(polled);
        }
    }

    void decode(LiveRequest const& request)
    {
        std::vector<unsigned char> data{liveData};
        data.insert(data.end(), request.pids.begin(), request.pids.end());
        obd::ResponseMap replies;
        m_wire.execute(data, replies, replayLimitMs);
        for (auto const& [module, payload] : replies) {
            if (request.pids.size() == 1) {
                add(module, request.pids.front(), payload, request.time);
                continue;
            }
            auto const parts = splitMultiReply(payload, request.pids, [](unsigned char pid) {
                return obd::ParameterFactory::dataLength(obd::ParameterIdentifier(pid).id());
            });
            for (auto const& [pid, part] : parts.value_or(std::map<unsigned char, std::vector<unsigned char>>())) {
                add(module, pid, part, request.time);
            }
        }
    }

    void add(unsigned int module, unsigned char pid, std::vector<unsigned char> const& payload, std::int64_t time)
    {
        auto const found = m_parameters.find({module, pid});
        if (found == m_parameters.end()) {
            return;
        }
        found->second->begin();
        found->second->lend(pid, payload);
        std::optional<PollResult> const result = found->second->run();
        for (Reading const& each : result ? result->readings : std::vector<Reading>()) {
            std::size_t const sensor = m_maker.sensor({each.module, each.sensor, each.pid, each.name, each.unit});
            m_maker.add(sensor, time, valueText(each));
        }
    }

    Session& m_session;
    DialogueRecorder const& m_recorder;
    PollWire m_wire;
    std::map<std::pair<unsigned int, unsigned char>, std::unique_ptr<PolledParameter>> m_parameters;
    std::map<std::string, std::size_t> m_asked;  // how often, by key
    std::map<std::string, std::size_t> m_passed; // of the dialogue's requests, by key
    std::size_t m_seen = 0;                      // of what the recorder has
    RecordingMaker m_maker;
};

} // namespace

std::optional<Recording> readDialogue(std::filesystem::path const& file,
                                      std::function<std::shared_ptr<Session>()> const& open)
{
    std::vector<LiveRequest> const requests = liveRequests(loaded(file));
    if (requests.empty()) {
        return std::nullopt;
    }
    DialogueRecorder recorder; // outlives the session
    std::shared_ptr<Session> const session = open();
    session->record(recorder);
    session->connect();
    DialogueDecoder decoder(*session, recorder);
    for (LiveRequest const& each : requests) {
        if (session->interrupted()) {
            session->check();
        }
        decoder.take(each);
    }
    Recording recording = decoder.finish();
    recording.dated = false;
    return recording.end > recording.begin ? std::optional(std::move(recording)) : std::nullopt;
}

} // namespace velmora
