#include "libvelmora/car/carsensors.h"

#include "libvelmora/poll/sensorwish.h"
#include "libvelmora/read/sensorchoice.h"
#include "libvelmora/read/sensornames.h"
#include "libvelmora/uds/signalchoice.h"

#include <common/clock.h>
#include <obd/ivelmorasettings.h>
#include <obd/parameterdescriptor.h>
#include <obd/parameterfactory.h>
#include <obd/powertrainparameter.h>

#include <fmt/format.h>

#include <algorithm>
#include <iterator>
#include <optional>

namespace velmora {

namespace {

struct Offer
{
    std::shared_ptr<obd::IEcu> ecu;
    std::vector<OfferedSensor> sensors;
};

std::vector<Offer> offersOf(Session& session)
{
    std::vector<Offer> offers;
    for (std::shared_ptr<obd::IEcu> const& ecu : session.selectedModules()) {
        session.select(*ecu);
        offers.push_back({ecu, offeredSensors(*obd::SensorServiceBuilder::createSensorService())});
    }
    return offers;
}

std::vector<Offer> offersOf(std::vector<Offer> const& all, std::optional<unsigned int> module)
{
    std::vector<Offer> chosen;
    std::copy_if(all.begin(), all.end(), std::back_inserter(chosen),
                 [&module](Offer const& offer) { return !module || offer.ecu->id() == *module; });
    if (chosen.empty()) {
        throw Error(ErrorKind::NotSupported, fmt::format("The vehicle has no control module {:X}", module.value_or(0)));
    }
    return chosen;
}

void addSource(std::vector<PollSource>& sources, Session& session, std::shared_ptr<obd::IEcu> const& ecu,
               obd::ParameterIdentifier::Id id, std::optional<double> hertz)
{
    bool const known = std::any_of(sources.begin(), sources.end(), [&](PollSource const& source) {
        return source.guest == nullptr && source.ecu == ecu && source.parameter->pid() == id;
    });
    auto parameter = obd::ParameterFactory().createParameter(*ecu, *session.obd().getSettings(), id);
    if (!known && parameter != nullptr) {
        sources.push_back({ecu, std::move(parameter), hertz});
    }
}

// The first module that offers what is meant; if none does, what the first one has to say.
void addWish(std::vector<PollSource>& sources, Session& session, std::vector<Offer> const& all, SensorWish const& wish,
             std::vector<std::string> const& words)
{
    std::optional<Error> first;
    for (Offer const& offer : offersOf(all, wish.module)) {
        try {
            for (obd::ParameterIdentifier::Id const id : chooseSensors(words, offer.sensors)) {
                addSource(sources, session, offer.ecu, id, wish.hertz);
            }
            return;
        } catch (Error const& problem) {
            first = first ? first : problem;
        }
    }
    throw *first;
}

Reading untold(PollRate const& rate)
{
    Reading reading;
    reading.time = std::chrono::system_clock::now();
    reading.module = rate.module;
    reading.sensor = rate.sensor.empty() ? sensorKey(rate.pid) : rate.sensor;
    reading.name = reading.sensor;
    return reading;
}

bool isOf(PollResult const& result, PollRate const& rate)
{
    return result.module == rate.module && result.id == obd::ParameterIdentifier(rate.pid).id();
}

} // namespace

std::vector<Sensor> sensorsOf(Session& session)
{
    std::vector<Sensor> sensors;
    for (Offer const& offer : offersOf(session)) {
        for (OfferedSensor const& each : offer.sensors) {
            bool const derived =
                !offer.ecu->isSupported(obd::ObdMode::CurrentData, static_cast<unsigned char>(each.id), 0);
            sensors.push_back({offer.ecu->id(), sensorKey(each.id),
                               derived ? std::string() : fmt::format("01{:02X}", static_cast<int>(each.id)),
                               each.title});
        }
    }
    return sensors;
}

std::vector<PollSource> pollSources(Session& session, std::vector<std::string> const& words)
{
    std::vector<Offer> const all = offersOf(session);
    std::vector<PollSource> sources;
    if (words.empty()) {
        addWish(sources, session, all, {}, {});
    }
    SignalChoice signals(session);
    std::vector<unsigned int> modules;
    for (Offer const& offer : all) {
        modules.push_back(offer.ecu->id());
    }
    for (std::string const& word : words) {
        SensorWish const wish = parseSensorWish(word);
        if (signals.choose(wish, modules)) {
            continue;
        }
        try {
            addWish(sources, session, all, wish, {wish.sensor});
        } catch (Error const&) {
            if (!signals.chooseByName(wish, modules)) {
                throw;
            }
        }
    }
    for (PollSource& each : signals.sources(sources.empty())) {
        sources.push_back(std::move(each));
    }
    return sources;
}

std::vector<Reading> readOnce(Session& session, std::vector<PollSource> const& sources)
{
    std::vector<PollResult> results;
    PollCycle cycle(
        session.proxy(), sources, carefulPace(session.proxy()->protocol()),
        [](unsigned char pid) { return obd::ParameterFactory::dataLength(obd::ParameterIdentifier(pid).id()); },
        session.units(), [&results](PollResult const& result) { results.push_back(result); });
    auto const told = [&results](PollRate const& rate) {
        return std::any_of(results.begin(), results.end(),
                           [&rate](PollResult const& each) { return isOf(each, rate); });
    };
    auto const done = [&told](PollRate const& rate) { return rate.silent > 0 || told(rate); };
    for (auto rates = cycle.rates(); !std::all_of(rates.begin(), rates.end(), done); rates = cycle.rates()) {
        session.check();
        tervex::sleepMillis(static_cast<unsigned int>(cycle.wait().count()));
        cycle.step();
    }
    session.check();
    std::vector<Reading> readings;
    for (PollRate const& rate : cycle.rates()) {
        auto const found =
            std::find_if(results.begin(), results.end(), [&rate](PollResult const& each) { return isOf(each, rate); });
        if (found == results.end()) {
            readings.push_back(untold(rate));
        } else {
            readings.insert(readings.end(), found->readings.begin(), found->readings.end());
        }
    }
    return readings;
}

} // namespace velmora
