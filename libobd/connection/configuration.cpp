#include "libobd/connection/configuration.h"

namespace obd {

void Configuration::supportedBaudrates(std::vector<int>& baudrates) const
{
    baudrates = {9600, 19200, 38400, 57600, 115200};
}

void Configuration::supportedInitialBaudrates(std::vector<int>& baudrates) const
{
    baudrates = {9600, 19200, 38400, 57600};
}

void Configuration::supportedProtocols(std::vector<ConnectionProtocol>& protocols) const
{
    auto const last = static_cast<int>(VehicleProtocol::Iso15765Can29Bit250);
    for (int number = 0; number <= last; ++number) {
        protocols.emplace_back(static_cast<VehicleProtocol>(number));
    }
}

void Configuration::supportedBuses(std::vector<int>& buses) const
{
    buses.insert(buses.end(), {0, 1, 2});
}

} // namespace obd
