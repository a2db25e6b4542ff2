#pragma once

#include "libvelmora/read/sensorchoice.h"
#include "libvelmora/session/cyclemeter.h"
#include "program/command/commandsession.h"
#include "program/exitcode.h"
#include "program/terminal/terminal.h"
#include "program/view/livecsv.h"
#include "program/view/livescreen.h"
#include "program/view/livetable.h"

#include <obd/isensorservice.h>
#include <tervex/observer.h>

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
};

// Live values of one connection: takes the readings of the sensor service and hands them to the lines, the recording
// and the screen. The main thread's.
class LiveRun : public tervex::Observer<obd::ISensorServiceObserver>
{
public:
    // csv may be null. session must be connected and outlive the run.
    LiveRun(CommandSession& session, LiveOptions const& options, LiveCsv* csv);
    ~LiveRun() override;
    LiveRun(LiveRun const&) = delete;
    LiveRun& operator=(LiveRun const&) = delete;

    // Until the count, the duration or the user ends it. Throws Error on a lost link and on Ctrl-C.
    void run();

private:
    void onInvalidated() override { m_invalidated = true; }
    void onSensorUpdated(bool success, std::shared_ptr<obd::ParameterDescriptor> const& descriptor,
                         std::vector<std::shared_ptr<obd::SensorValueDataModel>> const& values) override;

    void select(SensorIds const& ids);
    void restart(SensorIds const& ids);

    bool isDone() const;
    void runOnce();
    void finish();
    void watchSilence(LiveTime now);
    void print(int pid);
    void tellRate() const;
    double rate() const;

    void handleKeys();
    void handleKey(Key key);
    void handlePickerKey(Key key);
    void switchUnits();
    void scroll(int lines);
    int page() const;
    void draw(LiveTime now);
    std::string frame(FrameStyle const& style) const;
    std::string title() const;
    std::string status() const;
    FrameStyle style() const;

    CommandSession& m_session;
    LiveOptions const m_options;
    LiveCsv* const m_csv;
    std::shared_ptr<obd::ISensorService> m_service;
    CycleTap m_tap;
    LiveTable m_table;
    SensorIds m_ids;
    LiveTime m_start;
    LiveTime m_lastReading;
    LiveTime m_lastLinkCheck;
    LiveTime m_lastDraw;
    bool m_invalidated = false;
    bool m_silenceTold = false;
    bool m_quit = false;
    bool m_readerGone = false;
    std::unique_ptr<Terminal> m_terminal; // null where lines are printed
    std::unique_ptr<SensorPicker> m_picker;
    std::size_t m_firstRow = 0;
    std::string m_note; // in the status line, until the next key
};

} // namespace velmora::cli
