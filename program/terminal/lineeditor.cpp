#include "program/terminal/lineeditor.h"

#include <utility>

namespace velmora::cli {

namespace {

constexpr char controlA = 0x01;
constexpr char controlD = 0x04;
constexpr char controlE = 0x05;
constexpr char backspace = 0x08;
constexpr char controlU = 0x15;
constexpr char rubout = 0x7F;

bool isPrintable(Key key)
{
    return static_cast<int>(key) >= ' ' && static_cast<int>(key) < rubout;
}

} // namespace

LineEditor::State LineEditor::press(Key key)
{
    switch (key) {
    case Key::Up:
        recall(m_entry > 0 ? m_entry - 1 : 0);
        break;
    case Key::Down:
        recall(m_entry + 1);
        break;
    case Key::Left:
        m_cursor -= m_cursor > 0 ? 1 : 0;
        break;
    case Key::Right:
        m_cursor += m_cursor < m_text.size() ? 1 : 0;
        break;
    case Key::Home:
        m_cursor = 0;
        break;
    case Key::End:
        m_cursor = m_text.size();
        break;
    case Key::Delete:
        erase(m_cursor);
        break;
    case Key::Enter:
        return State::Entered;
    default:
        if (isPrintable(key)) {
            insert(static_cast<char>(key));
        } else if (static_cast<int>(key) <= rubout) {
            return control(static_cast<char>(key));
        }
        break;
    }
    return State::Typing;
}

LineEditor::State LineEditor::control(char character)
{
    switch (character) {
    case controlA:
        m_cursor = 0;
        break;
    case controlE:
        m_cursor = m_text.size();
        break;
    case backspace:
    case rubout:
        if (m_cursor > 0) {
            erase(--m_cursor);
        }
        break;
    case controlU:
        m_text.clear();
        m_cursor = 0;
        break;
    case controlD:
        return m_text.empty() ? State::Ended : State::Typing;
    default:
        break;
    }
    return State::Typing;
}

void LineEditor::insert(char character)
{
    m_text.insert(m_cursor, 1, character);
    ++m_cursor;
}

void LineEditor::erase(std::size_t at)
{
    if (at < m_text.size()) {
        m_text.erase(at, 1);
    }
}

void LineEditor::recall(std::size_t entry)
{
    if (entry == m_entry || entry > m_history.size()) {
        return;
    }
    if (m_entry == m_history.size()) {
        m_draft = m_text;
    }
    m_entry = entry;
    m_text = entry < m_history.size() ? m_history[entry] : m_draft;
    m_cursor = m_text.size();
}

std::string LineEditor::take()
{
    if (!m_text.empty() && (m_history.empty() || m_history.back() != m_text)) {
        m_history.push_back(m_text);
    }
    m_entry = m_history.size();
    m_cursor = 0;
    m_draft.clear();
    return std::exchange(m_text, {});
}

} // namespace velmora::cli
