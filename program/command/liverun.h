#pragma once

#include "libvelmora/poll/pollchoice.h"
#include "libvelmora/uds/signalchoice.h"
#include "program/command/commandsession.h"
#include "program/command/livefeed.h"
#include "program/exitcode.h"
#include "program/terminal/terminal.h"
#include "program/view/livecsv.h"
#include "program/view/livescreen.h"
#include "program/view/livetable.h"

#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace velmora::cli {

struct LiveOptions
{
    std::vector<std::string> sensors;
    std::string csv;
    bool force = false;      // csv may replace a file
    unsigned long count = 0; // readings of every sensor; 0: no end
    double duration = 0.0;   // seconds; 0: no end
    PollWill will;
    std::string rate;            // as given
    std::optional<double> hertz; // of sensors without a rate of their own
};

// Live values of one connection: takes the readings of a poller and hands them to the lines, the recording and the
// screen. The main thread's.
class LiveRun
{
public:
    // csv may be null. session must be connected and outlive the run.
    LiveRun(CommandSession& session, LiveOptions const& options, LiveCsv* csv);
    ~LiveRun();
    LiveRun(LiveRun const&) = delete;
    LiveRun& operator=(LiveRun const&) = delete;

    // Until the count, the duration or the user ends it. Throws Error on a lost link and on Ctrl-C.
    void run();

    // The sensors that no value has come of, by their names.
    std::vector<std::string> silentSensors() const;
    // Signals whose replies gave no value or were refused, a line each.
    std::string signalTroubles() const;
    bool anyValue() const { return m_table.readings() > 0; }

private:
    std::vector<PollChoice> choose();
    void start(std::vector<PollChoice> const& choices);
    void feed();
    void select();
    void takeReadings();
    void take(PollResult const& result);

    bool isDone() const;
    void runOnce();
    void finish();
    void watchSilence(LiveTime now);
    void watchRates(LiveTime now);
    void print(PollResult const& result);
    void tellRate() const;
    double rate() const;

    void handleKeys();
    void handleKey(Key key);
    void handlePickerKey(Key key);
    void openPicker();
    void pick(SensorIds const& ids);
    void switchUnits();
    void scroll(int lines);
    int page() const;
    void draw(LiveTime now);
    std::string frame(FrameStyle const& style) const;
    std::string title() const;
    std::string status() const;
    FrameStyle style() const;
    std::string big(FrameStyle& style) const;

    CommandSession& m_session;
    LiveOptions const m_options;
    LiveCsv* const m_csv;
    std::vector<ModuleOffer> const m_offers;
    SignalChoice m_signals;
    std::vector<PollChoice> m_choices;
    LiveTable m_table;
    std::unique_ptr<LiveFeed> m_feed;
    LiveTime m_start;
    LiveTime m_lastReading;
    LiveTime m_lastLinkCheck;
    LiveTime m_lastDraw;
    bool m_silenceTold = false;
    bool m_ratesTold = false;
    bool m_quit = false;
    bool m_readerGone = false;
    std::unique_ptr<Terminal> m_terminal; // null where lines are printed
    std::unique_ptr<SensorPicker> m_picker;
    std::size_t m_firstRow = 0;
    bool m_big = true;   // digits that can be read from afar, where there is room
    bool m_hold = false; // the screen stays as it is
    std::string m_note;  // in the status line, until the next key
};

} // namespace velmora::cli
