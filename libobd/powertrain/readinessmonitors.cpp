#include "libobd/powertrain/readinessmonitors.h"

#include <iterator>

namespace obd {
namespace {

constexpr char const* monitorTexts[] = {
    // in the order of ReadinessMonitorTest
    "Misfire",
    "Fuel System",
    "Comprehensive Component",
    "",
    "Catalyst",
    "Heated Catalyst",
    "Evaporative System",
    "Secondary Air System",
    "Gasoline Particulate Filter",
    "Oxygen Sensor",
    "Oxygen Sensor Heater",
    "EGR and/or VVT System",
    "NMHC Catalyst",
    "NOx Aftertreatment",
    "Boost Pressure",
    "Exhaust Gas Sensor",
    "PM filter",
    "EGR and/or VVT System",
};
static_assert(std::size(monitorTexts) == MonitorStatusWord::TEST_INFO_ARRAY_SIZE);

void append(std::vector<ReadinessMonitorTest>& tests, ReadinessMonitorTest first, ReadinessMonitorTest last)
{
    for (int test = first; test <= last; ++test) {
        tests.push_back(static_cast<ReadinessMonitorTest>(test));
    }
}

} // namespace

std::string readinessMonitorText(ReadinessMonitorTest test)
{
    auto const index = static_cast<std::size_t>(test);
    return index < std::size(monitorTexts) ? monitorTexts[index] : "NA";
}

std::vector<ReadinessMonitorTest> readinessMonitorTests(IgnitionType ignition)
{
    std::vector<ReadinessMonitorTest> tests;
    append(tests, ReadinessMisfire, ReadinessComprehensiveComponent);
    if (ignition == IgnitionType::Compression) {
        append(tests, ReadinessNmhcCatalyst, ReadinessEgrVvtSystemCompression);
    } else {
        append(tests, ReadinessCatalyst, ReadinessEgrVvtSystem);
    }
    return tests;
}

ReadinessMonitorDataModel::Status readinessSinceCleared(IEcu const& ecu, MonitorStatus const& status,
                                                        ReadinessMonitorTest test)
{
    if (!status.isTestAvailable(ecu, test)) {
        return ReadinessMonitorDataModel::NotAvailable;
    }
    return status.isTestComplete(ecu, test) ? ReadinessMonitorDataModel::Complete
                                            : ReadinessMonitorDataModel::NotComplete;
}

ReadinessMonitorDataModel::Status readinessThisCycle(IEcu const& ecu, MonitorStatus const& status,
                                                     MonitorStatusThisCycle const& thisCycle, ReadinessMonitorTest test)
{
    if (!status.isTestAvailable(ecu, test)) {
        return ReadinessMonitorDataModel::NotAvailable;
    }
    if (!thisCycle.isTestEnabled(ecu, test)) {
        return ReadinessMonitorDataModel::DisabledThisCycle;
    }
    return thisCycle.isTestComplete(ecu, test) ? ReadinessMonitorDataModel::Complete
                                               : ReadinessMonitorDataModel::NotComplete;
}

} // namespace obd
