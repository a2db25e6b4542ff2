// The whole report of a vehicle, field by field, through the fast and healing channel and through a plain one: of every
// simulated car and bus, and of every recorded dialogue that a connection can be brought up with.

#include "libvelmora/channel/fastchannel.h"
#include "libvelmora/read/vehiclereader.h"
#include "simulator/simulatedcar.h"
#include "simulator/simulation.h"
#include "tests/support/dialogue/dialoguefolder.h"
#include "tests/support/dialogue/recordeddialogue.h"
#include "tests/support/temporaryfolder.h"
#include "tests/support/wire/peerwire.h"
#include "tests/support/wire/plainchannel.h"
#include "tests/support/workerclock.h"

#include <velmora/error.h>

#include <gtest/gtest.h>

#include <filesystem>
#include <map>
#include <set>

namespace velmora {

namespace {

// A port of which nothing is wanted: the channels bring their own wire.
class UnusedPort : public IPort
{
public:
    void start(Receiver /*onBytes*/, LossHandler /*onLost*/) override {}
    void write(std::string_view /*bytes*/) override {}
    void close() override {}
};

class ReportEquality : public testing::Test
{
protected:
    // The report as JSON; null if the connection did not come to stand.
    Json read(std::shared_ptr<obdsim::IPeer> const& peer, bool plain, ChannelOptions const& channel,
              std::shared_ptr<LearntStore> const& learnt = nullptr)
    {
        SessionOptions options;
        options.port = "a car";
        options.settingsFile = (m_folder.path() / "settings.toml").string();
        options.openPort = [] { return std::make_unique<UnusedPort>(); };
        options.makeChannel = [&](std::shared_ptr<IWire> const&) -> std::shared_ptr<obd::IDataConnection> {
            auto const wire = std::make_shared<support::PeerWire>(peer);
            if (plain) {
                return std::make_shared<support::PlainChannel>(wire);
            }
            return std::make_shared<FastChannel>(wire, channel, learnt);
        };
        try {
            Session session(options);
            session.connect();
            Json report = Json::parse(readVehicle(session).toJson());
            m_counted += session.channel().statistics().counted;
            m_cut += session.channel().statistics().waitsCut;
            return report;
        } catch (Error const&) {
            return {};
        }
    }

    // The fields in which two reports differ, with both values.
    static std::map<std::string, std::string> differences(Json const& plain, Json const& fast)
    {
        std::map<std::string, std::string> found;
        for (auto const& each : nlohmann::ordered_json::diff(plain, fast)) {
            std::string const path = each["path"];
            nlohmann::ordered_json::json_pointer const field(path);
            found[path] = (plain.contains(field) ? plain[field].dump() : "nothing") + " | " +
                          (fast.contains(field) ? fast[field].dump() : "nothing");
        }
        return found;
    }

    support::WorkerClock m_clock;
    testsupport::TemporaryFolder const m_folder;
    unsigned int m_counted = 0;
    unsigned int m_cut = 0;
};

// With the engine standing, so that a value does not depend on when it was asked.
TEST_F(ReportEquality, EverySimulatedCar)
{
    for (std::string const& vehicle : obdsim::simulatedVehicles()) {
        auto const stand = [&vehicle](std::vector<std::string> const& faults = {}) {
            auto car = obdsim::simulateCar({vehicle, "elm327-v1.5", faults});
            car->control("engine stop");
            car->control("voltage 12.4");
            return car;
        };
        Json const plain = read(stand(), true, {});
        EXPECT_TRUE(plain.contains("modules")) << vehicle;
        // The second adapter listens that long whatever it agrees to, which a second visit to it knows.
        auto const learnt = std::make_shared<LearntStore>("");
        for (auto const& faults : {std::vector<std::string>{}, {"wait=400"}, {"wait=400"}}) {
            Json const fast = read(stand(faults), false, {}, faults.empty() ? nullptr : learnt);
            for (auto const& [field, values] : differences(plain, fast)) {
                ADD_FAILURE() << vehicle << " " << field << ": " << values;
            }
        }
    }
    EXPECT_GT(m_counted, 0U);
    EXPECT_GT(m_cut, 0U);
}

// On a slow adapter each of them would cost half a second.
TEST_F(ReportEquality, AReportAsksForNoValueTwiceThatItHas)
{
    auto const car = obdsim::simulateCar({"bench-can11", "elm327-v1.5", {}});
    ASSERT_FALSE(read(car, false, {}).is_null());
    auto const asked = [&car](std::string const& request) {
        auto const counts = car->requests().counts();
        auto const found = counts.find(request);
        return found != counts.end() ? found->second : std::uint64_t{0};
    };
    EXPECT_EQ(asked("01030506070C42"), 2U) << "at the start and at the end, in one request each";
    EXPECT_EQ(asked("010F1F2131"), 1U);
    for (char const* single : {"0103", "010C", "0142", "0121", "0131"}) {
        EXPECT_EQ(asked(single), 0U) << single;
    }
    EXPECT_EQ(asked("0101") + asked("01011"), 4U) << "discovery, codes, and two kinds of readiness";
}

// Without a first request there is no bring-up.
bool canBeOpened(std::filesystem::path const& file)
{
    auto const exchanges = support::readDialogue(file).exchanges;
    return std::any_of(exchanges.begin(), exchanges.end(),
                       [](support::Exchange const& each) { return compactText(each.request) == "0100"; });
}

// "/modules/0/sensors" of "/modules/0/sensors/3/name".
std::string topicOf(std::string const& field)
{
    std::size_t end = 0;
    for (int part = 0; part < 3 && end != std::string::npos; ++part) {
        end = field.find('/', end + 1);
    }
    return field.substr(0, end);
}

TEST_F(ReportEquality, EveryRecordedDialogue)
{
    // What the plain channel loses and this one reads.
    std::set<std::string> const healed = {
        // The engine's mask, behind which stands its answer to an older question; and what follows from it.
        "can29-four-modules-stray-frames/findings/0/text",
        "can29-four-modules-stray-frames/modules/0/sensors",
        "can29-four-modules-stray-frames/modules/0/supported",
    };
    std::set<std::string> found;
    int opened = 0;
    for (auto const& entry : std::filesystem::directory_iterator(support::dialogueFolder)) {
        if (entry.path().extension() != ".dialogue" || !canBeOpened(entry.path())) {
            continue;
        }
        Json const plain = read(obdsim::replay(entry.path().string()), true, {});
        Json const fast =
            read(obdsim::replay(entry.path().string()), false, {.port = {}, .counting = false, .shortWait = false});
        opened += plain.is_null() ? 0 : 1;
        for (auto const& [field, values] : differences(plain, fast)) {
            found.insert(entry.path().stem().string() + topicOf(field));
        }
    }
    EXPECT_EQ(found, healed);
    EXPECT_GE(opened, 15);
}

} // namespace

} // namespace velmora
