#pragma once

#include <obd/iconfiguration.h>

namespace obd {

// Holds nothing: the choices are constant.
class Configuration : public IConfiguration
{
public:
    void supportedBaudrates(std::vector<int>& baudrates) const override;
    void supportedInitialBaudrates(std::vector<int>& baudrates) const override;
    void supportedProtocols(std::vector<ConnectionProtocol>& protocols) const override;
    void supportedBuses(std::vector<int>& buses) const override;
};

} // namespace obd
