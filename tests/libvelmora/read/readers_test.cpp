// What the readers of single topics tell of a simulated car.
#include "libvelmora/poll/vehiclepoll.h"
#include "libvelmora/read/codeclearing.h"
#include "libvelmora/read/codereader.h"
#include "libvelmora/read/diagnosticreaders.h"
#include "libvelmora/read/freezereader.h"
#include "libvelmora/read/groupedpids.h"
#include "libvelmora/read/makerreader.h"
#include "libvelmora/read/modulereader.h"
#include "libvelmora/read/routinereader.h"
#include "libvelmora/read/valuesreader.h"
#include "libvelmora/read/vehiclereader.h"
#include "tests/libvelmora/read/readersfixture.h"

#include <obd/iecumanager.h>
#include <velmora/error.h>

#include <algorithm>

namespace velmora {

namespace {

using test::ReadersTest;
using Read = std::function<void(Session& session, obd::IEcu const& ecu)>;

class ReadersOfTopics : public ReadersTest
{
protected:
    static std::string problem(std::function<void()> const& act)
    {
        try {
            act();
        } catch (Error const& error) {
            return error.what();
        }
        return "none";
    }
};

TEST_F(ReadersOfTopics, TellAVehicleWithTheMeaningsOfAMaker)
{
    connect("petrol-can11");
    VehicleReport const report = readVehicle(*m_session, "Ford");
    ASSERT_EQ(report.modules.size(), 2U);
    ModuleReport const& engine = report.modules[0];
    EXPECT_EQ(engine.codes.maker.by, MakerChoice::By::Option);
    EXPECT_NE(m_progress.find("Reading 7E8 ECM ...\nReading 7E9 "), std::string::npos) << m_progress;
    ASSERT_TRUE(engine.freeze.frame);
    EXPECT_EQ(engine.freeze.frame->code.maker, "Ford");
    EXPECT_EQ(engine.freeze.frame->code.code, "P0133");
    EXPECT_EQ(engine.freeze.frame->readings.size(), 16U);
    EXPECT_EQ(report.protocol.number, 6);
    EXPECT_NEAR(report.adapter.volts.value_or(0), 12.4F, 2.5F);
    std::size_t samples = 0;
    for (LiveValue const& each : engine.values) {
        bool const moving =
            each.pid == 0x05 || each.pid == 0x06 || each.pid == 0x07 || each.pid == 0x0C || each.pid == 0x42;
        EXPECT_EQ(each.samples.size(), each.samples.empty() ? 0U : moving ? 2U : 1U) << each.name;
        samples += each.samples.size();
    }
    EXPECT_GT(samples, 15U);
    auto const sensors = report.modules[1].supported;
    EXPECT_EQ(sensors, (std::vector<unsigned int>{0x05, 0x0C, 0x0D, 0x1C, 0x41, 0x42, 0xF4, 0xF5, 0xF6}));
    m_car->control("voltage 0");
    EXPECT_EQ(readAdapter(*m_session).volts, std::nullopt) << "no adapter runs on no voltage";
}

TEST_F(ReadersOfTopics, TellTestsWithTheirVerdicts)
{
    connect("petrol-can11");
    MonitorsReport const monitors = readMonitors(*m_session, module());
    std::string verdicts;
    for (OnBoardMonitor const& monitor : monitors.monitors) {
        for (LimitTest const& test : monitor.tests) {
            verdicts += test.verdict == LimitTest::Verdict::Passed   ? 'p'
                        : test.verdict == LimitTest::Verdict::Failed ? 'f'
                                                                     : '-';
        }
    }
    EXPECT_EQ(verdicts, "pfpp-ppp");
    CountersReport const counters = readCounters(*m_session, module());
    std::string numbers;
    for (auto const& each : counters.counters) {
        numbers += std::to_string(each.value) + " ";
    }
    EXPECT_EQ(numbers.substr(0, 16), "412 655 388 412 ");
    connect("petrol-iso9141");
    OxygenReport const oxygen = readOxygen(*m_session, module());
    EXPECT_EQ(oxygen.answer, TopicAnswer::Read);
    EXPECT_FALSE(oxygen.onCan);
    std::string sensors;
    for (OxygenSensor const& sensor : oxygen.sensors) {
        for (LimitTest const& test : sensor.tests) {
            sensors += test.verdict == LimitTest::Verdict::Passed   ? 'p'
                       : test.verdict == LimitTest::Verdict::Failed ? 'f'
                       : test.verdict == LimitTest::Verdict::None   ? 'c'
                                                                    : '-';
        }
        sensors += ' ';
    }
    EXPECT_EQ(sensors, "ccpp cp ") << "constants, and what passed";
    EXPECT_EQ(oxygen.complete.has_value(), true);
}

TEST_F(ReadersOfTopics, TellSerialAndTravel)
{
    connect("diesel-can29");
    InfoReport const info = readInfo(*m_session, module());
    EXPECT_EQ(info.engineSerialNumber, "VELMD200000000042");
    EXPECT_FALSE(info.description.empty());
    EXPECT_FALSE(info.standard.empty());
    EXPECT_FALSE(info.protocol.empty());
    EXPECT_EQ(readVin(*m_session, module()), info.vin);
    std::ifstream plain(VELMORA_SOURCE_DIR "/simulator/vehicles/bench-can11.toml");
    std::string text(std::istreambuf_iterator<char>(plain), {});
    text.replace(text.find("VS10-MT-0001"), 12, "VS10-\\u0001T-0001");
    std::ofstream(m_folder.file("odd.toml")) << text;
    connect(m_folder.file("odd.toml"));
    EXPECT_EQ(readInfo(*m_session, module()).calibrations.at(0).id, "VS10-\uFFFDT-0001");
    connect("petrol-can11");
    std::vector<LiveValue> const values = {{0x21, 0, "a", "17", "km", {}}, {0x4D, 0, "b", "18", "min", {}}};
    InfoReport const beside = readInfoBeside(*m_session, module(), values);
    EXPECT_EQ(beside.withLamp.distance->value, "17") << "what is known is not asked for";
    EXPECT_EQ(beside.withLamp.runTime->value, "18");
    EXPECT_EQ(beside.withLamp.runTime->unit, "min");
    EXPECT_TRUE(beside.sinceCleared.distance);
    EXPECT_TRUE(beside.sinceCleared.runTime);
    EXPECT_EQ(std::count(m_asked.begin(), m_asked.end(), "0121"), 0);
    for (char const* const each : {"21 00 07", "31 00 09", "4D 00 0B", "4E 00 0D"}) {
        m_car->control("value 7E8 " + std::string(each));
    }
    InfoReport const own = readInfo(*m_session, module());
    EXPECT_EQ(own.withLamp.distance->value, "7");
    EXPECT_EQ(own.sinceCleared.distance->value, "9");
    EXPECT_EQ(own.withLamp.runTime->value + " " + own.withLamp.runTime->unit, "11 min");
    EXPECT_EQ(own.sinceCleared.runTime->value + " " + own.sinceCleared.runTime->unit, "13 min");
    ASSERT_EQ(own.calibrations.size(), 1U);
    EXPECT_EQ(own.calibrations[0].verification, "1791BC82");
}

TEST_F(ReadersOfTopics, AskForTheVinOnce)
{
    connect("petrol-can11");
    readMaker(*m_session, "");
    EXPECT_EQ(std::count_if(m_asked.begin(), m_asked.end(), [](auto const& each) { return each.starts_with("0902"); }),
              1)
        << "the first module told it";
    m_asked.clear();
    EXPECT_EQ(readMaker(*m_session, "Ford").maker, "Ford");
    EXPECT_TRUE(m_asked.empty());
}

TEST_F(ReadersOfTopics, AddValuesThatWereNotThereAtFirst)
{
    connect("petrol-can11");
    auto const bus = std::make_shared<GroupedPids>(m_session->proxy(), module().id());
    std::vector<LiveValue> values;
    readValuesAgain(*m_session, module(), bus, values);
    ASSERT_GT(values.size(), 5U);
    std::size_t const all = values.size();
    std::string const first = values[0].value;
    values[0].value = "?";
    readValuesAgain(*m_session, module(), bus, values);
    EXPECT_EQ(values.size(), all);
    EXPECT_EQ(values[0].value, first) << "the last reading";
    auto const rpm = std::find_if(values.begin(), values.end(), [](auto const& each) { return each.pid == 0x0C; });
    ASSERT_NE(rpm, values.end());
    EXPECT_EQ(rpm->samples.size(), 2U);
    EXPECT_EQ(rpm->name, "Engine RPM");
    EXPECT_EQ(rpm->unit, "rpm");
    EXPECT_EQ(rpm->part, 0);
}

TEST_F(ReadersOfTopics, TakeNoAnswerOfAnotherModule)
{
    connect("petrol-can11");
    m_car->control("module 7E9 silent");
    auto const bus = std::make_shared<GroupedPids>(m_session->proxy(), module(1).id());
    EXPECT_TRUE(readValues(*m_session, module(1), bus).empty()) << "the engine answered for itself";
}

// The poller's pace depends on the model year where old modules must not be asked too often.
TEST_F(ReadersOfTopics, LeaveTheModuleThatWasCurrent)
{
    connect("petrol-can11");
    obd::IEcuManager& manager = *m_session->obd().getEcuManager();
    manager.setCurrentEcu(0x7E9);
    std::vector<ModuleOffer> offers = moduleOffers(m_session->obd(), {});
    ASSERT_EQ(offers.size(), 2U);
    EXPECT_FALSE(offers[0].meant);
    EXPECT_TRUE(offers[1].meant) << "the current one";
    EXPECT_GT(offers[0].sensors.size(), offers[1].sensors.size());
    EXPECT_EQ(manager.getCurrentEcu()->id(), 0x7E9U);
    manager.setCurrentEcu(0x7E8);
    offers = moduleOffers(m_session->obd(), {0x7E8});
    EXPECT_EQ(manager.getCurrentEcu()->id(), 0x7E8U);
    EXPECT_TRUE(offers[0].meant);
    EXPECT_FALSE(offers[1].meant);
    auto const asksForTheVin = [this] {
        m_asked.clear();
        pollVehicle(m_session->obd(), {}, {}, Units::Metric, [](PollResult const& /*result*/) {}).reset();
        return std::any_of(m_asked.begin(), m_asked.end(), [](auto const& each) { return each.starts_with("0902"); });
    };
    EXPECT_FALSE(asksForTheVin());
    connect("petrol-vpw");
    EXPECT_TRUE(asksForTheVin());
}

// An adapter that is gone is not a module that says nothing.
TEST_F(ReadersOfTopics, AskTheAdapterItselfWhereNothingCame)
{
    Read const last[] = {
        [](auto& s, auto&) { clearCodes(s); },
        [](auto& s, auto& e) {
            runRoutine(s, e, {1, "", ""});
        },
        [](auto& s, auto&) {
            readModules(s, [](Session& each, obd::IEcu const& /*ecu*/) {
                obd::ResponseMap ignored;
                return each.proxy()->execute(std::vector<unsigned char>{0x01, 0x0C}, ignored, 500);
            });
        },
    };
    for (Read const& read : last) {
        connect("bench-can11");
        m_car->control("fault silent@1");
        EXPECT_EQ(problem([&] { read(*m_session, module()); }), "The adapter on a car no longer answers");
    }
}

TEST_F(ReadersOfTopics, TellWhichRoutinesCanBeRun)
{
    connect("petrol-can11");
    RoutinesReport const offered = readRoutines(*m_session, module());
    EXPECT_EQ(offered.answer, TopicAnswer::Read);
    ASSERT_EQ(offered.routines.size(), 2U);
    EXPECT_EQ(offered.routines[1].id, 2);
    EXPECT_EQ(readRoutines(*m_session, module(1)).answer, TopicAnswer::Silent);
    EXPECT_EQ(findRoutine(*m_session, 1).ecu->id(), 0x7E8U);
    EXPECT_EQ(problem([this] { findRoutine(*m_session, 3); }), "No control module offers a known routine 03");
    Routine const routine{1, "Leak", ""};
    EXPECT_EQ(runRoutine(*m_session, module(), routine).result, RoutineRun::Result::Accepted);
    RoutineRun const refused = runRoutine(*m_session, module(), {2, "", ""});
    EXPECT_EQ(refused.result, RoutineRun::Result::Refused);
    EXPECT_EQ(problem([&] { requireAccepted(refused); }),
              "The vehicle refused to run routine 02: conditions not correct (22)");
    EXPECT_EQ(problem([&] {
                  requireAccepted({routine, RoutineRun::Result::Refused, ""});
              }),
              "The vehicle refused to run routine 01");
    EXPECT_EQ(problem([&] {
                  requireAccepted({routine, RoutineRun::Result::Unreadable, ""});
              }),
              "What the vehicle said to routine 01 can't be read");
    EXPECT_EQ(problem([&] {
                  requireAccepted({routine, RoutineRun::Result::NoAnswer, ""});
              }),
              "The vehicle did not say whether it runs routine 01");
    EXPECT_EQ(problem([&] { requireAccepted({routine, RoutineRun::Result::Accepted, ""}); }), "none");
    std::string const file = m_folder.file("unknown.toml");
    std::filesystem::copy_file(VELMORA_SOURCE_DIR "/simulator/vehicles/bench-can11.toml", file);
    std::ofstream(file, std::ios::app) << "\n[[module.routines]]\nid = \"1F\"\n";
    connect(file);
    EXPECT_EQ(readRoutines(*m_session, module()).answer, TopicAnswer::NotOffered) << "nobody knows what 1F does";
}

TEST_F(ReadersOfTopics, ForgetFreezeFramesThatWereErased)
{
    connect("petrol-can11");
    EXPECT_TRUE(readFreeze(*m_session, module(), 0).frame);
    auto const cleared = clearCodes(*m_session);
    ASSERT_EQ(cleared.size(), 2U);
    EXPECT_EQ(cleared[0].name, "ECM");
    m_asked.clear();
    FreezeReport const erased = readFreeze(*m_session, module(), 0);
    EXPECT_FALSE(erased.frame);
    EXPECT_EQ(erased.answer, TopicAnswer::Read) << "there is none, and the module says so";
    EXPECT_TRUE(m_asked.at(0).starts_with("020000")) << "what the frame holds is asked for anew, not " << m_asked[0];
    m_car->control("ignition off");
    auto const silent = clearCodes(*m_session);
    ASSERT_EQ(silent.size(), 2U) << "modules that are known and say nothing are told of, too";
    for (auto const& each : silent) {
        EXPECT_EQ(each.report.result, ClearReport::Result::NoAnswer);
    }
    EXPECT_EQ(problem([&] { requireCleared(silent); }), "No control module confirmed that it cleared its codes");
    connect("petrol-can11", "module 7E9 silent");
    EXPECT_EQ(m_session->selectedModules().size(), 1U);
    m_car->control("module 7E9 speaks");
    EXPECT_EQ(clearCodes(*m_session).size(), 2U) << "who answers is told of, known or not";
    auto mixed = silent;
    mixed[1].report = {ClearReport::Result::Refused, "conditions not correct (22)"};
    std::string const refusal = "Control module 7E9 refused to clear its codes: conditions not correct (22)";
    EXPECT_EQ(problem([&] { requireCleared(mixed); }), refusal);
    mixed[0].report.result = ClearReport::Result::Cleared;
    EXPECT_EQ(problem([&] { requireCleared(mixed); }), "none");
    EXPECT_EQ(problem([&] { requireAllCleared(mixed); }), refusal);
    mixed[1].report.result = ClearReport::Result::NoAnswer;
    EXPECT_EQ(problem([&] { requireAllCleared(mixed); }), "none") << "silence is no refusal where another cleared";
}

} // namespace

} // namespace velmora
