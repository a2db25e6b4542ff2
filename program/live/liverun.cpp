#include "program/live/liverun.h"

#include "program/terminal/output.h"
#include "program/view/live/livelines.h"
#include "program/view/style.h"
#include "program/view/timetext.h"
#include "program/view/unitpairs.h"

#include <velmora/error.h>
#include <velmora/limits.h>
#include <velmora/settingsfile.h>

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

} // namespace

LiveRun::LiveRun(CommandCar& car, LiveOptions const& options, LiveCsv* csv)
    : m_car(car), m_port(car.port()), m_options(options), m_csv(csv)
{
    std::optional<LiveLayout> const layout = keptLayout();
    try {
        m_reader = car.live(wish(layout ? layout->sensors : options.sensors));
    } catch (Error const& error) {
        if (!layout || error.kind() == ErrorKind::Interrupted) {
            throw;
        }
        m_reader = car.live(wish(options.sensors)); // what it offers has changed
    }
    m_big = !layout || layout->big;
    select();
}

LiveRun::~LiveRun() = default;

LiveWish LiveRun::wish(std::vector<std::string> const& sensors) const
{
    LiveWish wish;
    wish.sensors = sensors;
    wish.rate = m_options.rate;
    wish.fast = m_options.fast;
    wish.pidsPerRequest = m_options.pidsPerRequest;
    wish.allModules = m_car.options().module || m_car.options().allEcus;
    return wish;
}

std::string LiveRun::settingsFile() const
{
    return SettingsFile(m_car.options().settingsFile).path();
}

bool LiveRun::wantsScreen() const
{
    bool const csvOnly = m_csv != nullptr && m_csv->toStandardOutput();
    return !m_car.options().json && !csvOnly && Terminal::isUsable();
}

void LiveRun::openScreen()
{
    bool const coloured = outputStyle(m_car.options()).isColoured();
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
    return LiveLayouts(settingsFile()).load(vehicle());
}

std::string const& LiveRun::vehicle()
{
    if (m_vehicle.empty()) {
        m_vehicle = m_car.vehicleKey();
    }
    return m_vehicle;
}

void LiveRun::select()
{
    m_modules = m_reader->modulesText();
    m_table.select(m_reader->parameters());
    SensorLimits const limits(m_car.options().settingsFile);
    m_table.setLimits([&limits](LiveRow const& row) { return limitOfRow(limits, row); });
    if (m_panel != nullptr) {
        m_panel->refresh();
    }
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
    } else if (m_options.fast && !m_car.options().quiet) {
        tell(std::string(fastWarning) + "\n");
    }
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
    if (m_car.options().verbose) {
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
    m_reader->wait(step);
    m_car.check();
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
    for (LiveTurn const& turn : m_reader->take()) {
        if (!isDone()) {
            take(turn);
        }
    }
}

void LiveRun::take(LiveTurn const& turn)
{
    bool const begins = m_table.beginsRound(turn.id, turn.module);
    LiveTime const now = Clock::now();
    m_lastReading = now;
    m_silenceTold = false;
    if (m_options.count > 0 && m_table.rounds() + (begins ? 1 : 0) >= m_options.count) {
        m_quit = true;
        return;
    }
    m_table.update(turn.id, turn.values, now, turn.module);
    for (Reading const& reading : turn.readings) {
        if (m_record != nullptr) {
            m_record->take(reading);
        }
    }
    if (m_csv != nullptr && !m_csv->update(m_table, now)) {
        m_readerGone = true;
    }
    print(turn);
}

void LiveRun::print(LiveTurn const& turn)
{
    if (m_terminal != nullptr || (m_csv != nullptr && m_csv->toStandardOutput())) {
        return;
    }
    std::string text;
    std::string const time =
        isoTime(turn.readings.empty() ? std::chrono::system_clock::now() : turn.readings.front().time);
    for (LiveRow const* row : m_table.rowsOf(turn.id, turn.module)) {
        text += m_car.options().json ? toJsonLine(*row, time) : toLine(*row);
    }
    m_readerGone = m_readerGone || !writeOutput(text);
}

} // namespace velmora::cli
