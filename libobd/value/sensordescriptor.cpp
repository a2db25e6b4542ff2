#include <obd/parameterdescriptor.h>

#include <utility>

namespace obd {

SensorDescriptor::SensorDescriptor(std::shared_ptr<SensorInfo const> info, UnitSystem system)
    : m_info(std::move(info)), m_system(system)
{}

} // namespace obd
