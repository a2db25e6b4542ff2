#include "libvelmora/history/changeparts.h"
#include "libvelmora/report/oxygenreport.h"
#include "libvelmora/report/texts/changetexts.h"

#include <fmt/format.h>

#include <map>

namespace velmora {

namespace {

// The tests of a module by what they are: two of the same name and number keep their order.
using NamedTests = std::map<std::string, LimitTest const*>;

void addNamed(NamedTests& tests, std::string const& owner, std::vector<LimitTest> const& list)
{
    for (LimitTest const& test : list) {
        std::string const name = fmt::format("{}, {:02X} {}", owner, test.id, test.description);
        std::string key = name;
        for (int again = 2; tests.contains(key); ++again) {
            key = fmt::format("{} ({})", name, again);
        }
        tests.emplace(std::move(key), &test);
    }
}

NamedTests testsOf(ModuleReport const& module)
{
    NamedTests tests;
    for (OnBoardMonitor const& monitor : module.monitors.monitors) {
        addNamed(tests, monitor.description, monitor.tests);
    }
    for (OxygenSensor const& sensor : module.oxygen.sensors) {
        addNamed(tests, locationName(sensor.location), sensor.tests);
    }
    return tests;
}

std::string testText(LimitTest const& test)
{
    std::string const value = test.unit.empty() ? test.value : test.value + " " + test.unit;
    auto const limit = [](std::string const& text) {
        return text.empty() ? std::string(texts::change::noLimit) : text;
    };
    return fmt::format(texts::change::withLimits, value, limit(test.minimum), limit(test.maximum));
}

bool isResult(LimitTest const& test)
{
    return test.verdict == LimitTest::Verdict::Passed || test.verdict == LimitTest::Verdict::Failed;
}

void compareTest(ModulePair const& pair, std::string const& name, LimitTest const& older, LimitTest const& newer)
{
    // In another unit system the same result has other digits.
    if (!isResult(newer) || (isResult(older) && older.unit != newer.unit)) {
        return;
    }
    bool const failed = newer.verdict == LimitTest::Verdict::Failed;
    bool const failedBefore = older.verdict == LimitTest::Verdict::Failed;
    std::string const before = isResult(older) ? testText(older) : std::string(texts::change::noLimit);
    if (failed && !failedBefore) {
        pair.add("test-outside", ChangeWeight::Worse, texts::change::outside, name, before, testText(newer));
    } else if (!failed && failedBefore) {
        pair.add("test-inside", ChangeWeight::Better, texts::change::inside, name, before, testText(newer));
    } else if (isResult(older) && older.value != newer.value) {
        pair.add("test-value", ChangeWeight::Neutral, texts::change::test, name, before, testText(newer));
    }
}

} // namespace

void compareTests(ModulePair const& pair)
{
    NamedTests const older = testsOf(pair.older);
    for (auto const& [name, test] : testsOf(pair.newer)) {
        auto const known = older.find(name);
        if (known != older.end()) {
            compareTest(pair, name, *known->second, *test);
        }
    }
}

} // namespace velmora
