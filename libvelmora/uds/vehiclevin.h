#pragma once

#include <obd/iobdproxy.h>

#include <string>

namespace velmora {

// The VIN by service 09, of the first module that tells one; empty if none does.
std::string vehicleVin(obd::IObdProxy& proxy);

} // namespace velmora
