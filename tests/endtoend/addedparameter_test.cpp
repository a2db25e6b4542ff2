// A PID that gets a row, and nothing else, from the simulated car to the JSON of the program.

#include "libobd/powertrain/formula.h"
#include "libobd/powertrain/parametertables.h"
#include "libobd/powertrain/quantities.h"
#include "libvelmora/live/livesensors.h"
#include "libvelmora/read/sensorchoice.h"
#include "libvelmora/read/sensornames.h"
#include "program/view/live/livelines.h"
#include "simulator/simulation.h"
#include "tests/support/dispatchloop.h"
#include "tests/support/hexbytes.h"
#include "tests/support/logcapture.h"
#include "tests/support/memorysettings.h"
#include "tests/support/wire/peerconnection.h"
#include "tests/support/workerclock.h"

#include <obd/iconnectionmanager.h>
#include <obd/iecumanager.h>
#include <obd/iecuservice.h>
#include <obd/iobdvelmora.h>
#include <obd/isensorservice.h>
#include <obd/obdvelmorabuilder.h>
#include <obd/parameterfactory.h>
#include <obd/powertrainparameter.h>
#include <tervex/observer.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <atomic>
#include <thread>

namespace {

// What the car's engine module tells of its odometer; the library knows no such PID.
constexpr int odometerPid = 0xA6;

constexpr obd::formula::Decoded odometerTenths(obd::formula::Raw raw, obd::IEcu const& /*ecu*/)
{
    return raw / 10.0;
}

constexpr obd::ParameterRow madeUpRow =
    obd::single(odometerPid, obd::longAt(0), odometerTenths, obd::quantities::distance, "Made-Up Odometer");

class OdometerListener : public tervex::Observer<obd::ISensorServiceObserver>
{
public:
    void onSensorUpdated(bool /*success*/, std::shared_ptr<obd::ParameterDescriptor> const& descriptor,
                         std::vector<std::shared_ptr<obd::SensorValueDataModel>> const& read) override
    {
        table.select({velmora::liveSensors(*descriptor, *descriptor, 0, std::nullopt, velmora::Units::Metric)});
        table.update(descriptor->pid(), read, velmora::cli::LiveTime());
    }

    velmora::cli::LiveTable table;
};

class AddedParameter : public testing::Test
{
protected:
    AddedParameter()
    {
        bool opened = false;
        std::atomic<bool> done{false};
        std::thread opener([&] {
            auto const car = std::make_shared<PeerConnection>(obdsim::simulate({}));
            opened = m_obd->getConnectionManager()->openConnection(car, obd::VehicleProtocol::Automatic, false);
            done = true;
        });
        EXPECT_TRUE(m_loop.runUntil([&done] { return done.load(); }));
        opener.join();
        EXPECT_TRUE(opened);
        m_loop.runPending();
    }
    ~AddedParameter() override
    {
        m_obd->getConnectionManager()->closeConnection();
        m_loop.runPending();
    }

    static obd::ParameterIdentifier::Id id() { return obd::ParameterIdentifier(odometerPid).id(); }
    std::vector<std::string> namesOf(std::vector<std::shared_ptr<obd::ParameterDataModel>> const& parameters)
    {
        std::vector<std::string> names;
        for (auto const& parameter : parameters) {
            names.push_back(parameter->name);
        }
        return names;
    }

    support::LogCapture m_log;
    support::WorkerClock m_clock;
    support::DispatchLoop m_loop;
    std::shared_ptr<obd::IObdVelmora> m_obd =
        obd::ObdVelmoraBuilder::createObdVelmora(0, 0, 0, std::make_shared<support::MemorySettings>());
};

TEST_F(AddedParameter, WithoutARowItIsNowhere)
{
    EXPECT_EQ(obd::ParameterFactory().createParameter(id()), nullptr);
    EXPECT_THAT(obd::EcuServiceBuilder::createEcuService()->furtherParameters(), testing::IsEmpty());
    auto const sensors = obd::SensorServiceBuilder::createSensorService();
    EXPECT_TRUE(sensors->isSupported(id()));
    EXPECT_THROW(velmora::chooseSensors({"odometer"}, velmora::offeredSensors(*sensors)), std::exception);
}

TEST_F(AddedParameter, WithARowItIsInFactoryCatalogueFreezeFrameNamesAndJson)
{
    obd::AddedParameter const added(madeUpRow);

    auto const live = obd::ParameterFactory().createParameter(id());
    ASSERT_NE(live, nullptr);
    EXPECT_EQ(obd::ParameterFactory::dataLength(id()), 4U);

    auto const frame = obd::ParameterFactory().createFreezeFrameParameter(id(), 1);
    ASSERT_NE(frame, nullptr);
    auto const engine = m_obd->getEcuManager()->getCurrentEcu();
    ASSERT_TRUE(frame->setResponseData(engine, support::hexBytes("42 A6 01 00 00 30 39")));
    auto const kept = frame->values(*engine, obd::UnitSystem::Metric);
    ASSERT_EQ(kept.size(), 1U);
    EXPECT_EQ(kept.front()->textualValue(), "1234");

    auto const ecu = obd::EcuServiceBuilder::createEcuService();
    EXPECT_THAT(namesOf(ecu->furtherParameters()), testing::ElementsAre("Made-Up Odometer"));
    EXPECT_THAT(namesOf(ecu->supportedParameters()), testing::Not(testing::Contains("Made-Up Odometer")))
        << "that list ends at 7F";

    auto const sensors = obd::SensorServiceBuilder::createSensorService();
    auto const chosen = velmora::chooseSensors({"odometer", "A6"}, velmora::offeredSensors(*sensors));
    EXPECT_THAT(chosen, testing::ElementsAre(id()));
    EXPECT_EQ(velmora::sensorKey(odometerPid), "PID_A6");

    OdometerListener listener;
    sensors->attach(&listener);
    sensors->updateOnce(chosen);
    ASSERT_TRUE(m_loop.runUntil([&listener] { return !listener.table.rows().empty(); }));
    auto const json = nlohmann::json::parse(velmora::cli::toJsonLine(listener.table.rows().front(), "now"));
    EXPECT_THAT(json.dump(), testing::HasSubstr("Made-Up Odometer"));
    EXPECT_THAT(json.dump(), testing::HasSubstr("48210")) << "what the car has driven";
    sensors->detach(&listener);
}

} // namespace
