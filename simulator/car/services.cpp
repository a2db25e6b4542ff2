#include "simulator/car/services.h"

#include <algorithm>
#include <iterator>

namespace obdsim {

namespace {

constexpr std::size_t range = 0x20;

template <std::uint8_t service>
bool hasSignals(ModuleData const& data)
{
    auto const first = data.signals.lower_bound(Bytes{service});
    return first != data.signals.end() && first->first[0] == service;
}

Service const services[] = {
    {0x01, currentData, [](ModuleData const& d) { return !d.live.empty() || !d.fixed.empty() || d.monitors; }},
    {0x02, freezeFrame, [](ModuleData const& d) { return d.hasStored; }},
    {0x03, storedCodes, [](ModuleData const& d) { return d.hasStored; }},
    {0x04, clearCodes, [](ModuleData const& d) { return d.hasStored; }},
    {0x05, sensorTests, [](ModuleData const& d) { return !d.sensorTests.empty(); }},
    {0x06, monitorTests, [](ModuleData const& d) { return !d.monitorTests.empty(); }},
    {0x07, pendingCodes, [](ModuleData const& d) { return d.hasPending; }},
    {0x08, runRoutine, [](ModuleData const& d) { return !d.routines.empty(); }},
    {0x09, vehicleInformation, hasVehicleInformation},
    {0x0A, permanentCodes, [](ModuleData const& d) { return d.hasPermanent; }},
    {0x18, kwpCodes, [](ModuleData const& d) { return d.hasKwpCodes; }},
    {0x19, udsCodes, [](ModuleData const& d) { return d.uds; }},
    {0x1A, localData, hasSignals<0x1A>},
    {0x21, localData, hasSignals<0x21>},
    {0x22, identifiedData, [](ModuleData const& d) { return d.uds || hasSignals<0x22>(d); }},
    {0x3E, testerPresent, [](ModuleData const& d) { return d.uds; }},
};

} // namespace

bool ServiceCall::onCan() const
{
    return module.layout() == DataLayout::Can;
}

std::optional<std::uint8_t> ServiceCall::at(std::size_t index) const
{
    if (index >= request.size()) {
        return std::nullopt;
    }
    return request[index];
}

Service const* findService(std::uint8_t id)
{
    auto const row =
        std::find_if(std::begin(services), std::end(services), [id](Service const& s) { return s.id == id; });
    return row == std::end(services) ? nullptr : &*row;
}

bool hasService(Module const& module, std::uint8_t id)
{
    Service const* service = findService(id);
    return service != nullptr && service->present(module.data());
}

std::optional<Bytes> supportedMask(std::set<std::uint8_t> const& ids, std::uint8_t base)
{
    if (base != 0 && ids.upper_bound(base) == ids.end()) {
        return std::nullopt;
    }
    Bytes mask(4, 0);
    for (auto const id : ids) {
        if (id <= base) {
            continue;
        }
        std::size_t const place = std::min<std::size_t>(static_cast<std::size_t>(id - base), range) - 1;
        mask[place / 8] |= static_cast<std::uint8_t>(0x80 >> place % 8);
    }
    return mask;
}

std::optional<std::uint8_t> rangeFiller(std::uint8_t service)
{
    switch (service) {
    case 0x06:
        return 0xFF;
    case 0x08:
        return 0x00;
    case 0x09:
        return 0x01; // number of the message
    default:
        return std::nullopt;
    }
}

Answer tellRange(ServiceCall const& call, std::set<std::uint8_t> const& ids)
{
    std::uint8_t const base = call.request[1];
    auto const mask = ids.empty() ? std::nullopt : supportedMask(ids, base);
    if (!mask) {
        return {};
    }
    Bytes message = {call.positiveService(), base};
    auto const filler = rangeFiller(call.request[0]);
    if (filler && !call.onCan()) {
        message.push_back(*filler);
    }
    message.insert(message.end(), mask->begin(), mask->end());
    return {0, {message}};
}

Answer recordedRange(ServiceCall const& call)
{
    if (call.request.size() < 2 || !isRangeRequest(call.request[1])) {
        return {};
    }
    std::set<std::uint8_t> ids;
    for (auto const& [request, messages] : call.module.data().raw) {
        if (request.size() == 2 && request[0] == call.request[0]) {
            ids.insert(request[1]);
        }
    }
    return tellRange(call, ids);
}

bool isRangeRequest(std::uint8_t id)
{
    return id % range == 0;
}

} // namespace obdsim
