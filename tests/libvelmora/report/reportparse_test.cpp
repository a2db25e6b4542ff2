#include "libvelmora/report/document/vehiclereportjson.h"
#include "tests/libvelmora/report/carbuilder.h"

#include <velmora/error.h>

#include <gtest/gtest.h>

#include <functional>

namespace {

using namespace velmora;
using namespace testsupport;

// Each kind of answer and each member that may be missing at least once.
VehicleReport fullReport()
{
    ModuleReport module = soundModule();
    module.info.vin = "1M8GDM9AXKP042788";
    module.info.description = "Engine";
    module.info.standard = "EOBD";
    module.info.protocol = "ISO 15765-4";
    module.info.engineSerialNumber = "4711";
    module.info.erotan = "EX1";
    module.info.withLamp = {InfoReport::Reading{"1", "km"}, InfoReport::Reading{"2", "min"}};
    module.info.calibrations = {{"A", "1"}, {"B", ""}};
    module.info.sinceCleared.distance = InfoReport::Reading{"412", "km"};
    module.codes.lists[0] = readCodes(CodeKind::Confirmed, {"P1105", "P0420"});
    module.codes.lists[1] = {CodeKind::Pending, CodeList::Answer::Refused, "busy (21)", {}};
    module.codes.lists[2] = {CodeKind::Permanent, CodeList::Answer::Silent, {}, {}, false};
    module.codes.lampAnswer = TopicAnswer::Read;
    applyMaker(module.codes, {MakerChoice::By::Vin, "Ford"});
    module.freeze = {0, TopicAnswer::Read,
                     FreezeFrame{troubleCode("P0420"), {{"Engine RPM", "1726", "rpm"}, {"Speed", std::nullopt, ""}}}};
    module.readiness.monitors[0].thisCycle = ReadinessStatus::DisabledThisCycle;
    module.monitors = {TopicAnswer::Read,
                       {{0x21,
                         "Catalyst",
                         {{0x80, "A", "1", "2", "3", "V", LimitTest::Verdict::Failed},
                          {0x81, "B", "", "", "", "", LimitTest::Verdict::NoResult}}}}};
    module.oxygen = {
        TopicAnswer::Read,
        true,
        false,
        {{obd::OxygenSensorLocation::Bank4Sensor2, {{0x01, "C", "0.4", "", "", "V", LimitTest::Verdict::None}}}}};
    module.counters = {TopicAnswer::Read, {{"Ignition Cycle Counter", 65535}}};
    setValue(module, 0x05, {87.5, 88}, "88", "\u00B0C");
    ModuleReport silent{0x18DAF110, "", {}, {}, {}, {}, {}, {}, {}, {}};
    silent.offers = TopicAnswer::Refused;
    silent.oxygen = {TopicAnswer::Read, {}, true, {{obd::OxygenSensorLocation::Bank1Sensor1, {}}}};
    VehicleReport report = vehicleOf({module, silent});
    report.adapter.volts = 12.3F;
    return report;
}

TEST(ReportParser, GivesTheReportOfTheDocumentAgain)
{
    std::string const document = fullReport().toJson();
    VehicleReport const parsed = parseReport(Json::parse(document));
    EXPECT_EQ(parsed.toJson(), document);
    EXPECT_EQ(parsed.modules[0].codes.lists[0].codes[0].maker, "Ford");
    EXPECT_FALSE(parsed.modules[0].codes.lists[2].offered);
    EXPECT_TRUE(parsed.modules[1].oxygen.onCan);
    EXPECT_EQ(parseReport(Json::parse(VehicleReport().toJson())).toJson(), VehicleReport().toJson());
}

void forEachPlace(Json& value, std::function<void(Json&)> const& visit)
{
    visit(value);
    if (value.is_structured()) {
        for (Json& inner : value) {
            forEachPlace(inner, visit);
        }
    }
}

// Whatever single value of a document is spoilt: an error or a report, never more.
TEST(ReportParser, RefusesWhatIsNotAsItShouldBe)
{
    Json const sound = Json::parse(fullReport().toJson());
    int refused = 0;
    int places = 0;
    for (Json const& wrong : {Json(nullptr), Json(-1), Json("x"), Json::array()}) {
        Json document = sound;
        forEachPlace(document, [&](Json& place) {
            Json const kept = place;
            place = wrong;
            ++places;
            try {
                parseReport(document);
            } catch (Error const& error) {
                ++refused;
                EXPECT_NE(std::string(error.what()).find(" at /"), std::string::npos) << error.what();
            }
            place = kept;
        });
    }
    EXPECT_GT(refused, places / 2);
    EXPECT_LT(refused, places);
}

} // namespace
