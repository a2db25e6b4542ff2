#pragma once

#include "tests/support/logcapture.h"
#include "tests/support/servicerig.h"

#include <obd/isensorservice.h>
#include <obd/ivelmorasettings.h>
#include <obd/parameterdescriptor.h>
#include <obd/sensordatamodels.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <functional>

namespace support {

// Writes down what it hears, as "0C 1726" for a reading, and does inside a call what a test says.
class SensorRecorder : public tervex::Observer<obd::ISensorServiceObserver>
{
public:
    std::function<void()> onUpdate = [] {};
    std::vector<std::string> updates;
    std::vector<std::shared_ptr<obd::SensorValueDataModel>> last; // of the latest update
    int invalidated = 0;

    void onInvalidated() override { ++invalidated; }
    void onSensorUpdated(bool success, std::shared_ptr<obd::ParameterDescriptor> const& descriptor,
                         std::vector<std::shared_ptr<obd::SensorValueDataModel>> const& values) override
    {
        EXPECT_TRUE(success);
        std::string text = obd::ParameterIdentifier(descriptor->pid()).toString().substr(1);
        for (auto const& value : values) {
            text += " " + value->value;
        }
        updates.push_back(text);
        last = values;
        onUpdate();
    }

    // Whether that many updates have come.
    std::function<bool()> reached(std::size_t count)
    {
        return [this, count] { return updates.size() >= count; };
    }
};

// A sensor service over a bus with an engine and a gearbox.
class SensorServiceFixture : public testing::Test
{
protected:
    SensorServiceFixture()
    {
        engine->setSupported(obd::ObdMode::CurrentData,
                             {0x00, 0x01, 0x02, 0x05, 0x06, 0x0C, 0x0D, 0x0F, 0x1C, 0x20, 0x21, 0x40});
        gearbox->setSupported(obd::ObdMode::CurrentData, {0x00, 0x0C, 0x0D});
        proxy().setEcus({engine, gearbox});
        proxy().answer("01 05", "41 05 7B");                                       // 83 degrees C
        proxy().answer("01 06", "41 06 80");                                       // 0 %, bank 1 alone
        proxy().answer("01 0C", {{0x7E8, "41 0C 1A F8"}, {0x7E9, "41 0C 0F A0"}}); // 1726 and 1000 rpm
        proxy().answer("01 0D", "41 0D 64");                                       // 100 km/h
        service->attach(&recorder);
    }

    FakeProxy& proxy() { return *rig.rig.proxy; }
    DispatchLoop& loop() { return rig.rig.loop; }
    obd::IVelmoraSettings& settings() { return *rig.getSettings(); }

    void open()
    {
        rig.open();
        log.clear();
    }
    // Dispatches until that many updates have come.
    void awaitUpdates(std::size_t count) { ASSERT_TRUE(loop().runUntil(recorder.reached(count))); }
    // Dispatches until worker and application have nothing left to do.
    void settle()
    {
        for (int round = 0; round < 3; ++round) {
            ASSERT_TRUE(rig.rig.clock.awaitIdleRound());
            loop().runPending();
        }
    }
    // Runs a piece of code while the request of the first of the ids is on the bus.
    void duringRequest(std::vector<obd::ParameterIdentifier::Id> const& ids, std::function<void()> const& code)
    {
        proxy().hold();
        service->startUpdates(ids);
        ASSERT_TRUE(proxy().awaitHeld());
        code();
        proxy().release();
    }

    LogCapture log;
    ServiceRig rig;
    std::shared_ptr<FakeEcu> const engine = std::make_shared<FakeEcu>(0x7E8);
    std::shared_ptr<FakeEcu> const gearbox = std::make_shared<FakeEcu>(0x7E9);
    SensorRecorder recorder;
    std::shared_ptr<obd::ISensorService> service = obd::SensorServiceBuilder::createSensorService();
};

} // namespace support
