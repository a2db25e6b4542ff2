#include "libvelmora/report/limittest.h"

#include <fmt/format.h>

#include <algorithm>

namespace velmora {

char const* verdictWord(LimitTest::Verdict verdict)
{
    static constexpr char const* words[] = {"failed", "passed", "no result", ""};
    return words[static_cast<int>(verdict)];
}

std::string testId(int id)
{
    return fmt::format("{:02X}", id);
}

std::vector<LimitTest> failedFirst(std::vector<LimitTest> tests)
{
    std::stable_sort(tests.begin(), tests.end(),
                     [](LimitTest const& left, LimitTest const& right) { return left.verdict < right.verdict; });
    return tests;
}

Json toJsonValue(LimitTest const& test)
{
    return {{"id", testId(test.id)},
            {"description", textOrNull(test.description)},
            {"result", textOrNull(verdictWord(test.verdict))},
            {"value", textOrNull(test.value)},
            {"minimum", textOrNull(test.minimum)},
            {"maximum", textOrNull(test.maximum)},
            {"unit", textOrNull(test.unit)}};
}

Json toJsonValue(std::vector<LimitTest> const& tests)
{
    Json list = Json::array();
    for (LimitTest const& test : tests) {
        list.push_back(toJsonValue(test));
    }
    return list;
}

} // namespace velmora
