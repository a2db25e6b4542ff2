// What findings say of codes that were cleared, and how programs get findings.
#include "libvelmora/report/finding/findings.h"
#include "tests/libvelmora/report/carbuilder.h"

#include <gtest/gtest.h>

namespace {

using namespace velmora;
using namespace testsupport;

ModuleReport clearedModule(double warmUps, double kilometres, std::vector<std::string> const& incomplete)
{
    ModuleReport module = soundModule();
    setValue(module, 0x30, {warmUps});
    setValue(module, 0x31, {kilometres}, {}, "km");
    for (std::string const& monitor : incomplete) {
        setIncomplete(module, monitor);
    }
    return module;
}

Finding clearedFinding(ModuleReport const& module)
{
    for (Finding const& each : findings(vehicleOf({module}))) {
        if (std::string(each.kind) == "codes-cleared-recently") {
            return each;
        }
    }
    ADD_FAILURE() << "nothing suggests that codes were cleared";
    return {};
}

std::string evidenceOf(ModuleReport const& module)
{
    std::string text;
    for (Evidence const& each : clearedFinding(module).evidence) {
        text += anchorOf(each) + ": " + each.text + "\n";
    }
    return text;
}

TEST(ClearedCodes, AreToldWithAllThatSpeaksForThem)
{
    std::string const warmUps = "values-7E8: 3 warm-ups of the engine since codes were cleared (5 or fewer are few)\n";
    std::string const two = "readiness-7E8: 2 monitors are not complete: Catalyst, Oxygen Sensor\n";
    ModuleReport module = clearedModule(3, 500, {"Catalyst", "Oxygen Sensor"});
    EXPECT_EQ(evidenceOf(module), warmUps + two) << "500 km are far";
    EXPECT_EQ(clearedFinding(module).text, "suggests that codes were cleared not long ago");
    EXPECT_EQ(evidenceOf(clearedModule(6, 80, {"Catalyst", "Oxygen Sensor"})),
              "values-7E8: 80 km driven since codes were cleared (80 km or less are few)\n" + two);
    EXPECT_EQ(evidenceOf(clearedModule(3, 12, {"Catalyst"})),
              warmUps + "values-7E8: 12 km driven since codes were cleared (80 km or less are few)\n")
        << "one monitor alone says nothing";

    LimitTest test{0x80, "A", "0", "0", "0", "", LimitTest::Verdict::NoResult};
    module.monitors = {TopicAnswer::Read, {{0x21, "Catalyst", {test, test}}}};
    EXPECT_EQ(evidenceOf(module),
              warmUps + two + "monitors-7E8: no monitor test has a result since codes were cleared\n");
    module.monitors.monitors[0].tests[1].verdict = LimitTest::Verdict::Passed;
    EXPECT_EQ(evidenceOf(module), warmUps + two);
    module.monitors.monitors[0].tests.clear();
    EXPECT_EQ(evidenceOf(module), warmUps + two) << "a monitor without tests";
}

TEST(ClearedCodes, AreToldWithWhatElseItMayBe)
{
    auto const otherwise = [](ModuleReport const& module) {
        std::vector<std::string> const list = clearedFinding(module).otherwise;
        EXPECT_GE(list.size(), 3U);
        return std::vector<std::string>(list.begin() + 3, list.end());
    };
    using Texts = std::vector<std::string>;
    std::string const zeros = "a module that does not keep these counts and always tells 0";
    EXPECT_EQ(otherwise(clearedModule(3, 12, {})), Texts());
    EXPECT_EQ(otherwise(clearedModule(0, 12, {})), Texts{zeros});
    EXPECT_EQ(otherwise(clearedModule(3, 0, {})), Texts{zeros});
    ModuleReport far = clearedModule(3, 500, {"Catalyst", "Oxygen Sensor"});
    EXPECT_EQ(otherwise(far), Texts{"a hybrid that seldom runs its engine"});
    far.readiness.monitors.push_back({"Boost Pressure", ReadinessStatus::Complete, {}});
    EXPECT_EQ(otherwise(far), Texts{"a diesel, whose filter and NOx monitors need long trips"});
}

TEST(FindingsJson, HoldsWhatAFindingRestsOnAndWhereThatStands)
{
    ModuleReport module = soundModule(0x7E9);
    module.codes.lamp = true;
    VehicleReport const report = vehicleOf({soundModule(), module});
    EXPECT_EQ(toJsonValue(findings(report), report), Json::parse(R"([
        {"kind": "lamp-on", "severity": "bad", "module": "7E9 ECM", "what": "lamp",
         "text": "the malfunction indicator is on", "suggestion": false,
         "evidence": [{"text": null, "data": "/modules/1/codes"}], "otherwise": []},
        {"kind": "lamp-without-code", "severity": "warning", "module": "7E9 ECM", "what": "lamp without code",
         "text": "the lamp is commanded on, and no module that commands it has a confirmed code", "suggestion": true,
         "evidence": [{"text": "7E9 ECM commands the lamp on and tells no confirmed code", "data": "/modules/1/codes"}],
         "otherwise": ["a reason outside of OBD, which the maker's own tool would show",
                       "a code that came or went while the report was made"]}])"));
    EXPECT_EQ(toJsonValue({{Severity::Note, "", "a", "b", "c", {}}}, report)[0]["module"], Json(nullptr));
}

TEST(FindingsJson, LeadsFromWhatWasNotToldToWhereItWouldStand)
{
    auto const anchors = [](ModuleReport const& module) {
        std::string text;
        std::vector<Finding> const list = findings(vehicleOf({module}));
        for (Evidence const& each : list.at(0).evidence) {
            text += anchorOf(each) + " ";
        }
        return text;
    };
    ModuleReport module = soundModule();
    module.offers = TopicAnswer::Silent;
    EXPECT_EQ(anchors(module), "info-7E8 ");
    module.codes.lamp.reset();
    module.codes.lampAnswer = TopicAnswer::Silent;
    EXPECT_EQ(anchors(module), "codes-7E8 info-7E8 ");
    module.offers = TopicAnswer::Read;
    EXPECT_EQ(anchors(module), "codes-7E8 ");
}

TEST(FindingsJson, PointsToTheTopicOfTheModule)
{
    VehicleReport const report = vehicleOf({soundModule(), soundModule(0x7E9)});
    for (auto const& [topic, key, anchor] : {std::tuple{DataTopic::Info, "info", "info"},
                                             {DataTopic::Codes, "codes", "codes"},
                                             {DataTopic::Readiness, "readiness", "readiness"},
                                             {DataTopic::Values, "values", "values"},
                                             {DataTopic::Monitors, "monitors", "monitors"},
                                             {DataTopic::Oxygen, "oxygen", "oxygen"},
                                             {DataTopic::Supported, "supported", "info"}}) {
        EXPECT_EQ(pointerTo({topic, 0x7E9}, report), std::string("/modules/1/") + key);
        EXPECT_EQ(anchorOf({topic, 0x7E9}), std::string(anchor) + "-7E9");
        EXPECT_EQ(pointerTo({topic, 0x7EF}, report), "/adapter") << "a module that is not in the report";
    }
    EXPECT_EQ(pointerTo({DataTopic::Adapter, 0x7E9}, report), "/adapter");
    EXPECT_EQ(anchorOf({DataTopic::Adapter, 0x7E9}), "adapter");
}

} // namespace
