#include "program/live/livepanel.h"

#include "program/view/live/livebig.h"
#include "program/view/live/livehelp.h"
#include "program/view/live/livescreen.h"

#include <velmora/error.h>

#include <algorithm>

namespace velmora::cli {

namespace {

constexpr std::chrono::milliseconds drawStep{200};

constexpr int code(Key key)
{
    return static_cast<int>(key);
}

} // namespace

LivePanel::LivePanel(ILiveHost& host, Terminal& terminal, bool coloured)
    : m_host(host), m_terminal(terminal), m_coloured(coloured)
{}

void LivePanel::step(LiveTime now)
{
    while (std::optional<Key> const key = m_terminal.readKey()) {
        m_lastDraw = {};
        m_note.clear();
        try {
            handle(*key);
        } catch (Error const& error) {
            m_note = error.what();
        }
    }
    draw(now);
}

void LivePanel::refresh()
{
    m_firstRow = 0;
    m_lastDraw = {};
}

void LivePanel::handle(Key key)
{
    if (m_picker != nullptr) {
        handlePicker(key);
    } else if (m_help) {
        m_help = false;
    } else if (std::optional<std::string> const told = m_host.handle(key)) {
        m_note = *told;
    } else {
        handleOwn(key);
    }
}

void LivePanel::handleOwn(Key key)
{
    switch (code(key)) {
    case 'b':
        m_big = !m_big;
        break;
    case 'h':
    case code(Key::Space):
        m_hold = !m_hold;
        break;
    case '?':
        m_help = true;
        break;
    case 's':
        openPicker();
        break;
    case code(Key::Up):
        scroll(-1);
        break;
    case code(Key::Down):
        scroll(1);
        break;
    case code(Key::PageUp):
        scroll(-pageLength());
        break;
    case code(Key::PageDown):
        scroll(pageLength());
        break;
    default:
        break;
    }
}

void LivePanel::openPicker()
{
    m_picker = std::make_unique<SensorPicker>(m_host.picker());
}

void LivePanel::handlePicker(Key key)
{
    switch (code(key)) {
    case code(Key::Up):
    case 'k':
        m_picker->move(-1);
        break;
    case code(Key::Down):
    case 'j':
        m_picker->move(1);
        break;
    case code(Key::PageUp):
        m_picker->move(-10);
        break;
    case code(Key::PageDown):
        m_picker->move(10);
        break;
    case '+':
        m_picker->carry(-1);
        break;
    case '-':
        m_picker->carry(1);
        break;
    case code(Key::Space):
        m_picker->toggle();
        break;
    case code(Key::Enter): {
        std::unique_ptr<SensorPicker> const picker = std::move(m_picker);
        if (!picker->chosen().empty()) {
            m_host.pick(picker->chosen());
        }
        break;
    }
    case code(Key::Escape):
    case 'q':
        m_picker.reset();
        break;
    default:
        break;
    }
}

int LivePanel::pageLength() const
{
    FrameStyle rest = style();
    bigPart(rest);
    return static_cast<int>(roomForRows(rest));
}

void LivePanel::scroll(int lines)
{
    auto const room = static_cast<std::size_t>(pageLength());
    std::size_t const count = m_host.rows().size();
    std::size_t const last = count > room ? count - room : 0;
    std::ptrdiff_t const wanted = static_cast<std::ptrdiff_t>(m_firstRow) + lines;
    m_firstRow = std::min(static_cast<std::size_t>(std::max(wanted, std::ptrdiff_t{0})), last);
}

FrameStyle LivePanel::style() const
{
    Terminal::Size const size = m_terminal.size();
    return {size.columns, size.rows, true, !Terminal::speaksUtf8(), m_coloured, m_host.now()};
}

void LivePanel::draw(LiveTime now)
{
    bool const held = m_hold && !m_help && m_picker == nullptr && m_lastDraw != LiveTime();
    if (now - m_lastDraw < drawStep || held) {
        return;
    }
    m_lastDraw = now;
    m_terminal.draw(frame(style()));
}

// What stands above the table, which has the rest.
std::string LivePanel::bigPart(FrameStyle& style) const
{
    std::string const text = m_big ? drawBig(m_host.rows(), style) : std::string();
    style.rows -= static_cast<std::size_t>(std::count(text.begin(), text.end(), '\n'));
    return text;
}

std::string LivePanel::values(FrameStyle const& style) const
{
    FrameStyle rest = style;
    std::string const text = bigPart(rest);
    return text + drawTable(m_host.rows(), m_firstRow, m_host.title(), status(), rest);
}

std::string LivePanel::frame(FrameStyle const& style) const
{
    std::string text = m_host.page(m_note, style);
    if (m_picker != nullptr) {
        text = m_picker->draw(style);
    } else if (m_help) {
        text = drawHelp(m_host.keys(), style);
    } else if (text.empty()) {
        text = values(style);
    }
    return style.ascii ? toAscii(text) : text;
}

std::string LivePanel::status() const
{
    if (!m_note.empty()) {
        return m_note;
    }
    std::string const state = m_host.state();
    return (m_hold ? "Held: h goes on  " : "") + state + (state.empty() ? "" : "  ") +
           "q quit  ? help  s sensors  u units  b big";
}

} // namespace velmora::cli
