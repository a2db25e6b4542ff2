// What an application gets that says nothing, and what a result tells that nobody has filled in: as the public headers
// promise it.
#include <velmora/caroptions.h>
#include <velmora/console.h>
#include <velmora/document.h>
#include <velmora/error.h>
#include <velmora/findings.h>
#include <velmora/health.h>
#include <velmora/history.h>
#include <velmora/limits.h>
#include <velmora/live.h>
#include <velmora/longwatch.h>
#include <velmora/modules.h>
#include <velmora/performance.h>
#include <velmora/ports.h>
#include <velmora/print.h>
#include <velmora/probe.h>
#include <velmora/reading.h>
#include <velmora/recording.h>
#include <velmora/report.h>
#include <velmora/signals.h>
#include <velmora/trips.h>
#include <velmora/vin.h>

#include <gtest/gtest.h>

namespace {

using namespace velmora;

TEST(Defaults, OfWhatIsAskedForAreTheGentleWay)
{
    CarOptions const car;
    EXPECT_FALSE(car.reset || car.sleep || car.forget);
    LiveWish const wish;
    EXPECT_FALSE(wish.fast || wish.allModules);
    EXPECT_EQ(wish.pidsPerRequest, 6U) << "as many as ISO 15765-4 lets one request hold";
    LongWatchOptions const watch;
    EXPECT_FALSE(watch.electric || watch.fast || watch.forPage);
    EXPECT_FALSE(ModuleSearch().anew || ModuleSearch().identifiers);
    EXPECT_FALSE(ProbeRequest().fresh);
    EXPECT_FALSE(DocumentOptions().maskVin);
    EXPECT_EQ(DocumentOptions().inspection, InspectionRule::None);
    TextStyle const style;
    EXPECT_FALSE(style.coloured || style.detailed);
    EXPECT_EQ(style.columns, 0U);
}

TEST(Defaults, OfResultsTellNothing)
{
    OutputCounts const counts;
    EXPECT_EQ(counts.accepted + counts.written + counts.dropped + counts.failures + counts.queued, 0U);
    EXPECT_FALSE(counts.failing);
    Health const health;
    EXPECT_FALSE(health.linkUp);
    EXPECT_EQ(health.requests + health.errors + health.linkLosses + health.wakeRequests, 0U);
    UdsTroubleCode const code{};
    EXPECT_EQ(code.type + code.status, 0);
    UdsModuleReport const module{};
    EXPECT_FALSE(module.byService18 || module.standard);
    LiveSensor const sensor;
    EXPECT_EQ(sensor.module + static_cast<unsigned int>(sensor.id + sensor.uid), 0U);
    EXPECT_FALSE(sensor.isSignal);
    EXPECT_TRUE(sensor.numeric);
    EXPECT_EQ(LiveOffer().id, 0);
    EXPECT_EQ(LiveTurn().module + static_cast<unsigned int>(LiveTurn().id), 0U);
    EXPECT_EQ(Reading().module + static_cast<unsigned int>(Reading().precision), 0U);
    BluetoothEntry const device;
    EXPECT_FALSE(device.paired || device.nearby || device.namedAsOne);
    EXPECT_TRUE(PageLink().outputIsFree);
    EXPECT_FALSE(AdapterConsole::Answer().complete);
    EXPECT_TRUE(SignalOutline().enabled);
    EXPECT_EQ(SignalMistake().line, 0U);
    EXPECT_FALSE(Trip().engineRun);
    EXPECT_EQ(TripTotal().trips, 0);
}

TEST(Defaults, OfRecordingsScansAndReportsAreEmpty)
{
    EXPECT_EQ(SensorEntry().module, 0U);
    EXPECT_EQ(RecordedValue().time, 0);
    EXPECT_EQ(RecordedSensor().decimals, 0);
    EXPECT_TRUE(RecordedSensor().numeric);
    Recording const recording;
    EXPECT_EQ(recording.begin + recording.end, 0);
    EXPECT_FALSE(recording.cut);
    EXPECT_TRUE(recording.dated);
    EXPECT_EQ(KeptScan().number, 0);
    EXPECT_EQ(ScanFacts().modules, 0U);
    EXPECT_EQ(History::Imported().added + History::Imported().known, 0U);
    EXPECT_EQ(PerformanceRun().kilograms, 0);
    EXPECT_FALSE(OxygenReport().onCan);
    EXPECT_EQ(FreezeReport().number, 0U);
    EXPECT_TRUE(CodeList().offered);
    EXPECT_TRUE(toldOffers(ModuleReport()));
    ModuleReport silent{};
    silent.offers = TopicAnswer::Silent;
    EXPECT_FALSE(toldOffers(silent));
    EXPECT_FALSE(VinFacts().smallMaker);
    EXPECT_EQ((Evidence{DataTopic::Codes}).module, 0U);
    EXPECT_FALSE(isSuggestion(Finding{}));
}

TEST(Defaults, KindsOfErrorsAreTheExitCodesOfThePrograms)
{
    int const codes[] = {static_cast<int>(ErrorKind::Failed),        static_cast<int>(ErrorKind::WrongUse),
                         static_cast<int>(ErrorKind::PortFailed),    static_cast<int>(ErrorKind::AdapterSilent),
                         static_cast<int>(ErrorKind::VehicleSilent), static_cast<int>(ErrorKind::NotSupported),
                         static_cast<int>(ErrorKind::Refused),       static_cast<int>(ErrorKind::LinkLost)};
    for (int i = 0; i < 8; ++i) {
        EXPECT_EQ(codes[i], i + 1);
    }
    EXPECT_EQ(static_cast<int>(ErrorKind::Interrupted), 130);
}

TEST(Limits, AreOutsideBeyondTheirEnds)
{
    SensorLimit const both{2.0, 5.0};
    for (double const value : {2.0, 3.0, 5.0}) {
        EXPECT_FALSE(both.isOutside(value)) << value;
    }
    EXPECT_TRUE(both.isOutside(1.9));
    EXPECT_TRUE(both.isOutside(5.1));
    EXPECT_FALSE((SensorLimit{2.0, {}}).isOutside(1e9));
    EXPECT_TRUE((SensorLimit{2.0, {}}).isOutside(-1e9));
    EXPECT_FALSE((SensorLimit{{}, 5.0}).isOutside(-1e9));
    EXPECT_TRUE((SensorLimit{{}, 5.0}).isOutside(1e9));
    EXPECT_FALSE(SensorLimit().isOutside(0.0));
}

} // namespace
