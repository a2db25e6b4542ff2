#include "libvelmora/signal/signalfile.h"
#include "libvelmora/uds/identifierprobe.h"
#include "libvelmora/uds/modulestore.h"
#include "libvelmora/uds/signalboard.h"
#include "tests/support/modulebench.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

namespace velmora {

namespace {

using testing::ElementsAre;
using testing::HasSubstr;
using testing::Pair;

// A module that knows some identifiers, and a vehicle that stands.
class IdentifierProbeTest : public testing::Test
{
protected:
    IdentifierProbeTest()
    {
        m_state.task = {"7E0", "7E8", {}, 0x22, 0xF186, 0xF191};
        m_state.vin = "VELMRAS1M60000022";
        m_bench.answer("01 0D", "41 0D 00");
        m_bench.module("7E0", "22F186", {"7E80462F18601"});
        m_bench.module("7E0", "22F187", {"7E8037F2233"}).module("7E0", "22F188", {"7E8037F227F"});
        m_bench.module("7E0", "22F189", {"7E8037F2222"}).module("7E0", "22F18A", {"7E8037F2231"});
        m_bench.module("7E0", "22F190", {"7E80662F190112233"}).module("7E0", "22F190", {"7E80662F190112244"});
    }

    void run()
    {
        IdentifierProbe probe(
            m_asker,
            [this] {
                if (m_checksLeft == m_movesAt) {
                    m_bench.answer("01 0D", "41 0D 07");
                }
                if (m_checksLeft-- == 0) {
                    throw Error(ErrorKind::Interrupted, "Interrupted");
                }
            },
            [this](ProbeState const& state) { m_saved = state; }, [](ProbeState const& /*state*/) {});
        probe.run(m_state);
    }
    std::string failure()
    {
        try {
            run();
        } catch (Error const& error) {
            return error.what();
        }
        return "none";
    }

    support::FakeClock m_clock;
    support::ModuleBench m_bench{&m_clock};
    ModuleAsker m_asker{m_bench, m_bench};
    ProbeState m_state;
    std::optional<ProbeState> m_saved;
    int m_checksLeft = 1000;
    int m_movesAt = -1; // how many checks are left then
};

TEST_F(IdentifierProbeTest, ListsWhatAnswersWhatIsLockedAndWhatChanges)
{
    unsigned int const start = m_clock.millis();
    run();
    EXPECT_GE(m_clock.millis() - start, 13U * 200) << "five a second: twelve identifiers, and two once more";
    EXPECT_TRUE(m_state.done);
    EXPECT_EQ(m_state.told.size(), 2U);
    EXPECT_THAT(m_state.locked, ElementsAre(Pair(0xF187U, 0x33), Pair(0xF188U, 0x7F)));
    EXPECT_THAT(m_state.later, ElementsAre(Pair(0xF189U, 0x22)));
    EXPECT_NE(m_state.told.at(0xF190), m_state.second.at(0xF190)) << "it changes";
    EXPECT_EQ(m_state.told.at(0xF186), m_state.second.at(0xF186));
    SignalFile const file = toSignalFile(m_state);
    EXPECT_EQ(file.vin, "VELMRAS1*");
    SignalFileReading const again = readSignals(toToml(file), "again.toml");
    EXPECT_TRUE(again.mistakes.empty()) << (again.mistakes.empty() ? "" : again.mistakes.front().what);
    ASSERT_EQ(again.file.signals.size(), 2U);
    EXPECT_EQ(again.file.signals[1].id, "M7E0_22_F190");
}

TEST_F(IdentifierProbeTest, BeginsAtTheVeryFirstIdentifierAndTellsWhatChanges)
{
    m_state.task.from = 0x0000;
    m_state.task.to = 0x0001;
    m_bench.module("7E0", "220000", {"7E80462000005"}).module("7E0", "220001", {"7E80462000107"});
    m_bench.module("7E0", "220001", {"7E80462000108"});
    run();
    ASSERT_EQ(m_state.told.size(), 2U);
    nlohmann::ordered_json const json = toJsonValue(m_state);
    EXPECT_EQ(json["told"][0]["id"], "0000");
    EXPECT_EQ(json["told"][0]["changes"], false);
    EXPECT_EQ(json["told"][1]["data"], "07");
    EXPECT_EQ(json["told"][1]["changes"], true);
}

TEST_F(IdentifierProbeTest, TakesATextWhole)
{
    m_state.task.from = m_state.task.to = 0xF18C; // the serial number
    m_bench.module("7E0", "22F18C", {"7E8100962F18C414243", "7E821444546"});
    run();
    SignalFile const file = toSignalFile(m_state);
    ASSERT_EQ(file.signals.size(), 1U);
    ASSERT_TRUE(file.signals[0].text);
    EXPECT_EQ(file.signals[0].text->first, 0U);
    EXPECT_EQ(file.signals[0].text->count, 0U) << "to the end";
    EXPECT_EQ(textOf(*file.signals[0].text, {'A', 'B', 0x7F}), "AB") << "what can't be read at the end is filling";
}

TEST_F(IdentifierProbeTest, MakesASignalOfEachIdentifierByItsLength)
{
    m_state.told = {{0xF100, {}},
                    {0xF101, {1}},
                    {0xF102, {1, 2}},
                    {0xF103, {1, 2, 3}},
                    {0xF18A, {65, 66, 67, 68}},
                    {0xF18B, {65, 66, 67, 68, 69}},
                    {0xF104, {1, 2, 3, 4, 5}}};
    m_state.task.extended = 0x07;
    m_state.task.reply = "607";
    m_state.vin = "VELMRAS1";
    SignalFile const file = toSignalFile(m_state);
    EXPECT_EQ(file.vin, "") << "too short to tell a model";
    std::string all;
    for (Signal const& each : file.signals) {
        all += each.id + " | " + each.name + " | " + (each.formula ? toText(*each.formula) : "text") + "\n";
        EXPECT_EQ(each.precision, each.formula ? 0 : 2);
        EXPECT_EQ(each.reply, "607");
        EXPECT_EQ(each.extendedAddress, 0x07);
        EXPECT_EQ(each.reason, "found by a probe; what it means is not known");
    }
    EXPECT_EQ(all, "M7E0_22_F101 | Module 7E0, identifier F101 | A\n"
                   "M7E0_22_F102 | Module 7E0, identifier F102 | int16(A, B)\n"
                   "M7E0_22_F103 | Module 7E0, identifier F103 | int24(A, B, C)\n"
                   "M7E0_22_F104 | Module 7E0, identifier F104 | A\n"
                   "M7E0_22_F18A | Module 7E0, identifier F18A | int32(A, B, C, D)\n"
                   "M7E0_22_F18B | Module 7E0, identifier F18B: ABCDE | text\n");
    m_state.task.service = 0x21;
    m_state.task.reply = "7E8";
    m_state.told = {{0x0A, {65, 66, 67, 68, 69}}};
    SignalFile const local = toSignalFile(m_state);
    ASSERT_EQ(local.signals.size(), 1U);
    EXPECT_EQ(local.signals[0].id, "M7E0_21_0A");
    EXPECT_EQ(local.signals[0].request, (std::vector<unsigned char>{0x21, 0x0A}));
    EXPECT_TRUE(local.signals[0].formula) << "what stands there is known of service 22 only";
    EXPECT_EQ(local.signals[0].reply, "") << "which follows from the header";
}

TEST_F(IdentifierProbeTest, RefusesWhatIsNoRange)
{
    auto const problem = [](ProbeTask const& task) {
        try {
            checkProbe(task);
        } catch (Error const& error) {
            EXPECT_EQ(error.kind(), ErrorKind::WrongUse);
            return error.what() + (" | " + error.hints().front());
        }
        return std::string();
    };
    EXPECT_EQ(problem({"7E0", "7E8", {}, 0x22, 0, 0xFFFF}), "");
    EXPECT_EQ(problem({"7E0", "7E8", {}, 0x22, 0, 0x10000}),
              "0 to 10000 is no range of identifiers of service 22 | they go from 0 to FFFF");
    EXPECT_EQ(problem({"7E0", "7E8", {}, 0x1A, 5, 5}), "");
    EXPECT_EQ(problem({"7E0", "7E8", {}, 0x21, 5, 4}),
              "5 to 4 is no range of identifiers of service 21 | they go from 0 to FF");
    EXPECT_EQ(problem({"7E0", "7E8", {}, 0x21, 0, 0x100}),
              "0 to 100 is no range of identifiers of service 21 | they go from 0 to FF");
    EXPECT_EQ(problem({"7E0", "7E8", {}, 0x01, 0, 1}),
              "service 01 has no identifiers to probe | services 22, 21 and 1A can be probed");
    m_bench.refuseAddress("ATFCSM1");
    EXPECT_EQ(failure(), "The request 22F186 can't be asked by this adapter, which does not know ATFCSM1");
    m_state.task.header = "18DA10F1";
    EXPECT_THAT(failure(), HasSubstr("The module can't be asked: the header 18DA10F1 is none of this bus"));
}

TEST_F(IdentifierProbeTest, KeepsWhatItHasEachSixteenIdentifiers)
{
    m_state.task.from = 0x100;
    m_state.task.to = 0x120;
    std::vector<unsigned int> saved;
    std::size_t shown = 0;
    IdentifierProbe probe(
        m_asker, [] {}, [&saved](ProbeState const& state) { saved.push_back(state.next); },
        [&shown](ProbeState const& /*state*/) { ++shown; });
    m_bench.module("7E0", "220100", {"7E80462010005"});
    m_state.told[0xFF] = {1};
    probe.run(m_state);
    EXPECT_EQ(saved, (std::vector<unsigned int>{0x110, 0x120}));
    EXPECT_EQ(shown, 0x21U);
}

TEST_F(IdentifierProbeTest, GoesOnWhereItWasInterruptedOnTheSameVehicleOnly)
{
    testsupport::TemporaryFolder folder;
    ProbeStore const store(folder.path() / "probe.json");
    m_checksLeft = 4;
    EXPECT_EQ(failure(), "Interrupted");
    ASSERT_TRUE(m_saved);
    EXPECT_EQ(m_saved->next, 0xF18AU);
    store.save(*m_saved);
    std::optional<ProbeState> const kept = store.load();
    ASSERT_TRUE(kept);
    EXPECT_EQ(kept->task, m_state.task);
    EXPECT_EQ(kept->vin, m_state.vin);
    EXPECT_EQ(kept->told, m_saved->told);
    EXPECT_EQ(kept->locked, m_saved->locked);
    ProbeState whole = *m_saved;
    whole.task.extended = 0x07;
    whole.task.service = 0x21;
    whole.later = {{0xF189, 0x22}};
    whole.second = {{0xF186, {2, 3}}};
    store.save(whole);
    std::optional<ProbeState> const again = store.load();
    ASSERT_TRUE(again);
    EXPECT_EQ(again->task, whole.task);
    EXPECT_EQ(again->later, whole.later);
    EXPECT_EQ(again->second, whole.second);
    EXPECT_EQ(again->next, whole.next);
    EXPECT_EQ(ProbeStore::besides("/a/settings.toml", whole.task), "/a/probe-7E0-07-21.json");
    EXPECT_EQ(ProbeStore::besides("/a/settings.toml", {}), "/a/probe--22.json");
    EXPECT_EQ(toJsonValue(whole)["locked"][0].dump(), R"({"id":"F187","code":"33","reason":"Security Access Denied"})");
    EXPECT_EQ(toJsonValue(whole)["service"], "21");
    EXPECT_THROW(ProbeStore("/dev/null/probe.json").save(whole), Error);
    ProbeStore(folder.path() / "first" / "use.json").save(whole);
    EXPECT_TRUE(std::filesystem::exists(folder.path() / "first" / "use.json"));
    m_state = *kept;
    m_checksLeft = 1000;
    m_bench.takeAsked();
    run();
    EXPECT_EQ(m_bench.takeAsked().front(), "7E0 22F18A") << "nothing is asked twice";
    EXPECT_EQ(m_state.told.size(), 2U);
    std::ofstream(folder.path() / "probe.json")
        << R"({"next": 7, "told": {"F186": "01", "F1": "02", "F18701": "03", "xyz": "04", "F188": 5, "F189": "z"}})";
    std::optional<ProbeState> const odd = store.load();
    ASSERT_TRUE(odd);
    EXPECT_THAT(odd->told, ElementsAre(Pair(0xF186U, ElementsAre(0x01))))
        << "what is no identifier and no data is left out";
    std::ofstream(folder.path() / "probe.json") << "{\"next\": \"x\"";
    EXPECT_FALSE(store.load()) << "a broken file is as none";
    store.drop();
    EXPECT_FALSE(std::filesystem::exists(folder.path() / "probe.json"));
}

TEST_F(IdentifierProbeTest, StopsOnTrouble)
{
    m_bench.answer("01 0D", "41 0D 05");
    EXPECT_THAT(failure(), HasSubstr("moves (5 km/h)"));
    m_bench.answer("01 0D", "7F 01 12");
    EXPECT_THAT(failure(), HasSubstr("no longer answers")) << "it does not answer 0100 either";
    m_bench.answer("01 00", "41 00 00 00 00 00");
    m_bench.module("7E2", "22F186", {"7EA037F2211"});
    m_state.task.header = "7E2";
    m_state.task.reply = "7EA";
    m_state.next = 0;
    EXPECT_THAT(failure(), HasSubstr("does not know service 22"));
    m_state.task.header = "7E3";
    m_state.task.reply = "7EB";
    EXPECT_THAT(failure(), HasSubstr("does not answer"));
    m_bench.module("7E4", "22F186", {"CAN ERROR"}).module("7E4", "22F187", {"CAN ERROR"});
    m_bench.module("7E4", "22F188", {"BUS ERROR"});
    m_state.task.header = "7E4";
    m_state.task.reply = "7EC";
    m_state.next = 0;
    EXPECT_THAT(failure(), HasSubstr("trouble on the bus"));
    m_state.task.service = 0x2E;
    EXPECT_THAT(failure(), HasSubstr("writes into a module"));
    m_state.task.service = 0x21;
    EXPECT_THAT(failure(), HasSubstr("no range of identifiers"));
}

// The second look at many identifiers takes as long as the first.
TEST_F(IdentifierProbeTest, WatchesTheSpeedDuringTheSecondLook)
{
    m_state.task.from = m_state.task.to = m_state.next = 0xF190;
    for (unsigned int id = 0xF100; id < 0xF180; ++id) {
        m_state.told[id] = {0x01};
    }
    m_movesAt = m_checksLeft - 20;
    EXPECT_THAT(failure(), HasSubstr("moves (7 km/h)"));
    EXPECT_EQ(m_state.next, 0xF191U) << "the first look was over";
    ASSERT_TRUE(m_saved);
}

TEST(ModuleStore, RemembersByVin)
{
    testsupport::TemporaryFolder folder;
    ModuleStore const store(folder.path() / "modules.json");
    EXPECT_FALSE(store.find("A"));
    store.keep("A", {{"743", "763", "BODY", "28400", "0023", 2U}});
    store.keep("B", {});
    auto const modules = store.find("A");
    ASSERT_TRUE(modules);
    ASSERT_EQ(modules->size(), 1U);
    EXPECT_EQ(modules->front().reply, "763");
    EXPECT_EQ(modules->front().codes, 2U);
    EXPECT_TRUE(store.find("B")->empty());
    EXPECT_FALSE(store.find("")) << "no vehicle without a VIN is remembered";
    std::ofstream(folder.path() / "modules.json") << "[1, 2";
    EXPECT_FALSE(store.find("A"));
}

} // namespace

} // namespace velmora
