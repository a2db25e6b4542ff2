#pragma once

#include "program/terminal/keyinput.h"

#include <cstddef>
#include <memory>
#include <optional>
#include <string>
#include <termios.h>
#include <utility>

namespace velmora::cli {

// The page of a terminal by ncurses, which this class hides: its names are macros. One at a time, for one thread.
class TerminalScreen
{
public:
    // kind: as TERM names it. It may not be known, and is not open then.
    TerminalScreen(std::string const& kind, bool coloured);
    ~TerminalScreen();
    TerminalScreen(TerminalScreen const&) = delete;
    TerminalScreen& operator=(TerminalScreen const&) = delete;

    bool isOpen() const { return m_page != nullptr; }

    // What brings the terminal back, for those who can do no more than write.
    std::string leaveText() const;
    // The terminal's state from before; null if it could not be told.
    termios const* before() const { return m_hasBefore ? &m_before : nullptr; }

    std::pair<std::size_t, std::size_t> size() const; // columns, rows
    void draw(std::string const& frame);
    std::optional<Key> readKey();

private:
    struct Page;

    termios m_before{};
    bool m_hasBefore;
    bool m_coloured;
    bool m_hasKeys;
    std::unique_ptr<Page> m_page; // null if it is not open
};

} // namespace velmora::cli
