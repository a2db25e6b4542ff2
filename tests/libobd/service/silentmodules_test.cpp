#include "tests/libobd/service/sensorservicefixture.h"

#include <obd/idiagnosticsservice.h>
#include <obd/iecuservice.h>
#include <obd/iroutineservice.h>
#include <obd/itroublecodeservice.h>

// The current module stays silent while another one answers the same request.
namespace {

using support::pid;
using testing::ElementsAre;
using testing::IsEmpty;

class SilentModules : public support::SensorServiceFixture
{
protected:
    void answerOfGearbox(char const* request, char const* reply) { proxy().answer(request, {{0x7E9, reply}}); }
};

TEST_F(SilentModules, HaveNoReadingPublished)
{
    open();
    answerOfGearbox("01 0C", "41 0C 0F A0");
    service->startUpdates({pid(0x0C), pid(0x0D)});
    awaitUpdates(2);
    EXPECT_THAT(recorder.updates, testing::Each("0D 100"));
    proxy().answer("01 0C", {{0x7E8, "41 0C 1A F8"}, {0x7E9, "41 0C 0F A0"}});
    ASSERT_TRUE(loop().runUntil([this] { return recorder.updates.back() == "0C 1726"; }));
    EXPECT_EQ(recorder.last.at(0)->minimum, "1726") << "no 0 went into the statistics";
}

TEST_F(SilentModules, HaveNoReadingOnce)
{
    open();
    answerOfGearbox("01 0C", "41 0C 0F A0");
    EXPECT_THAT(service->fetchSensors(pid(0x0C)), IsEmpty());
    service->updateOnce({pid(0x0C)});
    settle();
    EXPECT_THAT(recorder.updates, IsEmpty());
    rig.getEcuManager()->setCurrentEcu(0x7E9);
    EXPECT_EQ(service->fetchSensors(pid(0x0C)).at(0)->value->value, "1000");
}

TEST_F(SilentModules, HaveNoDerivedValueOfInputsThatAnotherModuleTold)
{
    open();
    answerOfGearbox("01 0D", "41 0D 64");
    EXPECT_THAT(service->fetchSensors(pid(0xF5)), IsEmpty());
    EXPECT_THAT(service->fetchSensors(pid(0xF6)), IsEmpty());
    EXPECT_EQ(service->fetchSensors(pid(0xF4)).at(0)->value->value, "12.5") << "the adapter's, for all";
    rig.getEcuManager()->setCurrentEcu(0x7E9);
    EXPECT_EQ(service->fetchSensors(pid(0xF5)).size(), 1U);
}

TEST_F(SilentModules, HaveNoLampReadinessOrDistance)
{
    engine->setSupported(obd::ObdMode::CurrentData, {0x00, 0x01, 0x21, 0x41});
    open();
    auto const codes = obd::TroubleCodeServiceBuilder::createTroubleCodeService();
    auto const diagnostics = obd::DiagnosticsServiceBuilder::create();
    answerOfGearbox("01 01", "41 01 00 04 00 00");
    answerOfGearbox("01 21", "41 21 01 23");
    EXPECT_EQ(codes->fetchMilStatus(), nullptr);
    EXPECT_EQ(codes->fetchDistance(true), nullptr);
    EXPECT_THAT(diagnostics->fetchReadinessMonitors(), IsEmpty());
    proxy().answer("01 01", {{0x7E8, "41 01 00 07 65 04"}});
    answerOfGearbox("01 41", "41 41 00 04 00 00");
    EXPECT_THAT(diagnostics->fetchReadinessMonitorsThisCycle(), IsEmpty());
}

TEST_F(SilentModules, HaveNothingInTheirFreezeFrame)
{
    engine->setFrame(0, {0x00, 0x02, 0x05, 0x0C});
    open();
    auto const codes = obd::TroubleCodeServiceBuilder::createTroubleCodeService();
    codes->fetchFreezeFramePids(0);
    answerOfGearbox("02 0C 00", "42 0C 00 1A F8");
    EXPECT_THAT(codes->fetchFreezeFrameSensors(0, pid(0x0C)), IsEmpty());
    EXPECT_EQ(codes->fetchFreezeFrameParameter(0, pid(0x0C)), nullptr);
    EXPECT_TRUE(log.contains("ERROR Failed to update parameter (12)"));
}

} // namespace
