#pragma once

#include "libvelmora/poll/pollchoice.h"
#include "libvelmora/uds/signalchoice.h"
#include "program/command/commandsession.h"
#include "program/live/livefeed.h"
#include "program/live/liveoptions.h"
#include "program/view/live/livetable.h"
#include "program/view/live/sensorpicker.h"

#include <memory>
#include <string>
#include <vector>

namespace velmora::cli {

// What of a vehicle is read: sensors of its modules and signals of one's own. On a connection that stands.
class LiveChoice
{
public:
    // By the words of the command line, or of a kept layout. Throws Error. session and options must outlive it.
    LiveChoice(CommandSession& session, LiveOptions const& options, std::vector<std::string> const& words);

    // Others of the same module, in that order; those that were there keep their rate.
    void pick(SensorIds const& ids);
    // Throws Error where the list can't be changed.
    SensorPicker picker() const;
    // Speed and engine speed of the first module that offers both, in the place of all others until restore. Gives that
    // module. Throws Error if there is none.
    std::shared_ptr<obd::IEcu> chooseForRuns();
    void restore() { m_replaced.clear(); }

    // What would choose the same sensors; signals are not among them.
    std::vector<std::string> words() const;
    LiveTable::Parameters parameters() const;
    // Polls from here on, as fast as that.
    std::unique_ptr<LiveFeed> feed(PollWill const& will);
    std::vector<PollChoice> const& polled() const { return m_replaced.empty() ? m_choices : m_replaced; }
    // "module 7E8 ECM", "modules 7E8 ECM and 7E9 TCM".
    std::string modulesText() const;
    // Signals whose replies gave no value or were refused, a line each.
    std::string signalTroubles() const;

private:
    std::vector<PollChoice> choose(std::vector<std::string> const& words);

    CommandSession& m_session;
    LiveOptions const& m_options;
    std::vector<ModuleOffer> const m_offers;
    SignalChoice m_signals;
    std::vector<PollChoice> m_choices;
    std::vector<PollChoice> m_replaced;
};

} // namespace velmora::cli
