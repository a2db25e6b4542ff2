#include "libvelmora/report/plain/reporttext.h"
#include "libvelmora/report/vehiclereport.h"

#include <gtest/gtest.h>

namespace {

using namespace velmora;

VehicleReport vehicle()
{
    VehicleReport report;
    report.adapter = {"ELM327 v1.5", "OBDII to RS232 Interpreter", "", 12.34F};
    report.protocol = {6, "ISO 15765-4 (CAN 11/500)"};
    ModuleReport module{0x7E8, "ECM", {0x0C, 0x0D}, {}, {}, {}, {}, {}, {}, {}};
    module.info.standard = "EOBD";
    module.codes = {false, {{CodeKind::Confirmed, CodeList::Answer::Read, {}, {}}}};
    module.readiness = {TopicAnswer::Read, false, {{"Catalyst", ReadinessStatus::Complete, {}}}};
    module.freeze.answer = TopicAnswer::Silent;
    module.counters.answer = TopicAnswer::Silent;
    report.modules = {module};
    return report;
}

TEST(VehicleReportView, ShowsWhatWasToldAndLeavesOutWhatIsNotOffered)
{
    EXPECT_EQ(toText(vehicle(), Style()), R"(Adapter
  Device         ELM327 v1.5
  Description    OBDII to RS232 Interpreter
  Voltage        12.3 V

Protocol
  Number         6
  Name           ISO 15765-4 (CAN 11/500)

Findings
  none in what the vehicle told

Control module 7E8: ECM
  Description    -
  Standard       EOBD
  Protocol       -
  VIN            -
  Calibration    -
  Engine number  -
  Type approval  -
  With lamp on   -
  Since cleared  -
  Live sensors   2

  Lamp           off
  Confirmed      none stored

  Freeze frame   0: no answer

  Readiness      ready
    Monitor   Since cleared  This driving cycle
    Catalyst  complete       -

  Counters       no answer
)");
}

TEST(VehicleReportView, ShowsAnAdapterThatToldNothing)
{
    EXPECT_EQ(toText(VehicleReport(), Style()), R"(Adapter
  Voltage        -

Protocol
  Number         -

Findings
  none in what the vehicle told
)");
}

TEST(VehicleReportView, JsonHoldsEachTopicUnderItsName)
{
    Json const document = Json::parse(vehicle().toJson());
    EXPECT_EQ(document["adapter"], Json::parse(R"({"device": "ELM327 v1.5", "description": "OBDII to RS232 Interpreter",
                                                   "identification": null, "volts": 12.3})"));
    EXPECT_EQ(document["protocol"], (Json{{"number", 6}, {"name", "ISO 15765-4 (CAN 11/500)"}}));
    ModuleReport const module = vehicle().modules[0];
    EXPECT_EQ(document["modules"][0], (Json{{"id", "7E8"},
                                            {"name", "ECM"},
                                            {"info", toJsonValue(module.info)},
                                            {"sensors", {"0C", "0D"}},
                                            {"codes", toJsonValue(module.codes)},
                                            {"freeze", toJsonValue(module.freeze)},
                                            {"readiness", toJsonValue(module.readiness)},
                                            {"monitors", toJsonValue(module.monitors)},
                                            {"oxygen", toJsonValue(module.oxygen)},
                                            {"counters", toJsonValue(module.counters)},
                                            {"supported", "read"},
                                            {"values", Json::array()}}));
}

} // namespace
