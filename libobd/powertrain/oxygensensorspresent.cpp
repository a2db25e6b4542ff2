#include "libobd/powertrain/oxygensensorspresent.h"

#include <array>

namespace obd {
namespace {

using Location = OxygenSensorLocation;

// The places that the bits of a reply stand for, bit 0 first.
using Arrangement = std::array<Location, 8>;

constexpr Arrangement twoBanksOfFour{Location::Bank1Sensor1, Location::Bank1Sensor2, Location::Bank1Sensor3,
                                     Location::Bank1Sensor4, Location::Bank2Sensor1, Location::Bank2Sensor2,
                                     Location::Bank2Sensor3, Location::Bank2Sensor4};
constexpr Arrangement fourBanksOfTwo{Location::Bank1Sensor1, Location::Bank1Sensor2, Location::Bank2Sensor1,
                                     Location::Bank2Sensor2, Location::Bank3Sensor1, Location::Bank3Sensor2,
                                     Location::Bank4Sensor1, Location::Bank4Sensor2};

// By the value of the location.
constexpr char const* names[] = {"B1S1", "B1S2", "B1S3", "B1S4", "B2S1", "B2S2",
                                 "B2S3", "B2S4", "B3S1", "B3S2", "B4S1", "B4S2"};

std::vector<Location> locationsOf(unsigned int present, Arrangement const& arrangement)
{
    std::vector<Location> locations;
    for (std::size_t i = 0; i < arrangement.size(); ++i) {
        if ((present >> i & 1U) != 0) {
            locations.push_back(arrangement[i]);
        }
    }
    return locations;
}

std::string namesOf(unsigned int present, Arrangement const& arrangement)
{
    std::string text;
    for (Location const location : locationsOf(present, arrangement)) {
        text += text.empty() ? "" : ", ";
        text += names[static_cast<int>(location)];
    }
    return text;
}

} // namespace

std::optional<std::vector<OxygenSensorLocation>> OxygenSensorsPresent::locations(IEcu const& ecu) const
{
    std::optional<double> const present = stored(ecu);
    if (!present) {
        return std::nullopt;
    }
    return locationsOf(static_cast<unsigned int>(*present), pid() == 0x13 ? twoBanksOfFour : fourBanksOfTwo);
}

std::string OxygenSensorsPresent::namesIn13(unsigned int present)
{
    return namesOf(present, twoBanksOfFour);
}

std::string OxygenSensorsPresent::namesIn1d(unsigned int present)
{
    return namesOf(present, fourBanksOfTwo);
}

} // namespace obd
