#include "program/terminal/promptreader.h"

#include "program/terminal/interrupt.h"
#include "program/terminal/output.h"

#include <velmora/error.h>

#include <fmt/format.h>

#include <cstdlib>
#include <cstring>
#include <unistd.h>
#include <utility>

namespace velmora::cli {

bool PromptReader::canRedraw()
{
    char const* const kind = std::getenv("TERM");
    return ::isatty(STDERR_FILENO) != 0 && kind != nullptr && *kind != '\0' && std::strcmp(kind, "dumb") != 0;
}

bool PromptReader::isUsable()
{
    return ::isatty(STDIN_FILENO) != 0 && canRedraw();
}

PromptReader::PromptReader(std::function<void()> check) : m_check(std::move(check))
{
    Interrupt::instance().setLastAct([this] { m_keys.restore(); });
}

PromptReader::~PromptReader()
{
    Interrupt::instance().setLastAct(nullptr);
}

bool PromptReader::read(std::string& line)
{
    draw();
    try {
        LineEditor::State const state = typeOn();
        tell("\n");
        line = m_editor.take();
        return state == LineEditor::State::Entered;
    } catch (Error const&) {
        tell("\n"); // what is told next has a line of its own
        throw;
    }
}

LineEditor::State PromptReader::typeOn()
{
    constexpr std::chrono::milliseconds step{100};
    while (true) {
        m_check();
        std::optional<Key> const key = m_keys.read(step);
        LineEditor::State const state = key ? m_editor.press(*key) : LineEditor::State::Typing;
        if (m_keys.ended()) {
            return LineEditor::State::Ended;
        }
        if (state != LineEditor::State::Typing) {
            return state;
        }
        if (key) {
            draw();
        }
    }
}

void PromptReader::draw() const
{
    std::size_t const behind = m_editor.text().size() - m_editor.cursor();
    tell(fmt::format("\r> {}\033[K{}", m_editor.text(), behind > 0 ? fmt::format("\033[{}D", behind) : ""));
}

} // namespace velmora::cli
