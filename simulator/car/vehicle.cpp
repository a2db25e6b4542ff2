#include "simulator/car/vehicle.h"

#include "simulator/car/services.h"

#include <algorithm>
#include <stdexcept>

namespace obdsim {

namespace {

constexpr std::uint8_t negativeResponse = 0x7F;

Protocol const& protocolOf(VehicleData const& data)
{
    Protocol const* protocol = findProtocol(data.protocol);
    if (protocol == nullptr) {
        throw std::invalid_argument("no OBD protocol has the number " + std::to_string(data.protocol));
    }
    return *protocol;
}

Pending pendingOf(ModuleData const& data, Bytes const& request)
{
    auto const found = data.delays.find(request);
    return found == data.delays.end() ? Pending{0, Time(0)} : found->second;
}

bool hears(ModuleData const& module, Target const& target)
{
    bool const own = module.request ? *module.request == target.identifier : target.module == module.id;
    return (target.everyone ? module.functional : own) && module.address == target.address;
}

/// ISO 14229-1: of what it does not know a module says nothing if all were asked.
bool isHushed(Bytes const& request, std::uint8_t code)
{
    constexpr std::uint8_t firstService = 0x10;
    return request[0] >= firstService && (code == refusal::serviceNotSupported ||
                                          code == refusal::subfunctionNotSupported || code == refusal::outOfRange);
}

void tell(std::vector<ModuleMessage>& messages, Module& module, bool everyone, Bytes const& request, Time now)
{
    Answer answer = module.answer(request, now);
    if (everyone && isHushed(request, answer.refusal)) {
        answer.refusal = 0;
    }
    if (answer.isSilent()) {
        return;
    }
    ModuleData const& data = module.data();
    Pending const pending = pendingOf(data, request);
    Time delay = data.latency + (pending.times == 0 ? pending.delay : Time(0));
    auto const say = [&](Bytes payload) {
        auto const tester = data.address ? std::optional(data.tester) : std::nullopt;
        messages.push_back({data.id, delay, std::move(payload), data.frameGap, tester});
    };
    for (int i = 0; i < pending.times; ++i) {
        say({negativeResponse, request[0], refusal::pending});
        delay += pending.delay;
    }
    if (answer.refusal != 0) {
        say({negativeResponse, request[0], answer.refusal});
    }
    for (auto const& payload : answer.messages) {
        say(payload);
    }
}

} // namespace

Vehicle::Vehicle(VehicleData const& data)
    : m_name(data.name), m_protocol(protocolOf(data)), m_padding(data.padding), m_addressPause(data.addressPause),
      m_volts(data.volts), m_drive(data.engine)
{
    DataLayout const layout = isCan(m_protocol) ? DataLayout::Can : DataLayout::Numbered;
    for (auto const& module : data.modules) {
        m_modules.emplace_back(module, data.engine.compression, m_drive, layout);
    }
}

std::string const& Vehicle::name() const
{
    return m_name;
}

Protocol const& Vehicle::protocol() const
{
    return m_protocol;
}

Padding Vehicle::padding() const
{
    return m_padding;
}

double Vehicle::volts(Time now) const
{
    constexpr double batteryVolts = 12.4;
    double const usual = m_ignition ? m_volts.value_or(m_drive.at(now).volts) : batteryVolts;
    return m_chosenVolts.value_or(usual);
}

bool Vehicle::isAwake() const
{
    return m_ignition && !m_modules.empty();
}

bool Vehicle::ignition() const
{
    return m_ignition;
}

void Vehicle::setIgnition(bool on)
{
    m_ignition = on;
}

void Vehicle::setVolts(std::optional<double> volts)
{
    m_chosenVolts = volts;
}

Drive& Vehicle::drive()
{
    return m_drive;
}

std::deque<Module>& Vehicle::modules()
{
    return m_modules;
}

Module* Vehicle::findModule(std::uint32_t id)
{
    auto const found =
        std::find_if(m_modules.begin(), m_modules.end(), [id](Module const& each) { return each.data().id == id; });
    return found == m_modules.end() ? nullptr : &*found;
}

std::vector<ModuleMessage> Vehicle::request(Target const& target, Bytes const& payload, Time now)
{
    std::vector<ModuleMessage> messages;
    if (payload.empty() || !isAwake()) {
        return messages;
    }
    for (auto& module : m_modules) {
        if (!module.isSilent() && hears(module.data(), target)) {
            tell(messages, module, target.everyone && isCan(m_protocol), payload, now);
        }
    }
    std::stable_sort(messages.begin(), messages.end(),
                     [](ModuleMessage const& a, ModuleMessage const& b) { return a.delay < b.delay; });
    return messages;
}

} // namespace obdsim
