#include "libvelmora/report/document/topicparse.h"

#include <algorithm>
#include <array>
#include <limits>

namespace velmora {

namespace {

constexpr std::uint32_t anyNumber = std::numeric_limits<std::uint32_t>::max();
constexpr std::uint32_t anyByte = 0xFF;

TroubleCode codeAt(JsonPlace const& place)
{
    TroubleCode code{place.at("code").text(), place.at("system").text(), {}};
    for (JsonPlace const& meaning : place.at("meanings").elements()) {
        code.meanings.push_back({meaning.at("maker").text(), meaning.at("text").text()});
    }
    return code;
}

CodeList listAt(JsonPlace const& place, CodeKind kind)
{
    static constexpr std::array<char const*, 4> words = {"read", "refused", "no answer", "unreadable"};
    CodeList list{
        kind, static_cast<CodeList::Answer>(place.at("answer").wordOf(words)), place.at("reason").textOrEmpty(), {}};
    list.offered = place.at("offered").boolean();
    auto const codes = place.find("codes");
    if (codes && list.answer == CodeList::Answer::Read) {
        for (JsonPlace const& code : codes->elements()) {
            list.codes.push_back(codeAt(code));
        }
    }
    return list;
}

MakerChoice makerAt(JsonPlace const& module)
{
    static constexpr std::array<char const*, 3> words = {"option", "VIN", "guess"};
    auto const maker = module.find("maker");
    if (!maker) {
        return {};
    }
    return {static_cast<MakerChoice::By>(maker->at("by").wordOf(words) + 1), maker->at("name").text()};
}

ReadinessStatus statusAt(JsonPlace const& place)
{
    static constexpr std::array<char const*, 4> words = {"complete", "not complete", "disabled this cycle",
                                                         "not available"};
    return static_cast<ReadinessStatus>(place.wordOf(words));
}

std::vector<LimitTest> testsAt(JsonPlace const& place)
{
    static constexpr std::array<char const*, 3> words = {"failed", "passed", "no result"};
    std::vector<LimitTest> tests;
    for (JsonPlace const& each : place.elements()) {
        JsonPlace const result = each.at("result");
        tests.push_back(
            {static_cast<int>(each.at("id").hex() & anyByte), each.at("description").textOrEmpty(),
             each.at("value").textOrEmpty(), each.at("minimum").textOrEmpty(), each.at("maximum").textOrEmpty(),
             each.at("unit").textOrEmpty(),
             result.isNull() ? LimitTest::Verdict::None : static_cast<LimitTest::Verdict>(result.wordOf(words))});
    }
    return tests;
}

obd::OxygenSensorLocation locationAt(JsonPlace const& place)
{
    std::string const wanted = fmt::format("{} {}", place.at("bank").whole(anyByte), place.at("sensor").whole(anyByte));
    for (int number = 0; number <= static_cast<int>(obd::OxygenSensorLocation::Bank4Sensor2); ++number) {
        auto const location = static_cast<obd::OxygenSensorLocation>(number);
        auto const [bank, sensor] = placeOf(location);
        if (wanted == fmt::format("{} {}", bank, sensor)) {
            return location;
        }
    }
    place.fail("place of an oxygen sensor");
}

} // namespace

TopicAnswer answerAt(JsonPlace const& place)
{
    static constexpr std::array<char const*, 5> words = {"read", "not supported", "no answer", "unreadable", "refused"};
    return static_cast<TopicAnswer>(place.wordOf(words));
}

CodeReport codesAt(JsonPlace const& place)
{
    CodeReport report;
    report.lamp = place.at("lamp").booleanOrNothing();
    report.lampAnswer = answerAt(place.at("lampAnswer"));
    for (auto const& [key, kind] : {std::pair{"confirmed", CodeKind::Confirmed},
                                    {"pending", CodeKind::Pending},
                                    {"permanent", CodeKind::Permanent}}) {
        if (auto const list = place.find(key)) {
            report.lists.push_back(listAt(*list, kind));
        }
    }
    applyMaker(report, makerAt(place));
    return report;
}

FreezeReport freezeAt(JsonPlace const& place, MakerChoice const& maker)
{
    FreezeReport report{place.at("frame").whole(anyByte), answerAt(place.at("answer")), std::nullopt};
    if (auto const frame = place.find("freeze")) {
        report.frame = FreezeFrame{codeAt(frame->at("code")), {}};
        for (JsonPlace const& each : frame->at("readings").elements()) {
            JsonPlace const value = each.at("value");
            report.frame->readings.push_back({each.at("name").text(),
                                              value.isNull() ? std::nullopt : std::optional(value.text()),
                                              each.at("unit").textOrEmpty()});
        }
    }
    applyMaker(report, maker);
    return report;
}

ReadinessReport readinessAt(JsonPlace const& place)
{
    ReadinessReport report{answerAt(place.at("answer")), place.at("lamp").booleanOrNothing(), {}};
    for (JsonPlace const& each : place.at("monitors").elements()) {
        JsonPlace const cycle = each.at("thisCycle");
        report.monitors.push_back({each.at("name").text(), statusAt(each.at("sinceCleared")),
                                   cycle.isNull() ? std::nullopt : std::optional(statusAt(cycle))});
    }
    return report;
}

MonitorsReport monitorsAt(JsonPlace const& place)
{
    MonitorsReport report{answerAt(place.at("answer")), {}};
    for (JsonPlace const& each : place.at("monitors").elements()) {
        report.monitors.push_back({static_cast<int>(each.at("id").hex() & anyByte),
                                   each.at("description").textOrEmpty(), testsAt(each.at("tests"))});
    }
    return report;
}

OxygenReport oxygenAt(JsonPlace const& place)
{
    OxygenReport report;
    report.answer = answerAt(place.at("answer"));
    report.complete = place.at("complete").booleanOrNothing();
    for (JsonPlace const& each : place.at("sensors").elements()) {
        auto const tests = each.find("tests");
        report.onCan = !tests;
        report.sensors.push_back({locationAt(each), tests ? testsAt(*tests) : std::vector<LimitTest>()});
    }
    return report;
}

CountersReport countersAt(JsonPlace const& place)
{
    CountersReport report{answerAt(place.at("answer")), {}};
    for (JsonPlace const& each : place.at("counters").elements()) {
        report.counters.push_back({each.at("name").text(), each.at("value").whole(anyNumber)});
    }
    return report;
}

} // namespace velmora
