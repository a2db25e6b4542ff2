#pragma once

#include "libvelmora/history/keptscan.h"
#include "libvelmora/report/json.h"
#include "libvelmora/report/vehiclereport.h"

#include <string>
#include <string_view>
#include <vector>

namespace velmora {

// The scan of a report, by the identification number that the modules tell, else by the owner's name of the vehicle.
// Throws Error if there is neither.
KeptScan makeScan(VehicleReport const& report, std::string const& vehicle,
                  std::chrono::sys_time<std::chrono::milliseconds> time, std::string const& program);

// The report that was kept. Throws Error if it can't be read.
VehicleReport reportOf(KeptScan const& scan);

// One line of an export, with its line feed.
std::string toLine(KeptScan const& scan);

// Throws Error for anything that toLine did not write: a member that is missing, a report that can't be read, a hash
// that is that of another document.
KeptScan parseLine(std::string_view line);

// What a list shows of a scan: number, vehicle, time, lamp, codes.
Json toJsonValue(KeptScan const& scan);

// "2026-05-01T10:00:00.000Z"
std::string timeText(std::chrono::sys_time<std::chrono::milliseconds> time);

} // namespace velmora
