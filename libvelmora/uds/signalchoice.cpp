#include "libvelmora/uds/signalchoice.h"

#include "libvelmora/read/sensornames.h"
#include "libvelmora/signal/signalhex.h"
#include "libvelmora/uds/moduleaddress.h"
#include "libvelmora/uds/signalsources.h"
#include "libvelmora/uds/vehiclevin.h"

#include <velmora/error.h>

#include <fmt/format.h>

#include <algorithm>

namespace velmora {

namespace {

bool isSwitchedOff(SignalEntry const& entry)
{
    return !entry.signal.enabled;
}

std::string standingNote(SignalEntry const& entry)
{
    return entry.standing == PidStanding::NameOnly ? "no layout of its data is known"
                                                   : "nobody tells for sure how its data is laid out";
}

} // namespace

bool SignalChoice::choose(SensorWish const& wish, std::vector<unsigned int> const& meant)
{
    std::vector<std::size_t> found = set().find(wish.sensor);
    if (found.empty() || (set()[found.front()].isBuiltIn() && findSensorName(wish.sensor))) {
        return false;
    }
    // Of a PID with several values those are meant that can be told.
    auto const undecoded = [&](std::size_t index) { return !set()[index].signal.formula; };
    if (!std::all_of(found.begin(), found.end(), undecoded)) {
        std::erase_if(found, undecoded);
    }
    for (std::size_t const index : found) {
        add(index, wish, meant);
    }
    return true;
}

bool SignalChoice::chooseByName(SensorWish const& wish, std::vector<unsigned int> const& meant)
{
    std::vector<std::size_t> const found = set().search(wish.sensor);
    if (found.size() > 1) {
        std::string list;
        for (std::size_t i = 0; i < found.size() && i < 10; ++i) {
            list += (list.empty() ? "" : ", ") + set()[found[i]].signal.id;
        }
        throw Error(ErrorKind::WrongUse, fmt::format("\"{}\" fits several signals", wish.sensor),
                    {"choose by id: " + list});
    }
    for (std::size_t const index : found) {
        add(index, wish, meant);
    }
    return !found.empty();
}

void SignalChoice::add(std::size_t index, SensorWish const& wish, std::vector<unsigned int> const& meant)
{
    if (set()[index].isBuiltIn()) {
        addBuiltIn(index, wish, meant);
    } else {
        addOwn(index, wish);
    }
}

void SignalChoice::addOnce(ChosenSignal const& signal)
{
    auto const same = std::find_if(m_chosen.begin(), m_chosen.end(), [&](ChosenSignal const& each) {
        return each.index == signal.index && each.module == signal.module;
    });
    if (same == m_chosen.end()) {
        m_chosen.push_back(signal);
    } else if (signal.told) {
        same->told = true;
        same->hertz = signal.hertz;
    }
}

void SignalChoice::checkVehicle(SignalEntry const& entry)
{
    if (entry.vin.empty()) {
        return;
    }
    if (!m_vin) {
        m_vin = vehicleVin(*m_session.proxy());
    }
    if (!m_vin->empty() && !fitsVin(entry.vin, *m_vin)) {
        throw Error(ErrorKind::NotSupported,
                    fmt::format("{} is for vehicles {}, and this one is {}", entry.signal.id, entry.vin, *m_vin),
                    {"the file " + entry.path + " says so; take its key vin out if it is wrong"});
    }
}

// What can't be reached on this bus must not be asked of all modules in its place.
void SignalChoice::checkAddress(SignalEntry const& entry) const
{
    if (entry.signal.request.empty() || isBroadcast(entry.signal)) {
        return;
    }
    AddressOrReason const reached = addressOf(entry.signal, m_session.proxy()->protocol());
    if (!reached.address) {
        throw Error(ErrorKind::NotSupported,
                    fmt::format("The signal {} can't be asked for: {}", entry.signal.id, reached.reason));
    }
}

void SignalChoice::addOwn(std::size_t index, SensorWish const& wish)
{
    SignalEntry const& entry = set()[index];
    if (isSwitchedOff(entry)) {
        throw Error(ErrorKind::NotSupported,
                    fmt::format("The signal {} is switched off: {}", entry.signal.id, entry.signal.reason),
                    {"its file " + entry.path + " says so (enabled = false)"});
    }
    checkVehicle(entry);
    checkAddress(entry);
    std::optional<unsigned int> const module = isBroadcast(entry.signal) ? wish.module : std::optional<unsigned int>();
    addOnce({index, module, wish.hertz ? wish.hertz : entry.signal.rate, true});
    addInputs(index, wish.hertz);
}

// What it is worked out of is read, too, though not told.
void SignalChoice::addInputs(std::size_t index, std::optional<double> hertz)
{
    if (!set()[index].signal.formula) {
        return;
    }
    for (std::string const& id : valuesReadBy(*set()[index].signal.formula)) {
        std::optional<std::size_t> const other = set().sibling(index, id);
        if (!other || isSwitchedOff(set()[*other])) {
            throw Error(ErrorKind::NotSupported, fmt::format("{} is worked out of {}, which is switched off or missing",
                                                             set()[index].signal.id, id));
        }
        checkAddress(set()[*other]);
        bool const known = std::any_of(m_chosen.begin(), m_chosen.end(),
                                       [&](ChosenSignal const& each) { return each.index == *other; });
        if (!known) {
            addOnce({*other, {}, hertz ? hertz : set()[*other].signal.rate, false});
            addInputs(*other, hertz);
        }
    }
}

void SignalChoice::addBuiltIn(std::size_t index, SensorWish const& wish, std::vector<unsigned int> const& meant)
{
    SignalEntry const& entry = set()[index];
    unsigned char const pid = entry.signal.request[1];
    if (!entry.signal.formula) {
        throw Error(ErrorKind::NotSupported,
                    fmt::format("PID {:02X} ({}) is not decoded: {}", pid, entry.signal.name, standingNote(entry)));
    }
    bool found = false;
    for (unsigned int const module : wish.module ? std::vector<unsigned int>{*wish.module} : meant) {
        std::shared_ptr<obd::IEcu> const ecu = m_session.proxy()->ecu(module);
        if (ecu != nullptr && ecu->isSupported(obd::ObdMode::CurrentData, pid, 0)) {
            addOnce({index, module, wish.hertz, true});
            found = true;
        }
    }
    if (!found) {
        throw Error(ErrorKind::NotSupported,
                    fmt::format("The vehicle does not offer PID {:02X} ({})", pid, entry.signal.name),
                    {"`velmora sensors` lists what it offers"});
    }
}

unsigned int SignalChoice::moduleOf(ChosenSignal const& signal) const
{
    if (signal.module) {
        return *signal.module;
    }
    Signal const& own = set()[signal.index].signal;
    if (own.request.empty() || isBroadcast(own)) {
        return 0;
    }
    AddressOrReason const reached = addressOf(own, m_session.proxy()->protocol());
    return reached.address ? answeringModule(*reached.address) : 0;
}

std::optional<double> SignalChoice::rateOf(ChosenSignal const& signal, bool alone) const
{
    Signal const& own = set()[signal.index].signal;
    bool const foreign = !own.request.empty() && !isBroadcast(own);
    return signal.hertz || alone || !foreign ? signal.hertz : std::optional(usualSignalRate);
}

std::vector<SignalRow> SignalChoice::rows() const
{
    std::vector<SignalRow> rows;
    for (ChosenSignal const& each : m_chosen) {
        Signal const& signal = set()[each.index].signal;
        if (each.told) {
            rows.push_back({moduleOf(each), signalId(each.index), signal.id, hexText(signal.request), signal.name,
                            signal.unit, !signal.text && signal.values.empty(), each.hertz});
        }
    }
    return rows;
}

std::vector<PollSource> SignalChoice::sources(bool alone)
{
    m_board = std::make_shared<SignalBoard>(m_session.signals());
    SignalSources sources(m_board, std::make_shared<ModuleAsker>(*m_session.proxy(), m_session.channel()));
    for (ChosenSignal const& each : m_chosen) {
        Signal const& signal = set()[each.index].signal;
        if (signal.request.empty()) {
            sources.addWorkedOut(each);
            continue;
        }
        std::optional<RequestAddress> const address =
            isBroadcast(signal) ? std::nullopt : addressOf(signal, m_session.proxy()->protocol()).address;
        sources.add(each, moduleOf(each), address, rateOf(each, alone));
    }
    return sources.take();
}

} // namespace velmora
