#pragma once

#include "program/terminal/fatalrestore.h"
#include "program/terminal/keyinput.h"

#include <cstddef>
#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace velmora::cli {

class TerminalScreen;

// The screen of a terminal for as long as the object lives: keys come singly and are not shown, frames replace each
// other on a page of their own. However the program ends short of being killed, the terminal is as before. Ctrl-C goes
// on to interrupt; Ctrl-Z does nothing. One at a time, for one thread.
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

    // Takes over the user's characters, and nothing else of the locale: numbers keep their point. Before there are
    // other threads.
    static void useCharacters();

    // How many columns a line has on that end of the program, by the variable COLUMNS or the terminal's size; 0 if it
    // is no terminal.
    static std::size_t columnsOf(int descriptor);

    // Null where nothing is known of the terminal's kind. coloured: frames may have colours.
    static std::unique_ptr<Terminal> open(bool coloured);

    ~Terminal();
    Terminal(Terminal const&) = delete;
    Terminal& operator=(Terminal const&) = delete;

    Size size() const;
    // Shows lines from the top; none may be wider than the screen. Sequences that switch a text's look are understood.
    void draw(std::string const& frame);
    // The next key that was pressed, if any.
    std::optional<Key> readKey();

private:
    explicit Terminal(std::unique_ptr<TerminalScreen> screen);

    std::unique_ptr<TerminalScreen> m_screen;
    FatalRestore m_restore;
};

// The kinds of terminals to try in turn: the one that is named, then such as understand the same.
std::vector<std::string> terminalKinds(std::string const& named);

} // namespace velmora::cli
