#include "libobd/parameters/oxygensensortestresult.h"

#include "libobd/parameters/monitortesttexts.h"
#include "libobd/parameters/replychecks.h"
#include "libobd/value/unitscalingfactory.h"

#include <common/logrecord.h>

namespace obd {
namespace {

constexpr std::size_t valueOffset = 3; // behind service, test and sensor
constexpr std::size_t constantLength = valueOffset + 1;
constexpr std::size_t limitedLength = valueOffset + 3;

} // namespace

OxygenSensorTestResult::OxygenSensorTestResult(unsigned char tid, OxygenSensorLocation location)
    : FixedRequestParameter({0x05, tid, oxygenSensorByte(location)}), m_tid(tid)
{}

void OxygenSensorTestResult::clear()
{
    m_results.clear();
}

std::shared_ptr<OxygenSensorMonitorDataModel> OxygenSensorTestResult::getResult(std::shared_ptr<IEcu> const& ecu) const
{
    auto const* const result = findOrLog(m_results, *ecu);
    return result != nullptr ? *result : nullptr;
}

bool OxygenSensorTestResult::fromBytes(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& data)
{
    if (data.size() < constantLength) {
        TERVEX_LOG(Fatal) << "Invalid number of data bytes: " << data.size();
        return false;
    }
    if (isConstantTest(m_tid)) {
        store(ecu->id(), data[valueOffset], 0x00, 0xFF);
        return true;
    }
    if (data.size() < limitedLength) {
        TERVEX_LOG(Fatal) << "TID " << static_cast<unsigned int>(m_tid)
                          << ": invalid number of data bytes: " << data.size();
        return false;
    }
    store(ecu->id(), data[valueOffset], data[valueOffset + 1], data[valueOffset + 2]);
    return true;
}

void OxygenSensorTestResult::store(unsigned int ecuId, unsigned char value, unsigned char minimum,
                                   unsigned char maximum)
{
    auto const scaling = UnitScalingFactory::createForTest(m_tid);
    auto const text = [&scaling](unsigned char raw) { return scaling->toString(scaling->value(raw)); };
    auto const result = std::make_shared<OxygenSensorMonitorDataModel>();
    result->tid = m_tid;
    result->description = saeTestDescription(m_tid);
    result->value = text(value);
    result->minimum = text(minimum);
    result->maximum = text(maximum);
    result->status = minimum <= value && value <= maximum ? 0 : 1;
    result->unit = scaling->unit();
    m_results[ecuId] = result;
}

} // namespace obd
