#include "libvelmora/poll/pollchoice.h"

#include "libvelmora/poll/sensorwish.h"

#include <velmora/error.h>

#include <fmt/format.h>

#include <algorithm>

namespace velmora {

namespace {

using Choices = std::vector<PollChoice>;

void add(Choices& choices, std::shared_ptr<obd::IEcu> const& ecu, SensorIds const& ids, std::optional<double> hertz)
{
    for (obd::ParameterIdentifier::Id const id : ids) {
        auto const same = std::find_if(choices.begin(), choices.end(),
                                       [&](PollChoice const& each) { return each.ecu == ecu && each.id == id; });
        if (same == choices.end()) {
            choices.push_back({ecu, id, hertz});
        } else {
            same->hertz = hertz;
        }
    }
}

[[noreturn]] void failNoModule(std::optional<unsigned int> id, std::vector<ModuleOffer> const& offers)
{
    std::string list;
    for (ModuleOffer const& offer : offers) {
        list += fmt::format("{}{:X}", list.empty() ? "" : ", ", offer.ecu->id());
    }
    throw Error(ErrorKind::NotSupported,
                id ? fmt::format("The vehicle has no control module {:X}", *id) : "No control module is chosen",
                {"these answer: " + list});
}

bool isMeant(ModuleOffer const& offer, SensorWish const& wish)
{
    return wish.module ? offer.ecu->id() == *wish.module : offer.meant;
}

// Of several modules those that don't offer the sensor are passed over, as long as one does.
void addWish(Choices& choices, SensorWish const& wish, std::vector<std::string> const& words,
             std::vector<ModuleOffer> const& offers)
{
    std::optional<Error> failure;
    bool found = false;
    bool known = false;
    for (ModuleOffer const& offer : offers) {
        if (!isMeant(offer, wish)) {
            continue;
        }
        known = true;
        try {
            add(choices, offer.ecu, chooseSensors(words, offer.sensors), wish.hertz);
            found = true;
        } catch (Error const& error) {
            failure = failure ? failure : error;
        }
    }
    if (!known) {
        failNoModule(wish.module, offers);
    }
    if (!found) {
        throw *failure;
    }
}

} // namespace

std::vector<PollChoice> choosePolled(std::vector<std::string> const& words, std::vector<ModuleOffer> const& offers,
                                     std::optional<double> hertz)
{
    Choices choices;
    if (words.empty()) {
        addWish(choices, {{}, {}, hertz}, {}, offers);
    }
    for (std::string const& word : words) {
        SensorWish wish = parseSensorWish(word);
        wish.hertz = wish.hertz ? wish.hertz : hertz;
        addWish(choices, wish, {wish.sensor}, offers);
    }
    return choices;
}

} // namespace velmora
