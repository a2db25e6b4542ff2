#include "program/live/livechoice.h"

#include "libvelmora/poll/sensorwish.h"

#include <obd/iecu.h>
#include <obd/ivelmorasettings.h>
#include <obd/parameterdescriptor.h>
#include <obd/parameterfactory.h>
#include <velmora/error.h>
#include <velmora/offers.h>

#include <fmt/format.h>

#include <algorithm>
#include <set>
#include <utility>

namespace velmora::cli {

namespace {

// The modules that words mean which name none: those of --ecu, or the first one.
std::vector<unsigned int> modulesMeant(CommandSession const& session)
{
    std::vector<unsigned int> ids;
    if (session.options().ecu || session.options().allEcus) {
        for (std::shared_ptr<obd::IEcu> const& ecu : session.selectedModules()) {
            ids.push_back(ecu->id());
        }
    }
    return ids;
}

std::map<int, std::string> metricUnitsOf(std::shared_ptr<obd::PowertrainParameter> const& parameter,
                                         std::shared_ptr<obd::IEcu> const& ecu)
{
    std::map<int, std::string> units;
    for (auto const& sensor : obd::ParameterDescriptor(parameter, ecu, obd::UnitSystem::Metric).sensors()) {
        units[sensor->uid()] = sensorUnit(sensor->uid(), sensor->unit(), Units::Metric);
    }
    return units;
}

} // namespace

LiveChoice::LiveChoice(CommandSession& session, LiveOptions const& options, std::vector<std::string> const& words)
    : m_session(session), m_options(options), m_offers(moduleOffers(session.obd(), modulesMeant(session))),
      m_signals(session), m_choices(choose(words))
{}

// Signals of one's own first, by id or name; then standard sensors; then words of a signal's name.
std::vector<PollChoice> LiveChoice::choose(std::vector<std::string> const& words)
{
    std::vector<unsigned int> meant;
    for (ModuleOffer const& offer : m_offers) {
        if (offer.meant) {
            meant.push_back(offer.ecu->id());
        }
    }
    std::vector<std::string> standard;
    for (std::string const& word : words) {
        SensorWish wish = parseSensorWish(word);
        wish.hertz = wish.hertz ? wish.hertz : m_options.hertz;
        if (m_signals.choose(wish, meant)) {
            continue;
        }
        try {
            choosePolled({word}, m_offers, m_options.hertz);
        } catch (Error const&) {
            if (!m_signals.chooseByName(wish, meant)) {
                throw;
            }
            continue;
        }
        standard.push_back(word);
    }
    return standard.empty() && !m_signals.empty() ? std::vector<PollChoice>()
                                                  : choosePolled(standard, m_offers, m_options.hertz);
}

void LiveChoice::pick(SensorIds const& ids)
{
    std::vector<PollChoice> choices;
    for (obd::ParameterIdentifier::Id const id : ids) {
        auto const old = std::ranges::find(m_choices, id, &PollChoice::id);
        choices.push_back(old != m_choices.end() ? *old : PollChoice{m_choices.front().ecu, id, m_options.hertz});
    }
    m_choices = std::move(choices);
}

SensorPicker LiveChoice::picker() const
{
    SensorIds ids;
    for (PollChoice const& choice : m_choices) {
        if (choice.ecu != m_choices.front().ecu) {
            throw Error(ErrorKind::WrongUse, "Sensors of several modules are chosen on the command line");
        }
        ids.push_back(choice.id);
    }
    auto const offer = std::ranges::find_if(
        m_offers, [&](ModuleOffer const& each) { return !m_choices.empty() && each.ecu == m_choices.front().ecu; });
    if (offer == m_offers.end()) {
        throw Error(ErrorKind::WrongUse, "Signals are chosen on the command line");
    }
    return {offer->sensors, ids};
}

std::shared_ptr<obd::IEcu> LiveChoice::chooseForRuns()
{
    obd::ParameterIdentifier::Id const speed = obd::ParameterIdentifier(0x0D).id();
    obd::ParameterIdentifier::Id const engineSpeed = obd::ParameterIdentifier(0x0C).id();
    for (ModuleOffer const& offer : m_offers) {
        auto const offers = [&](auto id) { return std::ranges::count(offer.sensors, id, &OfferedSensor::id) > 0; };
        if (offers(speed) && offers(engineSpeed)) {
            m_replaced = {{offer.ecu, speed, {}}, {offer.ecu, engineSpeed, {}}};
            return offer.ecu;
        }
    }
    throw Error(ErrorKind::NotSupported, "No module tells both speed and engine speed");
}

std::vector<std::string> LiveChoice::words() const
{
    std::vector<std::string> words;
    for (PollChoice const& choice : m_choices) {
        words.push_back(fmt::format("{:X}:{:02X}{}", choice.ecu->id(), static_cast<int>(choice.id),
                                    choice.hertz ? "@" + rateText(*choice.hertz) : ""));
    }
    return words;
}

LiveTable::Parameters LiveChoice::parameters() const
{
    obd::IVelmoraSettings const& settings = *m_session.obd().getSettings();
    LiveTable::Parameters chosen;
    for (PollChoice const& choice : polled()) {
        auto const parameter = obd::ParameterFactory().createParameter(*choice.ecu, settings, choice.id);
        if (parameter != nullptr) {
            auto const descriptor =
                std::make_shared<obd::ParameterDescriptor>(parameter, choice.ecu, settings.unitSystem());
            chosen.emplace_back(descriptor, choice.ecu->id(), choice.hertz);
            chosen.back().metricUnits = metricUnitsOf(parameter, choice.ecu);
        }
    }
    for (SignalRow const& row : m_replaced.empty() ? m_signals.rows() : std::vector<SignalRow>()) {
        chosen.emplace_back(row);
    }
    return chosen;
}

std::unique_ptr<LiveFeed> LiveChoice::feed(PollWill const& will)
{
    return std::make_unique<LiveFeed>(
        m_session.obd(), m_session.loop(), polled(), will, m_session.units(), m_session.channel(),
        m_replaced.empty() ? m_signals.sources(m_choices.empty()) : std::vector<PollSource>());
}

std::string LiveChoice::modulesText() const
{
    std::string modules;
    std::set<unsigned int> told;
    for (PollChoice const& choice : polled()) {
        if (told.insert(choice.ecu->id()).second) {
            modules += fmt::format("{}{:X} {}", modules.empty() ? "" : " and ", choice.ecu->id(), choice.ecu->name());
        }
    }
    return (told.size() == 1 ? "module " : "modules ") + modules;
}

std::string LiveChoice::signalTroubles() const
{
    std::string text;
    for (SignalTrouble const& each :
         m_signals.board() != nullptr ? m_signals.board()->troubles() : std::vector<SignalTrouble>()) {
        if (each.withoutValue != 0) {
            text += fmt::format("{}: replies without a value: {}\n", each.id, each.withoutValue);
        }
        if (!each.reason.empty()) {
            text += fmt::format("{} {}\n", each.id, each.reason);
        }
    }
    return text;
}

} // namespace velmora::cli
