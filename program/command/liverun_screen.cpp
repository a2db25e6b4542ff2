#include "program/command/liverun.h"
#include "program/view/livebig.h"
#include "program/view/ratetext.h"
#include "program/view/style.h"

#include <obd/iecu.h>
#include <obd/ivelmorasettings.h>

#include <fmt/format.h>

#include <algorithm>
#include <set>

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
        m_quit = true;
        break;
    case 'r':
        start(m_choices);
        break;
    case 'u':
        switchUnits();
        break;
    case 'b':
        m_big = !m_big;
        break;
    case 'h':
    case static_cast<int>(Key::Space):
        m_hold = !m_hold;
        break;
    case 's':
        openPicker();
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
            pick(m_picker->chosen());
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

void LiveRun::openPicker()
{
    std::shared_ptr<obd::IEcu> const ecu = m_choices.front().ecu;
    SensorIds ids;
    for (PollChoice const& choice : m_choices) {
        if (choice.ecu != ecu) {
            m_note = "Sensors of several modules are chosen on the command line";
            return;
        }
        ids.push_back(choice.id);
    }
    if (m_csv != nullptr) {
        m_note = "The recording's columns are fixed";
        return;
    }
    for (ModuleOffer const& offer : m_offers) {
        if (offer.ecu == ecu) {
            m_picker = std::make_unique<SensorPicker>(offer.sensors, ids);
        }
    }
}

// Those that were there keep their rate.
void LiveRun::pick(SensorIds const& ids)
{
    std::vector<PollChoice> choices;
    for (obd::ParameterIdentifier::Id const id : ids) {
        auto const old =
            std::find_if(m_choices.begin(), m_choices.end(), [id](PollChoice const& each) { return each.id == id; });
        choices.push_back(old != m_choices.end() ? *old : PollChoice{m_choices.front().ecu, id, m_options.hertz});
    }
    start(choices);
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
    start(m_choices);
}

int LiveRun::page() const
{
    FrameStyle rest = style();
    big(rest);
    return static_cast<int>(roomForRows(rest));
}

void LiveRun::scroll(int lines)
{
    auto const room = static_cast<std::size_t>(page());
    std::size_t const last = m_table.rows().size() > room ? m_table.rows().size() - room : 0;
    std::ptrdiff_t const wanted = static_cast<std::ptrdiff_t>(m_firstRow) + lines;
    m_firstRow = std::min(static_cast<std::size_t>(std::max(wanted, std::ptrdiff_t{0})), last);
}

FrameStyle LiveRun::style() const
{
    Terminal::Size const size = m_terminal->size();
    return {size.columns, size.rows, outputStyle(m_session.options()).isColoured(), !Terminal::speaksUtf8()};
}

void LiveRun::draw(LiveTime now)
{
    if (now - m_lastDraw < drawStep) {
        return;
    }
    if (m_hold && m_picker == nullptr && m_lastDraw != LiveTime()) {
        return;
    }
    m_lastDraw = now;
    m_terminal->draw(frame(style()));
}

// What stands above the table, which has the rest.
std::string LiveRun::big(FrameStyle& style) const
{
    std::string const text = m_big ? drawBig(m_table.rows(), style) : std::string();
    style.rows -= static_cast<std::size_t>(std::count(text.begin(), text.end(), '\n'));
    return text;
}

std::string LiveRun::frame(FrameStyle const& style) const
{
    std::string text;
    if (m_picker != nullptr) {
        text = m_picker->draw(style);
    } else {
        FrameStyle rest = style;
        text = big(rest);
        text += drawTable(m_table.rows(), m_firstRow, title(), status(), rest);
    }
    return style.ascii ? toAscii(text) : text;
}

std::string LiveRun::title() const
{
    std::string modules;
    std::set<unsigned int> told;
    for (PollChoice const& choice : m_choices) {
        if (told.insert(choice.ecu->id()).second) {
            modules += fmt::format("{}{:X} {}", modules.empty() ? "" : " and ", choice.ecu->id(), choice.ecu->name());
        }
    }
    double const elapsed = std::chrono::duration<double>(std::chrono::steady_clock::now() - m_start).count();
    std::string const rates = reachedRates(m_feed->rates());
    return fmt::format("{}, {} {}, {:.0f} s, {:.1f} readings/s{}{}", m_session.port(),
                       told.size() == 1 ? "module" : "modules", modules, elapsed, rate(), rates.empty() ? "" : ", ",
                       rates);
}

std::string LiveRun::status() const
{
    if (!m_note.empty()) {
        return m_note;
    }
    std::string const keys = m_csv != nullptr ? "q quit  r reset  recording to " + m_csv->file()
                                              : "q quit  s sensors  u units  r reset  b big  h hold";
    if (m_hold) {
        return "Held: h goes on  " + keys;
    }
    return m_silenceTold ? "No answer from the vehicle  " + keys : keys;
}

} // namespace velmora::cli
