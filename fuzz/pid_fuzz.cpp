// A payload for any parameter of the factory. The first byte of the input chooses the PID, the second the module: its
// bus, its oxygen sensor arrangement, its maxima and whether fuel trims have a second byte. The rest is cut into two
// payloads at the length that the third byte tells. Each is either refused and changes nothing, or is read into values
// of the sensors that the parameter announces.

#include "libobd/powertrain/fueltrim.h"
#include "tests/support/fakeecu.h"
#include "tests/support/payload/payloadproperty.h"

#include <obd/parameterfactory.h>

#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <iostream>

namespace {

std::shared_ptr<support::FakeEcu> moduleOf(unsigned char choice)
{
    auto ecu = std::make_shared<support::FakeEcu>(0x10, static_cast<obd::ObdProtocol>(choice % 6));
    ecu->setOxygenSensorBanks(static_cast<obd::OxygenSensorBank>(choice / 6 % 3));
    if ((choice & 0x80U) != 0) {
        ecu->setAirFlowRateMax(2550.0).setManifoldPressureMax(2550).setEquivalenceRatioMax(255);
        ecu->setOxygenSensorVoltageMax(255).setOxygenSensorCurrentMax(255);
    }
    obd::FuelTrim::setByteBInUse((choice & 0x40U) != 0);
    return ecu;
}

// Derived parameters send nothing of their own, so no reply is theirs.
bool hasReply(obd::PowertrainParameter const& parameter)
{
    std::vector<unsigned char> request;
    parameter.requestData(request);
    return !request.empty();
}

void require(std::string const& broken, int pid)
{
    if (!broken.empty()) {
        std::cerr << "Broken by PID " << pid << ": " << broken << '\n';
        std::abort();
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size)
{
    if (size < 3) {
        return 0;
    }
    auto const parameter = obd::ParameterFactory().createParameter(obd::ParameterIdentifier::Id(data[0]));
    if (parameter == nullptr || !hasReply(*parameter)) {
        return 0;
    }
    auto const ecu = moduleOf(data[1]);
    std::size_t const first = std::min<std::size_t>(data[2], size - 3);
    require(support::brokenBy(*parameter, ecu, {data + 3, data + 3 + first}), data[0]);
    require(support::brokenBy(*parameter, ecu, {data + 3 + first, data + size}), data[0]);
    return 0;
}
