#pragma once

#include "libvelmora/report/json.h"

#include <velmora/topics.h>

#include <string>
#include <vector>

namespace velmora {

// "failed", "passed" or "no result"; empty for a constant.
char const* verdictWord(LimitTest::Verdict verdict);

// "0A"
std::string testId(int id);

// The tests in the order of their verdicts, the failed first, else as they were.
std::vector<LimitTest> failedFirst(std::vector<LimitTest> tests);

Json toJsonValue(LimitTest const& test);
Json toJsonValue(std::vector<LimitTest> const& tests);

} // namespace velmora
