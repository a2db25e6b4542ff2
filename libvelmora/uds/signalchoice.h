#pragma once

#include "libvelmora/poll/pollcycle.h"
#include "libvelmora/poll/sensorwish.h"
#include "libvelmora/session/session.h"
#include "libvelmora/uds/signalboard.h"
#include "libvelmora/uds/signalrow.h"

#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace velmora {

// The signals that words of a user mean, and what reads them. On a connection that stands; its board outlives it.
class SignalChoice
{
public:
    explicit SignalChoice(Session& session) : m_session(session) {}

    // Whether a word means signals, which are then chosen. meant are the modules of words that name none, for built-in
    // definitions. Throws Error for a signal that is switched off, can't be reached on this bus, is for other vehicles,
    // or is not decoded; for a PID that the vehicle does not offer.
    bool choose(SensorWish const& wish, std::vector<unsigned int> const& meant);
    // The same for a word that means no standard sensor either: words of a signal's name.
    bool chooseByName(SensorWish const& wish, std::vector<unsigned int> const& meant);

    bool empty() const { return m_chosen.empty(); }
    std::vector<SignalRow> rows() const;
    // For a poller, anew each time. alone: nothing else is polled, so that nobody has to wait for them.
    std::vector<PollSource> sources(bool alone);
    // Of the sources made last; null before.
    std::shared_ptr<SignalBoard> board() const { return m_board; }

private:
    void add(std::size_t index, SensorWish const& wish, std::vector<unsigned int> const& meant);
    void addOwn(std::size_t index, SensorWish const& wish);
    void addInputs(std::size_t index, std::optional<double> hertz);
    void addBuiltIn(std::size_t index, SensorWish const& wish, std::vector<unsigned int> const& meant);
    void addOnce(ChosenSignal const& signal);
    void checkVehicle(SignalEntry const& entry);
    void checkAddress(SignalEntry const& entry) const;
    unsigned int moduleOf(ChosenSignal const& signal) const;
    std::optional<double> rateOf(ChosenSignal const& signal, bool alone) const;
    SignalSet const& set() const { return *m_session.signals(); }

    Session& m_session;
    std::vector<ChosenSignal> m_chosen;
    std::shared_ptr<SignalBoard> m_board;
    std::optional<std::string> m_vin;
};

} // namespace velmora
