// What a run shows on a screen, and what its keys do.
#include "program/live/liverun.h"
#include "program/live/userfiles.h"
#include "program/terminal/output.h"
#include "program/view/live/livescreen.h"
#include "program/view/timetext.h"

#include <velmora/error.h>

#include <fmt/format.h>

#include <utility>

namespace velmora::cli {

// Where rates were asked for, they stand before what a narrow screen may cut.
std::string LiveRun::title() const
{
    double const elapsed = std::chrono::duration<double>(std::chrono::steady_clock::now() - m_start).count();
    std::string const rates = m_reader->reachedRates();
    std::string const pace = fmt::format("{:.0f} s, {:.1f} readings/s", elapsed, rate());
    return rates.empty() ? fmt::format("{}, {}, {}", m_port, m_modules, pace)
                         : fmt::format("{}, {}, {}, {}", m_port, pace, rates, m_modules);
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
    std::vector<int> const picked = m_reader->picked();
    return {m_reader->offers(), picked};
}

void LiveRun::pick(std::vector<int> const& ids)
{
    m_reader->pick(ids);
    select();
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
        m_reader->restart();
        select();
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
    m_reader->setMetric(m_reader->units() != Units::Metric);
    select();
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
        m_reader->endRuns();
        select();
        return {};
    }
    if (m_csv != nullptr) {
        throw Error(ErrorKind::WrongUse, "The recording's columns are fixed");
    }
    m_reader->beginRuns();
    m_performance = std::make_unique<PerformancePage>(*m_reader);
    select();
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
        LiveLayouts(settingsFile()).save(vehicle(), {m_reader->words(), m_big});
    } catch (Error const& error) {
        if (error.kind() == ErrorKind::Interrupted) {
            return; // who is in a hurry to leave wants no word of it
        }
        if (m_panel != nullptr) {
            m_panel->tell(error.what());
        } else {
            tell(std::string(error.what()) + "\n");
        }
    }
}

} // namespace velmora::cli
