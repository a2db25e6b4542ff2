#include "program/command/liverun.h"
#include "program/view/style.h"

#include <obd/iecu.h>
#include <obd/ivelmorasettings.h>

#include <fmt/format.h>

#include <algorithm>

namespace velmora::cli {

namespace {

constexpr std::chrono::milliseconds drawStep{200};

} // namespace

void LiveRun::handleKeys()
{
    while (std::optional<Key> const key = m_terminal->readKey()) {
        m_lastDraw = {};
        m_note.clear();
        if (m_picker != nullptr) {
            handlePickerKey(*key);
        } else {
            handleKey(*key);
        }
    }
}

void LiveRun::handleKey(Key key)
{
    switch (static_cast<int>(key)) {
    case 'q':
    case 'Q':
    case static_cast<int>(Key::Escape):
        m_quit = true;
        break;
    case 'r':
        restart(m_ids);
        break;
    case 'u':
        switchUnits();
        break;
    case 's':
        if (m_csv != nullptr) {
            m_note = "The recording's columns are fixed";
        } else {
            m_picker = std::make_unique<SensorPicker>(offeredSensors(*m_service), m_ids);
        }
        break;
    case static_cast<int>(Key::Up):
        scroll(-1);
        break;
    case static_cast<int>(Key::Down):
        scroll(1);
        break;
    case static_cast<int>(Key::PageUp):
        scroll(-page());
        break;
    case static_cast<int>(Key::PageDown):
        scroll(page());
        break;
    default:
        break;
    }
}

void LiveRun::handlePickerKey(Key key)
{
    switch (static_cast<int>(key)) {
    case static_cast<int>(Key::Up):
    case 'k':
        m_picker->move(-1);
        break;
    case static_cast<int>(Key::Down):
    case 'j':
        m_picker->move(1);
        break;
    case static_cast<int>(Key::PageUp):
        m_picker->move(-10);
        break;
    case static_cast<int>(Key::PageDown):
        m_picker->move(10);
        break;
    case static_cast<int>(Key::Space):
        m_picker->toggle();
        break;
    case static_cast<int>(Key::Enter):
        if (!m_picker->chosen().empty()) {
            restart(m_picker->chosen());
        }
        m_picker.reset();
        break;
    case static_cast<int>(Key::Escape):
    case 'q':
        m_picker.reset();
        break;
    default:
        break;
    }
}

void LiveRun::switchUnits()
{
    if (m_csv != nullptr) {
        m_note = "The recording's units are fixed";
        return;
    }
    obd::IVelmoraSettings* const settings = m_session.obd().getSettings();
    bool const metric = settings->unitSystem() == obd::UnitSystem::Metric;
    settings->setUnitSystem(metric ? obd::UnitSystem::Imperial : obd::UnitSystem::Metric);
}

int LiveRun::page() const
{
    return static_cast<int>(roomForRows(style()));
}

void LiveRun::scroll(int lines)
{
    std::size_t const room = roomForRows(style());
    std::size_t const last = m_table.rows().size() > room ? m_table.rows().size() - room : 0;
    std::ptrdiff_t const wanted = static_cast<std::ptrdiff_t>(m_firstRow) + lines;
    m_firstRow = std::min(static_cast<std::size_t>(std::max(wanted, std::ptrdiff_t{0})), last);
}

FrameStyle LiveRun::style() const
{
    Terminal::Size const size = m_terminal->size();
    return {size.columns, size.rows, outputStyle(m_session.options()).isColoured()};
}

void LiveRun::draw(LiveTime now)
{
    if (now - m_lastDraw < drawStep) {
        return;
    }
    m_lastDraw = now;
    m_terminal->draw(frame(style()));
}

std::string LiveRun::frame(FrameStyle const& style) const
{
    return m_picker != nullptr ? m_picker->draw(style)
                               : drawTable(m_table.rows(), m_firstRow, title(), status(), style);
}

std::string LiveRun::title() const
{
    std::shared_ptr<obd::IEcu> const ecu = m_session.obd().getEcuManager()->getCurrentEcu();
    double const elapsed = std::chrono::duration<double>(std::chrono::steady_clock::now() - m_start).count();
    return fmt::format("{}, module {}, {:.0f} s, {:.1f} readings/s, {:.1f} % of the time lost", m_session.port(),
                       ecu != nullptr ? fmt::format("{:X} {}", ecu->id(), ecu->name()) : "-", elapsed, rate(),
                       100.0 * m_tap.meter().lostShare());
}

std::string LiveRun::status() const
{
    if (!m_note.empty()) {
        return m_note;
    }
    std::string const keys =
        m_csv != nullptr ? "q quit  r reset  recording to " + m_csv->file() : "q quit  s sensors  u units  r reset";
    return m_silenceTold ? "No answer from the vehicle  " + keys : keys;
}

} // namespace velmora::cli
