#include "libvelmora/report/plain/reporttext.h"
#include "libvelmora/report/readinessreport.h"

#include <gtest/gtest.h>

namespace {

using namespace velmora;
using Readiness = obd::ReadinessMonitorDataModel;

ReadinessReport const readiness{TopicAnswer::Read,
                                true,
                                {{"Misfire", Readiness::Complete, Readiness::NotComplete},
                                 {"Secondary Air System", Readiness::NotAvailable, Readiness::NotAvailable},
                                 {"Catalyst", Readiness::NotComplete, Readiness::DisabledThisCycle},
                                 {"Fuel System", Readiness::Complete, std::nullopt}}};

TEST(ReadinessReportView, ShowsTheVerdictAndWhatIsNotCompleteFirst)
{
    EXPECT_EQ(toText(readiness, Style()), "  Lamp           on\n"
                                          "  Readiness      1 monitor not complete\n"
                                          "    Monitor      Since cleared  This driving cycle\n"
                                          "    Catalyst     not complete   disabled this cycle\n"
                                          "    Misfire      complete       not complete\n"
                                          "    Fuel System  complete       -\n"
                                          "    Not available: Secondary Air System\n");
}

TEST(ReadinessReportView, IsReadyWhenAllThatTheVehicleHasIsComplete)
{
    ReadinessReport const ready{
        TopicAnswer::Read, false, {{"A", Readiness::Complete, {}}, {"B", Readiness::NotAvailable, {}}}};
    EXPECT_EQ(isReady(ready), true);
    EXPECT_TRUE(toText(ready, Style(true)).find("Readiness      \033[32mready\033[0m\n") != std::string::npos);
    ReadinessReport const nothing{TopicAnswer::Read, false, {{"B", Readiness::NotAvailable, {}}}};
    EXPECT_EQ(isReady(nothing), std::nullopt);
    EXPECT_EQ(toText(nothing, Style()), "  Lamp           off\n"
                                        "  Readiness      no monitors in this module\n");
}

TEST(ReadinessReportView, TellsWhyThereIsNone)
{
    EXPECT_EQ(toText(ReadinessReport(), Style()), "  Readiness      not supported\n");
    EXPECT_EQ(toText(ReadinessReport{TopicAnswer::Silent, {}, {}}, Style()), "  Readiness      no answer\n");
    EXPECT_FALSE(hasAnswer(ReadinessReport{TopicAnswer::Silent, {}, {}}));
}

TEST(ReadinessReportView, JsonHoldsTheSame)
{
    EXPECT_EQ(toJsonValue(readiness), Json::parse(R"({"answer": "read", "lamp": true, "ready": false, "notComplete": 1,
        "monitors": [
            {"name": "Catalyst", "sinceCleared": "not complete", "thisCycle": "disabled this cycle"},
            {"name": "Misfire", "sinceCleared": "complete", "thisCycle": "not complete"},
            {"name": "Fuel System", "sinceCleared": "complete", "thisCycle": null},
            {"name": "Secondary Air System", "sinceCleared": "not available", "thisCycle": "not available"}]})"));
    EXPECT_EQ(toJsonValue(ReadinessReport()),
              Json::parse(
                  R"({"answer": "not supported", "lamp": null, "ready": null, "notComplete": null, "monitors": []})"));
}

} // namespace
