#pragma once

#include "libvelmora/report/limittest.h"
#include "libvelmora/report/moduletopic.h"

#include <string>
#include <vector>

namespace velmora {

// An on-board monitor with the results of its tests.
struct OnBoardMonitor
{
    int id;
    std::string description;
    std::vector<LimitTest> tests;
};

struct MonitorsReport
{
    TopicAnswer answer = TopicAnswer::NotOffered;
    std::vector<OnBoardMonitor> monitors;
};

// Monitors with failed tests first, and in each the failed tests first; else as they were.
std::vector<OnBoardMonitor> failedFirst(std::vector<OnBoardMonitor> monitors);

Json toJsonValue(MonitorsReport const& report);

} // namespace velmora
