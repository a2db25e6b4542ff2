#pragma once

#include "libvelmora/doctor/doctorreport.h"
#include "libvelmora/port/portaddress.h"

#include <filesystem>

namespace velmora {

// Port and line of an address. A serial line is asked at the usual rates, so that another one than the user's is found;
// nothing is opened where another program holds the port. sysRoot is "/sys" but for tests.
std::vector<DoctorCheck> checkPort(PortAddress const& address, std::filesystem::path const& sysRoot = "/sys");

} // namespace velmora
