#include "tests/support/servicetest.h"

#include <obd/idiagnosticsservice.h>
#include <obd/iecuservice.h>
#include <obd/iroutineservice.h>
#include <obd/isensorservice.h>
#include <obd/itroublecodeservice.h>
#include <obd/itroubleshootingservice.h>

#include <functional>
#include <optional>

// Every operation that tells how it went is brought to every way in which it can go.
namespace {

using obd::ObdMode;
using obd::OutcomeKind;
using obd::Verdict;
using support::pid;

// How an operation went, and whether its value holds anything.
struct Told
{
    Verdict verdict;
    bool holdsValue;
};

template <typename T>
Told told(obd::Outcome<std::vector<T>> const& outcome)
{
    return {outcome, !outcome.value.empty()};
}
template <typename T>
Told told(obd::Outcome<std::shared_ptr<T>> const& outcome)
{
    return {outcome, outcome.value != nullptr};
}
Told told(obd::Outcome<std::string> const& outcome)
{
    return {outcome, !outcome.value.empty()};
}
Told told(obd::Outcome<bool> const& outcome)
{
    return {outcome, outcome.value};
}

struct Operation
{
    std::string name;
    std::function<Told()> ask;
    std::string request;
    std::string answer;
    std::string nothing; // what tells that nothing is stored, or why no reply can
    std::string unreadable;
    std::optional<ObdMode> offered; // the service by whose set the module offers it

    // A sentence is no reply.
    bool canBeEmpty() const { return nothing.find("none") == std::string::npos; }
};

class Outcomes : public support::ServiceTest
{
protected:
    static constexpr obd::OxygenSensorLocation front = obd::OxygenSensorLocation::Bank1Sensor1;

    Outcomes()
    {
        m_rig.rig.proxy->setEcus({m_engine, std::make_shared<support::FakeEcu>(0x7E9U)});
        offerAll();
    }

    void offerAll()
    {
        m_engine->setSupported(ObdMode::CurrentData, {0x00, 0x01, 0x03, 0x20, 0x21, 0x40, 0x41, 0x4E})
            .setSupported(ObdMode::MonitorTests, {0x00, 0x21})
            .setSupported(ObdMode::SystemControl, {0x00, 0x01})
            .setSupported(ObdMode::VehicleInformation, {0x00, 0x02, 0x04, 0x06, 0x08, 0x0D, 0x0F})
            .setTests(front, {0x05})
            .setFrame(0, {0x00, 0x02, 0x03});
        m_engine->resetFreezeFrameConfiguration();
        m_engine->detectFreezeFrameConfiguration(0);
    }

    void withdraw(ObdMode mode)
    {
        m_engine->setSupported(mode, {0x00}).setTests(front, {}).setFrame(0, {0x00, 0x02});
        m_engine->resetFreezeFrameConfiguration();
        m_engine->detectFreezeFrameConfiguration(0);
    }

    // Those of the trouble codes.
    std::vector<Operation> codeOperations()
    {
        auto* const s = codes.get();
        return {
            {"confirmed",
             [s] { return told(s->askConfirmedCodes()); },
             "03",
             "43 01 01 33",
             "43 00",
             "43 02 01 33",
             {}},
            {"pending", [s] { return told(s->askPendingCodes()); }, "07", "47 01 01 33", "47 00", "47 01", {}},
            {"permanent", [s] { return told(s->askPermanentCodes()); }, "0A", "4A 01 01 33", "4A 00", "4A", {}},
            {"lamp", [s] { return told(s->askMilStatus()); }, "01 01", "41 01 81 07 65 04", "none: a lamp is on or off",
             "41 01 81", ObdMode::CurrentData},
            {"distance", [s] { return told(s->askDistance(true)); }, "01 21", "41 21 00 05", "none: 0 km is a distance",
             "41 21 00", ObdMode::CurrentData},
            {"run time", [s] { return told(s->askRuntime(false)); }, "01 4E", "41 4E 00 05",
             "none: 0 minutes are a time", "41 4E", ObdMode::CurrentData},
            {"frame code",
             [s] { return told(s->askFreezeFrameTroubleCode(0)); },
             "02 02 00",
             "42 02 00 01 33",
             "42 02 00 00 00",
             "42 02 00 01",
             {}},
            {"frame sensors", [s] { return told(s->askFreezeFrameSensors(0, pid(0x03))); }, "02 03 00",
             "42 03 00 02 00", "42 03 00 00 00", "42 03 00 02", ObdMode::FreezeFrame},
            {"frame parameter", [s] { return told(s->askFreezeFrameParameter(0, pid(0x03))); }, "02 03 00",
             "42 03 00 02 00", "42 03 00 00 00", "42 03 01 02 00", ObdMode::FreezeFrame},
            {"clearing", [s] { return told(s->askResetCodes()); }, "04", "44", "none: it asks for nothing", "45", {}},
        };
    }

    std::vector<Operation> otherOperations()
    {
        auto* const d = diagnostics.get();
        auto* const e = information.get();
        std::string const vin = " 31 47 31 4A 43 35 34 34 34 52 37 32 35 32 33 36 37";
        std::string const blank = " 00 00 00 00 00 00 00 00 00 00 00 00 00 00 00 00 00";
        return {
            {"readiness", [d] { return told(d->askReadinessMonitors()); }, "01 01", "41 01 00 07 65 04",
             "41 01 00 00 00 00", "41 01 00", ObdMode::CurrentData},
            {"this cycle", [d] { return told(d->askReadinessMonitorsThisCycle()); }, "01 41", "41 41 00 07 65 04",
             "41 41 00 00 00 00", "41 41", ObdMode::CurrentData},
            {"monitors", [d] { return told(d->askMonitorTests()); }, "06 21", "46 21 81 16 04 B0 00 00 0F A0",
             "none: a monitor that is offered has its tests", "46 21 81", ObdMode::MonitorTests},
            {"counters", [d] { return told(d->askPerformanceCounters()); }, "09 08",
             "49 08 02 03 3F 0C A1" + blank + blank, "49 08 02 00 00 00 00" + blank + blank, "49 08 02",
             ObdMode::VehicleInformation},
            {"oxygen", [d] { return told(d->askOxygenSensorTests(front)); }, "05 05 01", "45 05 01 14 00 20",
             "none: a test that is offered has a value", "45 05", ObdMode::MonitorTests},
            {"oxygen complete", [d] { return told(d->askOxygenSensorTestComplete()); }, "01 01", "41 01 00 00 20 00",
             "41 01 00 00 00 00", "41 01", ObdMode::CurrentData},
            {"VIN", [e] { return told(e->askVehicleIdentificationNumber()); }, "09 02", "49 02 01" + vin,
             "49 02 01" + blank, "49 02 01 31", ObdMode::VehicleInformation},
            {"calibrations", [e] { return told(e->askCalibrationIds()); }, "09 04", "49 04 01" + vin.substr(0, 48),
             "49 04 00" + blank.substr(0, 48), "49 04", ObdMode::VehicleInformation},
            {"verification", [e] { return told(e->askVerificationNumbers()); }, "09 06", "49 06 01 17 91 BC 82",
             "49 06 00 00 00 00 00", "49 06", ObdMode::VehicleInformation},
            {"serial number", [e] { return told(e->askEngineSerialNumber()); }, "09 0D", "49 0D 01" + vin,
             "49 0D 01" + blank, "49 0D", ObdMode::VehicleInformation},
            {"approval", [e] { return told(e->askErotan()); }, "09 0F", "49 0F 01" + vin, "49 0F 01" + blank, "49 0F",
             ObdMode::VehicleInformation},
            {"routine", [this] { return told(routines->askRoutine(1)); }, "08 01", "48 01", "none: it asks for nothing",
             "48 02", ObdMode::SystemControl},
            {"sensors", [this] { return told(sensors->askSensors(pid(0x03))); }, "01 03", "41 03 02 00", "41 03 00 00",
             "41 03 02", ObdMode::CurrentData},
        };
    }

    void forEach(std::function<void(Operation const&)> const& check)
    {
        for (auto const& operations : {codeOperations(), otherOperations()}) {
            for (Operation const& operation : operations) {
                SCOPED_TRACE(operation.name);
                proxy().forgetAnswers();
                proxy().answer("01 01", "41 01 00 07 65 04"); // beside the readiness of this cycle
                offerAll();
                check(operation);
            }
        }
    }

    void reply(Operation const& operation, std::string const& bytes, unsigned int module = 0x7E8)
    {
        proxy().answer(operation.request, {{module, bytes}});
    }

    std::shared_ptr<obd::ITroubleCodeService> codes = obd::TroubleCodeServiceBuilder::createTroubleCodeService();
    std::shared_ptr<obd::IDiagnosticsService> diagnostics = obd::DiagnosticsServiceBuilder::create();
    std::shared_ptr<obd::IEcuService> information = obd::EcuServiceBuilder::createEcuService();
    std::shared_ptr<obd::IRoutineService> routines = obd::RoutineServiceBuilder::createRoutineService();
    std::shared_ptr<obd::ISensorService> sensors = obd::SensorServiceBuilder::createSensorService();
};

TEST_F(Outcomes, AnsweredComesWithAValue)
{
    open();
    forEach([this](Operation const& operation) {
        reply(operation, operation.answer);
        Told const told = operation.ask();
        EXPECT_EQ(told.verdict, Verdict{OutcomeKind::Answered}) << static_cast<int>(told.verdict.kind);
        EXPECT_TRUE(told.holdsValue);
    });
}

TEST_F(Outcomes, NothingStoredIsAnAnswer)
{
    open();
    int without = 0;
    forEach([&](Operation const& operation) {
        if (!operation.canBeEmpty()) {
            ++without;
            return;
        }
        proxy().answer("01 01", "41 01 00 00 00 00"); // no monitor is there
        reply(operation, operation.nothing);
        EXPECT_EQ(operation.ask().verdict, Verdict{OutcomeKind::NothingStored});
    });
    EXPECT_EQ(without, 7);
}

TEST_F(Outcomes, AModuleIsSilentWhetherOrNotOthersAnswer)
{
    open();
    forEach([this](Operation const& operation) {
        proxy().fail(operation.request, obd::IDevice::Status::NoResponse);
        Told const none = operation.ask();
        EXPECT_EQ(none.verdict, Verdict{OutcomeKind::ModuleSilent});
        reply(operation, operation.answer, 0x7E9);
        Told const others = operation.ask();
        EXPECT_EQ(others.verdict, Verdict{OutcomeKind::ModuleSilent});
        EXPECT_EQ(others.holdsValue, operation.name == "routine") << "which says that it has not run";
    });
}

TEST_F(Outcomes, ARefusalComesWithItsCode)
{
    open();
    forEach([this](Operation const& operation) {
        std::string const service = operation.request.substr(0, 2);
        proxy().answer(operation.request, {{0x7E8, "7F " + service + " 22"}, {0x7E9, operation.answer}});
        EXPECT_EQ(operation.ask().verdict, (Verdict{OutcomeKind::Refused, 0x22}));
        reply(operation, "7F " + service + " 11");
        EXPECT_EQ(operation.ask().verdict, (Verdict{OutcomeKind::NotOffered, 0x11})) << "the service is not there";
    });
}

TEST_F(Outcomes, WhatCannotBeReadIsNoSilence)
{
    open();
    forEach([this](Operation const& operation) {
        reply(operation, operation.unreadable);
        Told const told = operation.ask();
        EXPECT_EQ(told.verdict, Verdict{OutcomeKind::Unreadable}) << static_cast<int>(told.verdict.kind);
        EXPECT_EQ(told.holdsValue, operation.name == "routine");
        proxy().fail(operation.request, obd::IDevice::Status::Unparsed);
        EXPECT_EQ(operation.ask().verdict, Verdict{OutcomeKind::Unreadable});
    });
}

TEST_F(Outcomes, AReplyThatTheAdapterLostIsNoSilence)
{
    open();
    forEach([this](Operation const& operation) {
        for (obd::AdapterNote const note : {obd::AdapterNote::ReplyLost, obd::AdapterNote::NotUnderstood}) {
            proxy().note(operation.request, note);
            EXPECT_EQ(operation.ask().verdict, Verdict{OutcomeKind::Unreadable});
        }
    });
}

TEST_F(Outcomes, WithoutAConnectionOrALinkNothingIsAskedOrBlamedOnTheModule)
{
    forEach([](Operation const& operation) {
        EXPECT_EQ(operation.ask().verdict, Verdict{OutcomeKind::NotConnected}) << "before the opening";
    });
    open();
    forEach([this](Operation const& operation) {
        for (auto const status : {obd::IDevice::Status::NotSent, obd::IDevice::Status::NotEnabled}) {
            proxy().fail(operation.request, status);
            EXPECT_EQ(operation.ask().verdict, Verdict{OutcomeKind::NotConnected}) << "the link goes meanwhile";
        }
    });
    proxy().setConnected(false);
    proxy().forgetRequests();
    forEach([](Operation const& operation) {
        EXPECT_EQ(operation.ask().verdict, Verdict{OutcomeKind::NotConnected}) << "the link is lost";
    });
    m_rig.close();
    forEach([](Operation const& operation) {
        EXPECT_EQ(operation.ask().verdict, Verdict{OutcomeKind::NotConnected}) << "after the closing";
    });
    EXPECT_EQ(proxy().count(), 0);
}

TEST_F(Outcomes, WhatTheModuleDoesNotOfferIsNotAskedFor)
{
    open();
    int withdrawn = 0;
    forEach([&](Operation const& operation) {
        if (operation.offered) {
            withdraw(*operation.offered);
            EXPECT_EQ(operation.ask().verdict, Verdict{OutcomeKind::NotOffered});
            ++withdrawn;
        }
    });
    EXPECT_EQ(withdrawn, 18);
    EXPECT_EQ(proxy().count(), 0);
}

TEST_F(Outcomes, OfASetThatWasNotReadNothingIsKnown)
{
    open();
    for (ObdMode const mode :
         {ObdMode::CurrentData, ObdMode::MonitorTests, ObdMode::SystemControl, ObdMode::VehicleInformation}) {
        m_engine->setSupported(mode, {0x00}).setDetection(mode, {OutcomeKind::ModuleSilent});
    }
    proxy().answer("09 02", "49 02 01 31 47 31 4A 43 35 34 34 34 52 37 32 35 32 33 36 37");
    EXPECT_EQ(information->askVehicleIdentificationNumber().value, "1G1JC5444R7252367");
    EXPECT_EQ(diagnostics->askMonitorTests().kind, OutcomeKind::ModuleSilent);
    EXPECT_EQ(diagnostics->askPerformanceCounters().kind, OutcomeKind::ModuleSilent);
    EXPECT_EQ(routines->askRoutines().kind, OutcomeKind::ModuleSilent);
    EXPECT_EQ(codes->askDistance(true).kind, OutcomeKind::ModuleSilent);
    EXPECT_EQ(proxy().count(), 1);
}

TEST_F(Outcomes, OfAFreezeFramesPidsComeFromTheAskingForThem)
{
    auto const pids = [this] { return codes->askFreezeFramePids(0); };
    EXPECT_EQ(pids().kind, OutcomeKind::NotConnected);
    open();
    EXPECT_EQ(Verdict(pids()), Verdict{});
    EXPECT_EQ(pids().value, std::vector{pid(0x03)});
    m_engine->setFrame(0, {0x00});
    m_engine->resetFreezeFrameConfiguration();
    EXPECT_EQ(pids().kind, OutcomeKind::NothingStored);
    for (Verdict const& verdict : {Verdict{OutcomeKind::ModuleSilent}, Verdict{OutcomeKind::Unreadable},
                                   Verdict{OutcomeKind::Refused, 0x22}, Verdict{OutcomeKind::NotConnected}}) {
        m_engine->setDetection(ObdMode::FreezeFrame, verdict);
        EXPECT_EQ(Verdict(pids()), verdict);
    }
    m_engine->setDetection(ObdMode::FreezeFrame, {OutcomeKind::Refused, 0x12});
    EXPECT_EQ(Verdict(pids()), (Verdict{OutcomeKind::NotOffered, 0x12}));
}

TEST_F(Outcomes, OfRoutinesComeFromTheAskingForThem)
{
    EXPECT_EQ(routines->askRoutines().kind, OutcomeKind::NotConnected);
    open();
    EXPECT_EQ(routines->askRoutines().kind, OutcomeKind::Answered);
    EXPECT_EQ(routines->askRoutines().value.at(0)->id, 1);
    m_engine->setSupported(ObdMode::SystemControl, {0x00, 0x09});
    EXPECT_EQ(routines->askRoutines().kind, OutcomeKind::NothingStored) << "none that the library knows";
    m_engine->setSupported(ObdMode::SystemControl, {0x00});
    EXPECT_EQ(routines->askRoutines().kind, OutcomeKind::NotOffered);
    m_engine->setDetection(ObdMode::SystemControl, {OutcomeKind::Refused, 0x22});
    EXPECT_EQ(Verdict(routines->askRoutines()), (Verdict{OutcomeKind::Refused, 0x22}));
    for (OutcomeKind const kind : {OutcomeKind::Unreadable, OutcomeKind::ModuleSilent}) {
        m_engine->setDetection(ObdMode::SystemControl, {kind});
        EXPECT_EQ(routines->askRoutines().kind, kind);
    }
}

// An adapter's text is given as it came, so a refusal in it is an answer, and there is none that says "nothing stored".
TEST_F(Outcomes, OfACommandToTheAdapterTellWhatItSaid)
{
    auto const service = obd::TroubleshootingServiceBuilder::createTroubleshootingService();
    auto const ask = [&service] { return service->askQuery("0100", 100); };
    EXPECT_EQ(ask().kind, OutcomeKind::NotConnected) << "before the opening";
    open();
    for (std::string const text : {"ELM327 v1.5", "7F0112"}) {
        proxy().answerCommand("0100", text);
        EXPECT_EQ(Verdict(ask()), Verdict{});
        EXPECT_EQ(ask().value, text);
    }
    proxy().failCommand("0100", obd::IDevice::Status::NoResponse);
    EXPECT_EQ(Verdict(ask()), Verdict{OutcomeKind::ModuleSilent});
    EXPECT_EQ(ask().value, "");
    proxy().noteCommand("0100", obd::AdapterNote::ReplyLost);
    EXPECT_EQ(Verdict(ask()), Verdict{OutcomeKind::Unreadable});
    proxy().noteCommand("0100", obd::AdapterNote::NotUnderstood);
    EXPECT_EQ(Verdict(ask()), Verdict{OutcomeKind::NotOffered});
    for (auto const status :
         {obd::IDevice::Status::NotSent, obd::IDevice::Status::NotEnabled, obd::IDevice::Status::Unparsed}) {
        proxy().failCommand("0100", status);
        EXPECT_EQ(Verdict(ask()), Verdict{OutcomeKind::NotConnected});
    }
    m_rig.close();
    EXPECT_EQ(ask().kind, OutcomeKind::NotConnected) << "after the closing";
}

TEST_F(Outcomes, WhatIsToldInPartTellsWhatIsMissing)
{
    m_engine->setSupported(ObdMode::MonitorTests, {0x00, 0x01, 0x02, 0x21});
    open();
    proxy().answer("06 21", "46 21 81 16 04 B0 00 00 0F A0");
    proxy().answer("06 02", "7F 06 22");
    auto const monitors = diagnostics->askMonitorTests();
    EXPECT_EQ(monitors.kind, OutcomeKind::Answered);
    EXPECT_EQ(monitors.value.size(), 1U);
    EXPECT_EQ(monitors.missing, 2U);
}

TEST_F(Outcomes, CountersThatAreAllZeroAreNothingUnlessSomeAreMissing)
{
    m_engine->setSupported(ObdMode::VehicleInformation, {0x00, 0x08, 0x0B});
    open();
    std::string const zeros = " 00 00 00 00 00 00 00 00 00 00 00 00 00 00 00 00 00 00 00 00";
    proxy().answer("09 08", {{0x7E8, "49 08 10" + zeros + zeros}});
    auto const counters = diagnostics->askPerformanceCounters();
    EXPECT_EQ(counters.kind, OutcomeKind::ModuleSilent) << "the others were not told";
    EXPECT_EQ(counters.missing, 1U);
}

} // namespace
