#pragma once

#include "libvelmora/live/livefeed.h"
#include "libvelmora/poll/pollchoice.h"
#include "libvelmora/uds/signalchoice.h"

#include <velmora/live.h>

#include <memory>
#include <string>
#include <vector>

namespace velmora {

// What of a vehicle is read: sensors of its modules and signals of one's own. On a connection that stands.
class LiveChoice
{
public:
    // Throws Error. session must outlive it.
    LiveChoice(Session& session, LiveWish const& wish);

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
    std::shared_ptr<LiveFeed> feed();
    // "module 7E8 ECM", "modules 7E8 ECM and 7E9 TCM".
    std::string modulesText() const;
    // Signals whose replies gave no value or were refused, a line each.
    std::string signalTroubles() const;

private:
    std::vector<PollChoice> choose();
    std::vector<PollChoice> const& polled() const { return m_replaced.empty() ? m_choices : m_replaced; }

    Session& m_session;
    LiveWish const m_wish;
    std::optional<double> const m_hertz; // of sensors without a rate of their own
    std::vector<ModuleOffer> const m_offers;
    SignalChoice m_signals;
    std::vector<PollChoice> m_choices;
    std::vector<PollChoice> m_replaced;
};

} // namespace velmora
