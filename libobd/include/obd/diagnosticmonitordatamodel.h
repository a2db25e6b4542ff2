#pragma once

#include <obd/diagnostictestdatamodel.h>

#include <memory>
#include <string>
#include <vector>

namespace obd {

/// An on-board monitor with its test results for the application; a copy that keeps nothing of the library alive.
struct DiagnosticMonitorDataModel
{
    DiagnosticMonitorDataModel(int monitorId, std::string const& monitorDescription,
                               std::vector<std::shared_ptr<DiagnosticTestDataModel>> const& monitorTests)
        : id(monitorId), description(monitorDescription), tests(monitorTests)
    {}

    int id; ///< monitor identifier of service 06 on CAN, component number on the older buses
    std::string description;
    std::vector<std::shared_ptr<DiagnosticTestDataModel>> tests;
};

} // namespace obd
