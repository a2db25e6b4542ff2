#pragma once

#include "libvelmora/report/moduletopic.h"

#include <optional>
#include <string>
#include <vector>

namespace velmora {

// Pairs names and checksums, which modules tell in the same order.
std::vector<InfoReport::Calibration> pairCalibrations(std::vector<std::string> const& ids,
                                                      std::vector<std::string> const& verifications);

Json toJsonValue(InfoReport const& report);

} // namespace velmora
