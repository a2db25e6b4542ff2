#include "libvelmora/report/limittest.h"

#include <fmt/format.h>

#include <algorithm>

namespace velmora {

namespace {

struct VerdictWord
{
    char const* text; // empty for none
    Mark mark;
};

VerdictWord const& word(LimitTest::Verdict verdict)
{
    static constexpr VerdictWord words[] = {
        {"failed", Mark::Bad}, {"passed", Mark::Good}, {"no result", Mark::Faint}, {"", Mark::None}};
    return words[static_cast<int>(verdict)];
}

std::string idText(int id)
{
    return fmt::format("{:02X}", id);
}

Cell number(std::string const& text)
{
    return {text.empty() ? "-" : text, Mark::None, true};
}

} // namespace

std::vector<LimitTest> failedFirst(std::vector<LimitTest> tests)
{
    std::stable_sort(tests.begin(), tests.end(),
                     [](LimitTest const& left, LimitTest const& right) { return left.verdict < right.verdict; });
    return tests;
}

// Descriptions may be longer than a line is wide, so they stand last.
std::vector<Cell> limitTestHeads()
{
    return {{"  Result"},
            {"Test"},
            {"Value", Mark::None, true},
            {"Minimum", Mark::None, true},
            {"Maximum", Mark::None, true},
            {"Unit"},
            {"Description"}};
}

std::vector<Cell> limitTestRow(LimitTest const& test)
{
    VerdictWord const& verdict = word(test.verdict);
    return {{std::string("  ") + (*verdict.text == '\0' ? "-" : verdict.text), verdict.mark},
            {idText(test.id)},
            number(test.value),
            number(test.minimum),
            number(test.maximum),
            {test.unit},
            {test.description}};
}

Json toJsonValue(LimitTest const& test)
{
    return {{"id", idText(test.id)},
            {"description", textOrNull(test.description)},
            {"result", textOrNull(word(test.verdict).text)},
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
