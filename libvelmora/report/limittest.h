#pragma once

#include "libvelmora/report/json.h"

#include <string>
#include <vector>

namespace velmora {

// A test that a control module made on itself, with its result as text. Empty limits are none.
struct LimitTest
{
    enum class Verdict
    {
        Failed,
        Passed,
        NoResult, // not run since the codes were cleared
        None,     // a constant, with no limits to judge by
    };

    int id;
    std::string description;
    std::string value;
    std::string minimum;
    std::string maximum;
    std::string unit;
    Verdict verdict;
};

// "failed", "passed" or "no result"; empty for a constant.
char const* verdictWord(LimitTest::Verdict verdict);

// "0A"
std::string testId(int id);

// The tests in the order of their verdicts, the failed first, else as they were.
std::vector<LimitTest> failedFirst(std::vector<LimitTest> tests);

Json toJsonValue(LimitTest const& test);
Json toJsonValue(std::vector<LimitTest> const& tests);

} // namespace velmora
