#pragma once

#include "program/terminal/fatalrestore.h"
#include "program/terminal/keyinput.h"

#include <cstddef>
#include <optional>
#include <string>

namespace velmora::cli {

// The screen of a terminal for as long as the object lives: keys come singly and are not shown, frames replace each
// other on a page of their own. However the program ends short of being killed, the terminal is as before. Ctrl-C goes
// on to interrupt; Ctrl-Z does nothing.
class Terminal
{
public:
    struct Size
    {
        std::size_t columns;
        std::size_t rows;
    };

    // Whether standard output is a terminal that can be drawn on.
    static bool isUsable();

    // Whether the user's locale is one of UTF-8; ASCII alone is shown elsewhere.
    static bool speaksUtf8();

    // How many columns a line has on that end of the program; 0 if it is no terminal.
    static std::size_t columnsOf(int descriptor);

    Terminal();
    ~Terminal();
    Terminal(Terminal const&) = delete;
    Terminal& operator=(Terminal const&) = delete;

    Size size() const;
    // Shows lines from the top; none may be wider than the screen.
    void draw(std::string const& frame);
    // The next key that was pressed, if any.
    std::optional<Key> readKey();

private:
    void leave();

    KeyInput m_keys;
    FatalRestore m_restore;
    bool m_inside = false;
};

} // namespace velmora::cli
