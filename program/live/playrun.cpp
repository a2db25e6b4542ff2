#include "program/live/playrun.h"

#include "common/text/text.h"
#include "program/live/livepanel.h"
#include "program/terminal/interrupt.h"
#include "program/terminal/output.h"
#include "program/terminal/terminal.h"
#include "program/view/live/livelines.h"
#include "program/view/live/timebar.h"
#include "program/view/style.h"
#include "program/view/timetext.h"

#include <velmora/error.h>
#include <velmora/limits.h>

#include <fmt/format.h>

#include <algorithm>
#include <thread>

namespace velmora::cli {

namespace {

using PlayClock = std::chrono::steady_clock;

constexpr std::chrono::milliseconds playStep{50};
constexpr std::int64_t jumpMillis = 10000;
constexpr std::size_t timeBarWidth = 20;

bool means(std::string const& word, SensorEntry const& sensor)
{
    std::string const wanted = toUpper(word);
    return toUpper(sensor.sensor) == wanted || toUpper(sensor.name).find(wanted) != std::string::npos;
}

} // namespace

PlayRun::PlayRun(GlobalOptions const& options, std::filesystem::path file, Recording recording,
                 std::vector<std::string> const& sensors, double speed)
    : m_options(options), m_file(std::move(file)), m_recording(std::move(recording)), m_player(m_recording),
      m_table(m_recording)
{
    choose(sensors);
    applyLimits();
    m_player.setSpeed(speed);
}

void PlayRun::choose(std::vector<std::string> const& words)
{
    std::vector<std::size_t> chosen;
    for (std::string const& word : words) {
        bool known = false;
        for (std::size_t i = 0; i < m_recording.sensors.size(); ++i) {
            if (means(word, m_recording.sensors[i].about)) {
                known = true;
                if (std::ranges::count(chosen, i) == 0) {
                    chosen.push_back(i);
                }
            }
        }
        if (!known) {
            throw Error(ErrorKind::NotSupported, "The recording has no sensor \"" + word + "\"",
                        {"without any, all of it is played"});
        }
    }
    if (!chosen.empty()) {
        m_table.select(chosen);
    }
}

// Those of units that are not the sensor's own metric one can't be told here, so limits count for metric recordings.
void PlayRun::applyLimits()
{
    SensorLimits const limits(m_options.settingsFile);
    m_table.table().setLimits([&limits](LiveRow const& row) {
        bool const imperial = row.unit == "mph" || row.unit == "°F" || row.unit == "psi" || row.unit == "mi" ||
                              row.unit == "hp" || row.unit == "lb/min" || row.unit.starts_with("in");
        return imperial ? SensorLimit() : limits.of(row.key);
    });
}

void PlayRun::run()
{
    if (m_recording.cut) {
        tell("The recording holds more than can be played; its end is left out\n");
    }
    if (m_options.json || !Terminal::isUsable()) {
        printAll();
    } else {
        runScreen();
    }
}

void PlayRun::printAll()
{
    bool open = true;
    m_player.seek(m_recording.end, [&](std::size_t sensor, RecordedValue const& value) {
        LiveRow const* const row = open && !Interrupt::instance().raised() ? m_table.take(sensor, value) : nullptr;
        if (row != nullptr) {
            open = writeOutput(m_options.json ? toJsonLine(*row, clockText(value.time)) : toLine(*row));
        }
    });
}

void PlayRun::runScreen()
{
    bool const coloured = outputStyle(m_options).isColoured();
    std::unique_ptr<Terminal> const terminal = Terminal::open(coloured);
    if (terminal == nullptr) {
        printAll();
        return;
    }
    ILiveHost& host = *this;
    LivePanel panel(host, *terminal, coloured);
    auto const sink = [this](std::size_t sensor, RecordedValue const& value) { take(sensor, value); };
    PlayClock::time_point last = PlayClock::now();
    while (!m_quit && !Interrupt::instance().raised()) {
        PlayClock::time_point const now = PlayClock::now();
        m_player.advance(std::chrono::duration<double>(now - last).count(), sink);
        last = now;
        m_table.expire(m_player.position());
        panel.step(now);
        std::this_thread::sleep_for(playStep);
    }
}

// Statistics count from the recording's beginning, wherever it is entered.
void PlayRun::jump(std::int64_t to)
{
    m_table.restart();
    applyLimits();
    m_player.seek(to, [this](std::size_t sensor, RecordedValue const& value) { take(sensor, value); });
}

std::string PlayRun::clockText(std::int64_t time) const
{
    return m_recording.dated ? isoTimeOf(time) : std::string();
}

std::string PlayRun::title() const
{
    std::string const clock = clockText(m_player.position());
    return fmt::format("{}, {} sensors{}", m_file.filename().string(), m_recording.sensors.size(),
                       clock.empty() ? "" : ", " + clock);
}

std::string PlayRun::state() const
{
    return fmt::format("{}{} {}x", m_player.isPaused() ? "Paused " : "",
                       timeBar(m_player.position(), m_recording.begin, m_recording.end, timeBarWidth),
                       m_player.speed());
}

std::string PlayRun::page(std::string const& /*note*/, FrameStyle const& /*style*/) const
{
    return {};
}

SensorPicker PlayRun::picker() const
{
    std::vector<LiveOffer> offered;
    std::vector<int> chosen;
    for (std::size_t i = 0; i < m_recording.sensors.size(); ++i) {
        offered.push_back({static_cast<int>(i), m_recording.sensors[i].about.name});
    }
    for (std::size_t const each : m_table.selected()) {
        chosen.push_back(static_cast<int>(each));
    }
    return {offered, chosen};
}

void PlayRun::pick(std::vector<int> const& ids)
{
    std::vector<std::size_t> sensors;
    for (int const id : ids) {
        sensors.push_back(static_cast<std::size_t>(id));
    }
    m_table.select(sensors);
    jump(m_player.position());
}

std::optional<std::string> PlayRun::handle(Key key)
{
    switch (static_cast<int>(key)) {
    case 'q':
    case 'Q':
        m_quit = true;
        return "";
    case static_cast<int>(Key::Space):
        m_player.setPaused(!m_player.isPaused());
        return "";
    case '+':
        m_player.setSpeed(m_player.speed() * 2.0);
        return "";
    case '-':
        m_player.setSpeed(m_player.speed() / 2.0);
        return "";
    case static_cast<int>(Key::Left):
        jump(m_player.position() - jumpMillis);
        return "";
    case static_cast<int>(Key::Right):
        jump(m_player.position() + jumpMillis);
        return "";
    case static_cast<int>(Key::Home):
        jump(m_recording.begin);
        return "";
    case static_cast<int>(Key::End):
        jump(m_recording.end);
        return "";
    case 'u':
        return "The units are those of the recording";
    default:
        return std::nullopt;
    }
}

std::vector<KeyHelp> PlayRun::keys() const
{
    return {
        {"space", "pause, and go on"},
        {"+ -", "twice and half the speed"},
        {"left, right", "ten seconds back and on"},
        {"home, end", "to the beginning and the end"},
    };
}

} // namespace velmora::cli
