#include "program/command/sensoroffers.h"

#include <obd/sensorpids.h>

#include <algorithm>
#include <iterator>

namespace velmora::cli {

std::vector<Offer> offers(bool all)
{
    std::vector<Offer> list;
    auto const service = obd::EcuServiceBuilder::createEcuService();
    auto parameters = service->supportedParameters();
    auto const further = service->furtherParameters();
    parameters.insert(parameters.end(), further.begin(), further.end());
    for (auto const& parameter : parameters) {
        bool const offered = service->isParameterSupported(parameter);
        if (offered || all) {
            list.push_back({parameter, offered});
        }
    }
    return list;
}

std::vector<unsigned char> undecoded(obd::IEcu const& ecu)
{
    std::vector<Offer> const known = offers(true);
    std::vector<unsigned char> pids = ecu.supportedIds(obd::ObdMode::CurrentData, 0);
    std::erase_if(pids, [&known](unsigned char pid) {
        bool const isLater = pid > obd::lastListedPid && !obd::isSupportMask(pid);
        return !isLater || std::any_of(known.begin(), known.end(), [pid](Offer const& offer) {
            return static_cast<int>(offer.parameter->id) == pid;
        });
    });
    return pids;
}

std::vector<BuiltinPid> laterValues(unsigned char pid)
{
    std::vector<BuiltinPid> values;
    std::ranges::copy_if(builtinPids(), std::back_inserter(values),
                         [pid](BuiltinPid const& each) { return each.pid == pid && isDecoded(each); });
    return values;
}

} // namespace velmora::cli
