#pragma once

#include "libvelmora/live/livefeed.h"
#include "libvelmora/live/livesensor.h"
#include "libvelmora/poll/pollchoice.h"
#include "libvelmora/uds/signalchoice.h"

#include <memory>
#include <string>
#include <vector>

namespace velmora {

// What is to be read, and how.
struct LiveWish
{
    std::optional<double> hertz; // of sensors without a rate of their own
    PollWill will;
    bool selectedModules = false; // words that name no module mean those that the session selects; else the first one
};

// What of a vehicle is read: sensors of its modules and signals of one's own. On a connection that stands.
class LiveChoice
{
public:
    // By words as people type them, or of a kept layout. Throws Error. session must outlive it.
    LiveChoice(Session& session, LiveWish const& wish, std::vector<std::string> const& words);

    // Others of the same module, in that order; those that were there keep their rate.
    void pick(std::vector<int> const& ids);
    // What pick can choose, and what is chosen. Throw Error where the list can't be changed.
    std::vector<LiveOffer> offers() const;
    std::vector<int> picked() const;
    // Speed and engine speed of the first module that offers both, in the place of all others until restore. Gives that
    // module. Throws Error if there is none.
    std::shared_ptr<obd::IEcu> chooseForRuns();
    void restore() { m_replaced.clear(); }

    // What would choose the same sensors; signals are not among them.
    std::vector<std::string> words() const;
    std::vector<LiveParameter> parameters() const;
    // Polls from here on.
    std::unique_ptr<LiveFeed> feed();
    // "module 7E8 ECM", "modules 7E8 ECM and 7E9 TCM".
    std::string modulesText() const;
    // Signals whose replies gave no value or were refused, a line each.
    std::string signalTroubles() const;

private:
    std::vector<PollChoice> choose(std::vector<std::string> const& words);
    std::vector<PollChoice> const& polled() const { return m_replaced.empty() ? m_choices : m_replaced; }

    Session& m_session;
    LiveWish const m_wish;
    std::vector<ModuleOffer> const m_offers;
    SignalChoice m_signals;
    std::vector<PollChoice> m_choices;
    std::vector<PollChoice> m_replaced;
};

// The rate of a text such as "10hz". Throws Error.
std::optional<double> liveRate(std::string const& text);

// What layouts of the session's vehicle are kept under. Asks the vehicle.
std::string layoutKey(Session& session);

} // namespace velmora
