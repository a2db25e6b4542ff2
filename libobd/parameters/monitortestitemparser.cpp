#include "libobd/parameters/monitortestitemparser.h"

#include "libobd/bytes/bytereader.h"
#include "libobd/parameters/canmonitortestitem.h"
#include "libobd/parameters/monitortestitem.h"
#include "libobd/value/unitscalingfactory.h"

#include <common/logrecord.h>

#include <utility>

namespace obd {

MonitorTestItemParserCan::MonitorTestItemParserCan(std::vector<unsigned char> record) : m_record(std::move(record)) {}

std::shared_ptr<IMonitorTestItem> MonitorTestItemParserCan::parse(UnitSystem system) const
{
    unsigned char const scalingId = m_record.at(1);
    std::shared_ptr<IUnitScaling> const scaling = UnitScalingFactory::createForCan(scalingId, system);
    if (scaling == nullptr) {
        TERVEX_LOG(Error) << "Failed to create unit scaler for scale ID: " << static_cast<unsigned int>(scalingId);
        return nullptr;
    }
    return std::make_shared<CanMonitorTestItem>(scaling, m_record.at(0), scaling->value(readUint16(m_record, 2)),
                                                scaling->value(readUint16(m_record, 4)),
                                                scaling->value(readUint16(m_record, 6)));
}

MonitorTestItemParserNonCan::MonitorTestItemParserNonCan(std::vector<unsigned char> record)
    : m_record(std::move(record))
{}

std::shared_ptr<IMonitorTestItem> MonitorTestItemParserNonCan::parse(UnitSystem /*system*/) const
{
    unsigned char const testId = m_record.at(0);
    std::shared_ptr<IUnitScaling> const scaling = UnitScalingFactory::createForTest(testId);
    if (scaling == nullptr) {
        TERVEX_LOG(Error) << "Failed to create unit scaler for TID: " << static_cast<unsigned int>(testId);
        return nullptr;
    }
    return std::make_shared<MonitorTestItem>(scaling, testId, m_record.at(1), scaling->value(readUint16(m_record, 2)),
                                             scaling->value(readUint16(m_record, 4)));
}

} // namespace obd
