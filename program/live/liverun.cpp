#include "program/live/liverun.h"

#include "program/terminal/output.h"
#include "program/view/live/livelines.h"
#include "program/view/style.h"
#include "program/view/timetext.h"
#include "program/view/unitpairs.h"

#include <velmora/error.h>
#include <velmora/limits.h>
#include <velmora/vin.h>

namespace velmora::cli {

namespace {

using Clock = std::chrono::steady_clock;
using std::chrono::milliseconds;

constexpr milliseconds step{50};
constexpr char const* fastWarning =
    "Asking without the pause that spares the vehicle; too much traffic has upset control modules";

// Kept in metric units, whatever is shown.
SensorLimit limitOfRow(SensorLimits const& limits, LiveRow const& row)
{
    return converted(limits.of(row.key), row.metricUnit, row.unit);
}

LiveWish wishOf(CommandSession const& session, LiveOptions const& options)
{
    LiveWish wish;
    wish.hertz = options.hertz;
    wish.will.fast = options.fast;
    wish.will.pidsPerRequest = options.pidsPerRequest;
    wish.selectedModules = session.options().ecu || session.options().allEcus;
    return wish;
}

} // namespace

LiveRun::LiveRun(CommandSession& session, LiveOptions const& options, LiveCsv* csv)
    : m_session(session), m_options(options), m_csv(csv)
{
    std::optional<LiveLayout> const layout = keptLayout();
    try {
        m_choice =
            std::make_unique<LiveChoice>(session, wishOf(session, options), layout ? layout->sensors : options.sensors);
    } catch (Error const&) {
        if (!layout) {
            throw;
        }
        m_choice = std::make_unique<LiveChoice>(session, wishOf(session, options),
                                                options.sensors); // what it offers has changed
    }
    m_big = !layout || layout->big;
    select();
}

LiveRun::~LiveRun() = default;

bool LiveRun::wantsScreen() const
{
    bool const csvOnly = m_csv != nullptr && m_csv->toStandardOutput();
    return !m_session.options().json && !csvOnly && Terminal::isUsable();
}

void LiveRun::openScreen()
{
    bool const coloured = outputStyle(m_session.options()).isColoured();
    m_terminal = Terminal::open(coloured);
    if (m_terminal == nullptr) {
        tell("Nothing is known of this kind of terminal, so values come in lines\n");
        return;
    }
    ILiveHost& host = *this;
    m_panel = std::make_unique<LivePanel>(host, *m_terminal, coloured);
    m_panel->setBig(m_big);
}

// Who names sensors wants these; a recording has the columns that it is given.
std::optional<LiveLayout> LiveRun::keptLayout()
{
    if (!wantsScreen() || m_csv != nullptr || !m_options.sensors.empty()) {
        return std::nullopt;
    }
    return LiveLayouts(m_session.settingsFile()).load(vehicle());
}

std::string const& LiveRun::vehicle()
{
    if (m_vehicle.empty()) {
        m_vehicle = layoutKey(m_session);
    }
    return m_vehicle;
}

void LiveRun::select()
{
    m_table.select(m_choice->parameters());
    SensorLimits const limits(m_session.settingsFile().string());
    m_table.setLimits([&limits](LiveRow const& row) { return limitOfRow(limits, row); });
    if (m_panel != nullptr) {
        m_panel->refresh();
    }
}

// Afresh, with other sensors, other units or empty statistics. The poller is gone before the next one begins.
void LiveRun::start()
{
    m_feed.reset();
    select();
    m_feed = m_choice->feed();
}

void LiveRun::run()
{
    if (wantsScreen()) {
        openScreen();
    }
    m_start = Clock::now();
    m_lastReading = m_start;
    if (m_csv != nullptr) {
        m_csv->begin(m_table, m_start, std::chrono::system_clock::now());
    }
    if (m_options.fast && m_panel != nullptr) {
        m_panel->tell(fastWarning);
    } else if (m_options.fast && !m_session.options().quiet) {
        tell(std::string(fastWarning) + "\n");
    }
    m_feed = m_choice->feed();
    try {
        while (!isDone()) {
            runOnce();
        }
    } catch (Error const&) {
        finish();
        throw;
    }
    finish();
}

// However it ends, what was read is kept: the last row of the recording, and the table below the user's prompt.
void LiveRun::finish()
{
    if (m_csv != nullptr) {
        m_csv->finish(m_table, Clock::now());
    }
    m_record.reset();
    if (m_terminal != nullptr) {
        bool const changed = m_panel->big() != m_big;
        m_big = m_panel->big();
        m_panel.reset();
        m_terminal.reset();
        writeOutput(wholeTable());
        if (changed) {
            keepLayout();
        }
    }
    if (m_session.options().verbose) {
        tellRate();
    }
}

std::vector<std::string> LiveRun::silentSensors() const
{
    std::vector<std::string> names;
    for (LiveRow const& row : m_table.rows()) {
        if (row.updated == LiveTime()) {
            names.push_back(row.name);
        }
    }
    return names;
}

bool LiveRun::isDone() const
{
    bool const counted = m_options.count > 0 && m_table.rounds() >= m_options.count;
    bool const expired =
        m_options.duration > 0.0 && Clock::now() - m_start >= std::chrono::duration<double>(m_options.duration);
    return m_quit || m_readerGone || counted || expired;
}

void LiveRun::runOnce()
{
    LiveTime const limit = Clock::now() + step;
    m_session.loop().runUntil([&] { return m_feed->hasNew() || m_session.interrupted() || Clock::now() >= limit; },
                              limit);
    m_session.check();
    takeReadings();
    LiveTime const now = Clock::now();
    m_table.expire(now);
    watchSilence(now);
    watchRates(now);
    if (m_csv != nullptr && !m_csv->update(m_table, now)) {
        m_readerGone = true;
    }
    if (m_panel != nullptr) {
        m_panel->step(now);
    }
}

void LiveRun::takeReadings()
{
    for (PollResult const& result : m_feed->take()) {
        if (!isDone()) {
            take(result);
        }
    }
}

void LiveRun::take(PollResult const& result)
{
    bool const begins = m_table.beginsRound(result.id, result.module);
    LiveTime const now = Clock::now();
    m_lastReading = now;
    m_silenceTold = false;
    if (m_options.count > 0 && m_table.rounds() + (begins ? 1 : 0) >= m_options.count) {
        m_quit = true;
        return;
    }
    m_table.update(result.id, result.values, now, result.module);
    for (Reading const& reading : result.readings) {
        if (m_record != nullptr) {
            m_record->take(reading);
        }
        if (m_performance != nullptr) {
            m_performance->take(reading);
        }
    }
    if (m_csv != nullptr && !m_csv->update(m_table, now)) {
        m_readerGone = true;
    }
    print(result);
}

void LiveRun::print(PollResult const& result)
{
    if (m_terminal != nullptr || (m_csv != nullptr && m_csv->toStandardOutput())) {
        return;
    }
    std::string text;
    std::string const time =
        isoTime(result.readings.empty() ? std::chrono::system_clock::now() : result.readings.front().time);
    for (LiveRow const* row : m_table.rowsOf(result.id, result.module)) {
        text += m_session.options().json ? toJsonLine(*row, time) : toLine(*row);
    }
    m_readerGone = m_readerGone || !writeOutput(text);
}

} // namespace velmora::cli
