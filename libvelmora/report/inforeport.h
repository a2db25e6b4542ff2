#pragma once

#include "libvelmora/report/moduletopic.h"

#include <optional>
#include <string>
#include <vector>

namespace velmora {

// What a control module tells of itself and the vehicle. Empty texts and missing values were not told.
struct InfoReport
{
    struct Calibration
    {
        std::string id;
        std::string verification; // the checksum of what the id names
    };

    struct Reading
    {
        std::string value;
        std::string unit;
    };

    struct Travel
    {
        std::optional<Reading> distance;
        std::optional<Reading> runTime;
    };

    std::string description;
    std::string standard;
    std::string protocol;
    std::string vin;
    std::vector<Calibration> calibrations;
    std::string engineSerialNumber;
    std::string erotan; // exhaust regulation or type approval number
    Travel withLamp;    // since the lamp came on
    Travel sinceCleared;
};

// Pairs names and checksums, which modules tell in the same order.
std::vector<InfoReport::Calibration> pairCalibrations(std::vector<std::string> const& ids,
                                                      std::vector<std::string> const& verifications);

Json toJsonValue(InfoReport const& report);

} // namespace velmora
