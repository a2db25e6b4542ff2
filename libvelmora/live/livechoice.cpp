#include "libvelmora/live/livechoice.h"

#include "libvelmora/live/livesensors.h"
#include "libvelmora/poll/sensorwish.h"

#include <obd/iecu.h>
#include <obd/iobdproxy.h>
#include <obd/ivelmorasettings.h>
#include <obd/parameterdescriptor.h>
#include <obd/parameterfactory.h>
#include <velmora/error.h>
#include <velmora/offers.h>

#include <fmt/format.h>

#include <algorithm>
#include <set>
#include <utility>

namespace velmora {

namespace {

// By words that name none. Not the one that is selected: each reading of all modules leaves its last one so.
std::vector<unsigned int> modulesMeant(Session const& session, LiveWish const& wish)
{
    if (!wish.allModules && !session.options().module) {
        return {session.proxy()->firstEcu()->id()};
    }
    std::vector<unsigned int> ids;
    for (std::shared_ptr<obd::IEcu> const& ecu : session.selectedModules()) {
        ids.push_back(ecu->id());
    }
    return ids;
}

std::optional<double> rateOf(LiveWish const& wish)
{
    return wish.rate.empty() ? std::nullopt : parseSensorWish("x@" + wish.rate).hertz;
}

} // namespace

LiveChoice::LiveChoice(Session& session, LiveWish const& wish)
    : m_session(session), m_wish(wish), m_hertz(rateOf(wish)),
      m_offers(moduleOffers(session.obd(), modulesMeant(session, wish))), m_signals(session), m_choices(choose())
{}

// Signals of one's own first, by id or name; then standard sensors; then words of a signal's name.
std::vector<PollChoice> LiveChoice::choose()
{
    std::vector<unsigned int> meant;
    for (ModuleOffer const& offer : m_offers) {
        if (offer.meant) {
            meant.push_back(offer.ecu->id());
        }
    }
    std::vector<std::string> standard;
    for (std::string const& word : m_wish.sensors) {
        SensorWish wish = parseSensorWish(word);
        wish.hertz = wish.hertz ? wish.hertz : m_hertz;
        if (m_signals.choose(wish, meant)) {
            continue;
        }
        try {
            choosePolled({word}, m_offers, m_hertz);
        } catch (Error const&) {
            if (!m_signals.chooseByName(wish, meant)) {
                throw;
            }
            continue;
        }
        standard.push_back(word);
    }
    return standard.empty() && !m_signals.empty() ? std::vector<PollChoice>()
                                                  : choosePolled(standard, m_offers, m_hertz);
}

void LiveChoice::pick(std::vector<int> const& ids)
{
    std::vector<PollChoice> choices;
    for (int const number : ids) {
        obd::ParameterIdentifier::Id const id = obd::ParameterIdentifier(number).id();
        auto const old = std::ranges::find(m_choices, id, &PollChoice::id);
        choices.push_back(old != m_choices.end() ? *old : PollChoice{m_choices.front().ecu, id, m_hertz});
    }
    m_choices = std::move(choices);
}

std::vector<int> LiveChoice::picked() const
{
    std::vector<int> ids;
    for (PollChoice const& choice : m_choices) {
        if (choice.ecu != m_choices.front().ecu) {
            throw Error(ErrorKind::WrongUse, "Sensors of several modules are chosen on the command line");
        }
        ids.push_back(static_cast<int>(choice.id));
    }
    return ids;
}

std::vector<LiveOffer> LiveChoice::offers() const
{
    auto const offer = std::ranges::find_if(
        m_offers, [&](ModuleOffer const& each) { return !m_choices.empty() && each.ecu == m_choices.front().ecu; });
    if (offer == m_offers.end()) {
        throw Error(ErrorKind::WrongUse, "Signals are chosen on the command line");
    }
    std::vector<LiveOffer> list;
    for (OfferedSensor const& each : offer->sensors) {
        list.push_back({static_cast<int>(each.id), each.title});
    }
    return list;
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

std::vector<LiveParameter> LiveChoice::parameters() const
{
    obd::IVelmoraSettings const& settings = *m_session.obd().getSettings();
    std::vector<LiveParameter> chosen;
    for (PollChoice const& choice : polled()) {
        auto const parameter = obd::ParameterFactory().createParameter(*choice.ecu, settings, choice.id);
        if (parameter != nullptr) {
            chosen.push_back(liveSensors(obd::ParameterDescriptor(parameter, choice.ecu, settings.unitSystem()),
                                         obd::ParameterDescriptor(parameter, choice.ecu, obd::UnitSystem::Metric),
                                         choice.ecu->id(), choice.hertz, m_session.units()));
        }
    }
    for (SignalRow const& row : m_replaced.empty() ? m_signals.rows() : std::vector<SignalRow>()) {
        chosen.push_back(liveSensors(row));
    }
    return chosen;
}

std::shared_ptr<LiveFeed> LiveChoice::feed()
{
    PollWill const will{m_wish.fast, m_wish.pidsPerRequest};
    return std::make_shared<LiveFeed>(m_session.obd(), polled(), will, m_session.units(), m_session.channel(),
                                      m_replaced.empty() ? m_signals.sources(m_choices.empty())
                                                         : std::vector<PollSource>());
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

void checkRate(std::string const& rate)
{
    parseSensorWish("x@" + rate);
}

} // namespace velmora
