#pragma once

#include "program/command/commandcar.h"
#include "program/exitcode.h"
#include "program/live/ilivehost.h"
#include "program/live/livelayouts.h"
#include "program/live/liveoptions.h"
#include "program/live/livepanel.h"
#include "program/live/liverecord.h"
#include "program/live/performancepage.h"
#include "program/terminal/terminal.h"
#include "program/view/live/livecsv.h"
#include "program/view/live/livetable.h"

#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace velmora::cli {

// Live values of one connection: takes the readings of a poller and hands them to the lines, the recordings and the
// screen. The main thread's.
class LiveRun : private ILiveHost
{
public:
    // csv may be null. car and options must outlive the run.
    LiveRun(CommandCar& car, LiveOptions const& options, LiveCsv* csv);
    ~LiveRun() override;

    // Until the count, the duration or the user ends it. Throws Error on a lost link and on Ctrl-C.
    void run();

    // The sensors that no value has come of, by their names.
    std::vector<std::string> silentSensors() const;
    // Signals whose replies gave no value or were refused, a line each.
    std::string signalTroubles() const { return m_reader->signalTroubles(); }
    bool anyValue() const { return m_table.readings() > 0; }
    // Throws Error if the adapter is silent.
    void checkAdapter() const { m_reader->checkAdapter(); }

private:
    bool wantsScreen() const;
    void openScreen();
    std::string const& vehicle();
    std::optional<LiveLayout> keptLayout();
    std::string settingsFile() const;
    LiveWish wish(std::vector<std::string> const& sensors) const;
    void select();
    void takeReadings();
    void take(LiveTurn const& turn);

    bool isDone() const;
    void runOnce();
    void finish();
    void watchSilence(LiveTime now);
    void watchRates(LiveTime now);
    void print(LiveTurn const& turn);
    void tellRate() const;
    double rate() const;

    std::vector<LiveRow> const& rows() const override { return m_table.rows(); }
    std::string title() const override;
    std::string state() const override;
    std::string page(std::string const& note, FrameStyle const& style) const override;
    SensorPicker picker() const override;
    void pick(std::vector<int> const& ids) override;
    std::optional<std::string> handle(Key key) override;
    std::vector<KeyHelp> keys() const override;

    void switchUnits();
    std::string switchRecording();
    std::string switchPerformance();
    std::string snapshot() const;
    void keepLayout();
    std::string wholeTable() const;

    CommandCar& m_car;
    std::string const m_port;
    LiveOptions const& m_options;
    LiveCsv* const m_csv;
    std::string m_vehicle;                // what its layout is kept under, once it is asked for
    bool m_big = true;                    // as the layout has it
    std::unique_ptr<Terminal> m_terminal; // null where lines are printed
    std::unique_ptr<LivePanel> m_panel;   // the same
    std::unique_ptr<LiveReader> m_reader;
    std::string m_modules; // of what is read
    LiveTable m_table;
    std::unique_ptr<LiveRecord> m_record;           // null while nothing is recorded
    std::unique_ptr<PerformancePage> m_performance; // null while the values are shown
    LiveTime m_start;
    LiveTime m_lastReading;
    LiveTime m_lastLinkCheck;
    bool m_silenceTold = false;
    bool m_ratesTold = false;
    bool m_quit = false;
    bool m_readerGone = false;
};

} // namespace velmora::cli
