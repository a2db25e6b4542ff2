#include "libvelmora/report/inforeport.h"
#include "libvelmora/report/plain/reporttext.h"

#include <gtest/gtest.h>

namespace {

using namespace velmora;

InfoReport fullInfo()
{
    InfoReport report;
    report.description = "Engine Control";
    report.standard = "EOBD";
    report.protocol = "ISO 15765-4";
    report.vin = "VELMRAS1MM0000001";
    report.calibrations = {{"VS16-MT-0420", "1791BC82"}, {"VS16-2", ""}};
    report.engineSerialNumber = "E123";
    report.erotan = "R49";
    report.withLamp.runTime = InfoReport::Reading{"35", "min"};
    report.sinceCleared = {InfoReport::Reading{"640", "km"}, InfoReport::Reading{"900", "min"}};
    return report;
}

TEST(InfoReportView, ShowsWhatTheModuleTells)
{
    EXPECT_EQ(toText(fullInfo(), Style()), "  Description    Engine Control\n"
                                           "  Standard       EOBD\n"
                                           "  Protocol       ISO 15765-4\n"
                                           "  VIN            VELMRAS1MM0000001\n"
                                           "  Calibration    VS16-MT-0420  verification 1791BC82\n"
                                           "                 VS16-2\n"
                                           "  Engine number  E123\n"
                                           "  Type approval  R49\n"
                                           "  With lamp on   engine ran 35 min\n"
                                           "  Since cleared  640 km, engine ran 900 min\n");
}

TEST(InfoReportView, DashesStandForWhatIsNotTold)
{
    InfoReport report;
    report.vin = "V";
    EXPECT_EQ(toText(report, Style()), "  Description    -\n"
                                       "  Standard       -\n"
                                       "  Protocol       -\n"
                                       "  VIN            V\n"
                                       "  Calibration    -\n"
                                       "  Engine number  -\n"
                                       "  Type approval  -\n"
                                       "  With lamp on   -\n"
                                       "  Since cleared  -\n");
}

TEST(InfoReportView, CalibrationsArePairedInTheirOrder)
{
    auto const pairs = pairCalibrations({"A"}, {"1", "2"});
    ASSERT_EQ(pairs.size(), 2U);
    EXPECT_EQ(pairs[0].id, "A");
    EXPECT_EQ(pairs[0].verification, "1");
    EXPECT_EQ(pairs[1].id, "");
    EXPECT_EQ(pairs[1].verification, "2");
    std::vector<std::string> ids = {"A", "B"};
    ids.pop_back();
    EXPECT_EQ(pairCalibrations(ids, {"1", "2"}).at(1).id, "") << "a name that was dropped";
    std::vector<std::string> numbers = {"1", "2"};
    numbers.pop_back();
    EXPECT_EQ(pairCalibrations({"A", "B"}, numbers).at(1).verification, "");
}

TEST(InfoReportView, JsonHasNullForWhatIsNotTold)
{
    EXPECT_EQ(toJsonValue(fullInfo()), Json::parse(R"({
        "description": "Engine Control", "standard": "EOBD", "protocol": "ISO 15765-4", "vin": "VELMRAS1MM0000001",
        "calibrations": [{"id": "VS16-MT-0420", "verification": "1791BC82"}, {"id": "VS16-2", "verification": null}],
        "engineSerialNumber": "E123", "erotan": "R49",
        "withLamp": {"distance": null, "runTime": {"value": "35", "unit": "min"}},
        "sinceCleared": {"distance": {"value": "640", "unit": "km"}, "runTime": {"value": "900", "unit": "min"}}})"));
    Json const empty = toJsonValue(InfoReport());
    for (char const* key : {"description", "standard", "protocol", "vin", "engineSerialNumber", "erotan"}) {
        EXPECT_TRUE(empty[key].is_null()) << key;
    }
    EXPECT_TRUE(empty["calibrations"].empty());
}

} // namespace
