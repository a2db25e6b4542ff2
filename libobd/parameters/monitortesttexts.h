#pragma once

#include <string>

namespace obd {

// Names of on-board monitors and of their tests (SAE J1979). The legacy buses know no monitor identifiers: results come
// from a component that the manufacturer numbers.

// By monitor identifier (MID).
std::string canMonitorDescription(unsigned char monitorId);

// component: 0 to 127.
std::string saeMonitorDescription(unsigned char component);

// By test identifier (TID) of service 06 on CAN, and of services 05 and 06 on the legacy buses.
std::string canTestDescription(unsigned char testId);
std::string saeTestDescription(unsigned char testId);

} // namespace obd
