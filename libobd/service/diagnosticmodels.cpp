#include "libobd/service/diagnosticmodels.h"

#include <vector>

namespace obd {
namespace {

using DiagnosticTests = std::vector<std::shared_ptr<DiagnosticTestDataModel>>;

// The application counts the other way round than the reply does: the better, the higher.
DiagnosticTestDataModel::Status testStatus(IMonitorTestItem::Status status)
{
    switch (status) {
    case IMonitorTestItem::Passed:
        return DiagnosticTestDataModel::Status::Passed;
    case IMonitorTestItem::Failed:
        return DiagnosticTestDataModel::Status::Failed;
    default:
        return DiagnosticTestDataModel::Status::NoResult;
    }
}

DiagnosticTests makeTests(ObdMonitorTestItem::Items const& items)
{
    DiagnosticTests tests;
    for (std::shared_ptr<IMonitorTestItem> const& item : items) {
        tests.push_back(std::make_shared<DiagnosticTestDataModel>(item->testId(), item->description(), item->value(),
                                                                  item->minimum(), item->maximum(), item->unit(),
                                                                  testStatus(item->status())));
    }
    return tests;
}

} // namespace

std::shared_ptr<DiagnosticMonitorDataModel> makeMonitorModel(ObdMonitorTestItem const& monitor, UnitSystem system)
{
    return std::make_shared<DiagnosticMonitorDataModel>(static_cast<int>(monitor.id), monitor.description,
                                                        makeTests(monitor.items(system)));
}

} // namespace obd
