// What a run shows on a screen, and what its keys do.
#include "program/live/liverun.h"
#include "program/live/userfiles.h"
#include "program/terminal/output.h"
#include "program/view/live/livescreen.h"
#include "program/view/timetext.h"

#include <obd/ivelmorasettings.h>
#include <velmora/error.h>

#include <fmt/format.h>

#include <utility>

namespace velmora::cli {

// Where rates were asked for, they stand before what a narrow screen may cut.
std::string LiveRun::title() const
{
    double const elapsed = std::chrono::duration<double>(std::chrono::steady_clock::now() - m_start).count();
    std::string const rates = m_feed->reached();
    std::string const pace = fmt::format("{:.0f} s, {:.1f} readings/s", elapsed, rate());
    return rates.empty() ? fmt::format("{}, {}, {}", m_session.port(), m_choice->modulesText(), pace)
                         : fmt::format("{}, {}, {}, {}", m_session.port(), pace, rates, m_choice->modulesText());
}

std::string LiveRun::state() const
{
    if (m_silenceTold) {
        return "No answer from the vehicle";
    }
    if (m_record != nullptr) {
        std::string const trouble = m_record->trouble();
        return trouble.empty() ? "Recording" : "Recording fails: " + trouble;
    }
    return m_csv != nullptr ? "Recording to " + m_csv->file() : std::string();
}

std::string LiveRun::page(std::string const& note, FrameStyle const& style) const
{
    return m_performance != nullptr ? m_performance->draw(note, style) : std::string();
}

SensorPicker LiveRun::picker() const
{
    if (m_csv != nullptr) {
        throw Error(ErrorKind::WrongUse, "The recording's columns are fixed");
    }
    if (m_performance != nullptr) {
        throw Error(ErrorKind::WrongUse, "Speed and engine speed alone are read here; p goes back to the values");
    }
    std::vector<int> const picked = m_choice->picked();
    return {m_choice->offers(), picked};
}

void LiveRun::pick(std::vector<int> const& ids)
{
    m_choice->pick(ids);
    start();
    m_big = m_panel->big();
    keepLayout();
}

std::optional<std::string> LiveRun::handle(Key key)
{
    switch (static_cast<int>(key)) {
    case 'q':
    case 'Q':
        m_quit = true;
        return "";
    case 'r':
        start();
        return "The statistics begin anew";
    case 'u':
        switchUnits();
        return "";
    case 'w':
        return switchRecording();
    case 'n':
        return snapshot();
    case 'p':
        return switchPerformance();
    case 'e':
        return m_performance != nullptr ? std::optional(m_performance->save()) : std::nullopt;
    default:
        return std::nullopt;
    }
}

std::vector<KeyHelp> LiveRun::keys() const
{
    return {
        {"u", "metric and imperial units"},         {"r", "reset minimum, mean, maximum and trend"},
        {"w", "write a recording, and end it"},     {"n", "note all values of now in a file"},
        {"p", "performance: time a run, and back"}, {"e", "export the run, on the page of performance"},
    };
}

void LiveRun::switchUnits()
{
    if (m_csv != nullptr || m_record != nullptr) {
        throw Error(ErrorKind::WrongUse, "The recording's units are fixed");
    }
    obd::IVelmoraSettings* const settings = m_session.obd().getSettings();
    bool const metric = settings->unitSystem() == obd::UnitSystem::Metric;
    settings->setUnitSystem(metric ? obd::UnitSystem::Imperial : obd::UnitSystem::Metric);
    start();
}

std::string LiveRun::switchRecording()
{
    if (m_record != nullptr) {
        std::string const file = m_record->file().string();
        m_record.reset();
        return "Recorded to " + file;
    }
    auto const file = newUserFile("live", ".db", std::chrono::system_clock::now());
    auto record = std::make_unique<LiveRecord>(file, vehicle());
    if (std::string const trouble = record->trouble(); !trouble.empty()) {
        throw Error(ErrorKind::Failed, trouble);
    }
    m_record = std::move(record);
    return "Recording to " + file.string();
}

// All else is left out for as long, so that the speed comes as often as it can.
std::string LiveRun::switchPerformance()
{
    if (m_performance != nullptr) {
        m_performance.reset();
        m_choice->restore();
        start();
        return {};
    }
    if (m_csv != nullptr) {
        throw Error(ErrorKind::WrongUse, "The recording's columns are fixed");
    }
    std::shared_ptr<obd::IEcu> const module = m_choice->chooseForRuns();
    m_performance = std::make_unique<PerformancePage>(module, *m_session.obd().getSettings());
    start();
    return {};
}

std::string LiveRun::wholeTable() const
{
    FrameStyle whole;
    whole.columns = 200;
    whole.rows = m_table.rows().size() + whole.rows;
    whole.ascii = !Terminal::speaksUtf8();
    whole.now = std::chrono::steady_clock::now();
    std::string const table = drawTable(m_table.rows(), 0, title(), {}, whole);
    return whole.ascii ? toAscii(table) : table;
}

std::string LiveRun::snapshot() const
{
    std::string const text = isoTime(std::chrono::system_clock::now()) + "\n" + wholeTable();
    return "Noted in " + saveUserText("snapshot", ".txt", text).string();
}

void LiveRun::keepLayout()
{
    try {
        LiveLayouts(m_session.settingsFile()).save(vehicle(), {m_choice->words(), m_big});
    } catch (Error const& error) {
        if (m_panel != nullptr) {
            m_panel->tell(error.what());
        } else {
            tell(std::string(error.what()) + "\n");
        }
    }
}

} // namespace velmora::cli
